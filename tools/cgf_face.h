#pragma once

#include <tools/cgf_glyph.h>

#include <memory>
#include <string>

struct FT_FaceRec_;
struct FT_LibraryRec_;

namespace tools {

/// A font file that FreeType reads, rendered in black and white. Operations throw `std::runtime_error` if
/// FreeType refuses.
class Face {
public:
    /// The face has one size, as faces of bitmaps do.
    static constexpr unsigned kOnlySize = 0;

    /// `size` is the pixels of an em, or `kOnlySize`.
    Face(std::string const& path, unsigned size);

    bool Has(char16_t code) const;

    /// What the face has for the character, trimmed.
    Glyph Read(char16_t code) const;

    /// Two characters that look the same in the face, whatever the size, have the same shape. Faces of
    /// outlines only.
    std::string Shape(char16_t code) const;

private:
    struct Close {
        void operator()(FT_LibraryRec_* opened) const;
        void operator()(FT_FaceRec_* opened) const;
    };

    void Check(int error) const;

    std::string path;
    std::unique_ptr<FT_LibraryRec_, Close> library;
    std::unique_ptr<FT_FaceRec_, Close> face;  // behind the library, which must live longer
};

}

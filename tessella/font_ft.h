#pragma once

#include <tessella/font_base.h>

#include <array>
#include <memory>

struct FT_FaceRec_;
struct FT_GlyphRec_;

/// Text from scalable fonts, by FreeType. A character is drawn once, when it is asked for, and kept as long
/// as the font. Whatever the font file has to say lies in memory from the start.
class GrFontFTDevice : public GrFontBase {
public:
    /// The font of `desc.file`, `desc.size` * 96 / 1000 pixels high. Stays not valid if it cannot be had.
    explicit GrFontFTDevice(GrFontDesc const& desc);
    ~GrFontFTDevice() override;

    bool GetGlyph(unsigned code, GrGlyphInfo& info) override;
    bool GetKerning(int out[2], unsigned code, unsigned previous) override;

protected:
    unsigned CharWidth(unsigned code)
    {
        GrGlyphInfo info;
        return GetGlyph(code, info) ? info.advance : 1;
    }

private:
    /// A share in the FreeType library.
    struct Share {
        Share();
        ~Share();
        Share(Share const&) = delete;
        Share& operator=(Share const&) = delete;
    } share;
    struct DoneFace {
        void operator()(FT_FaceRec_* opened) const;
    };
    struct DoneGlyph {
        void operator()(FT_GlyphRec_* loaded) const;
    };
    using GlyphPtr = std::unique_ptr<FT_GlyphRec_, DoneGlyph>;
    using GlyphPage = std::array<GlyphPtr, 256>;
    using GlyphTable = std::array<std::unique_ptr<GlyphPage>, 256>;

    /// Loads the face from a file, and its kerning from another one unless `metrics` is empty; that may be
    /// missing. 0, or the number of the error, which has been reported.
    int LoadFace(char const* file, char const* metrics);
    /// Null if there is none.
    GlyphPtr LoadGlyph(unsigned code) const;

    std::unique_ptr<FT_FaceRec_, DoneFace> face;
    std::unique_ptr<GlyphTable>
        glyphs;  ///< by the low 16 bits of the code: a page by the upper 8, in it by the lower
    bool kerning = false;
    std::unique_ptr<unsigned char[]> data;  ///< the file, which the face reads from
};

class GrFontFT final : public GrFontSubclass<GrFontFTDevice> {
public:
    using GrFontSubclass::GrFontSubclass;
};

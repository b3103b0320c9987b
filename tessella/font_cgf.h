#pragma once

#include <tessella/cgf.h>
#include <tessella/font_base.h>

class si_file;

/// Text from the built-in bitmap font, of which there is one size. All of them share one container, which the
/// first one reads from the archive and the last one takes along.
class GrFontCGFDevice : public GrFontBase {
public:
    /// Stays not valid if there is no built-in font.
    explicit GrFontCGFDevice(GrFontDesc const& desc);

    bool GetGlyph(unsigned code, GrGlyphInfo& info) override;
    bool GetKerning(int /*out*/[2], unsigned /*code*/, unsigned /*previous*/) override { return false; }

protected:
    unsigned CharWidth(unsigned code) const
    {
        CGF_Glyph const* const glyph = font->GetGlyph(code);
        return glyph ? glyph->advance : 1;
    }

private:
    /// A share in the container.
    struct Share {
        Share();
        ~Share();
        Share(Share const&) = delete;
        Share& operator=(Share const&) = delete;
    } share;
    CGF_Font const* font = nullptr;  ///< in the container
};

class GrFontCGF final : public GrFontSubclass<GrFontCGFDevice> {
public:
    using GrFontSubclass::GrFontSubclass;
};

/// Has the container take what the file holds. A file that ends early is reported and taken as far as it
/// goes; one that is no such file leaves the container empty.
void ReadContainer(si_file& file, CGF_Container& container);

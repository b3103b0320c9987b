#pragma once

#include <tessella/font.h>

#include <string>

/// Types of fonts: what draws them.
enum : std::uint32_t { GrFontTypeCgf = 0, GrFontTypeFreeType = 1 };

/// What a font is to be like: a request of the application, or what the substitution table makes of it.
struct GrFontDesc {
    std::string face, file, metrics;
    std::int32_t size = 0;
    std::uint32_t weight = 400;  ///< 400 regular, 700 bold
    struct {
        bool italic : 1, smooth : 1, kerning : 1;
    } flags = {};
    std::uint32_t type = GrFontTypeCgf;
};

/// Adds the measuring of strings to a device, a class of `GrFontBase` that tells its characters' widths.
template <typename Device>
class GrFontSubclass : public Device {
public:
    using Device::Device;

    unsigned GetTextWidth(unsigned char const* text, unsigned length) override
    {
        return SumOfWidths(text, length);
    }
    /// Emboldening counts here alone.
    unsigned GetTextWidthW(unsigned short const* text, unsigned length) override
    {
        return SumOfWidths(text, length) + (this->embolden ? length : 0);
    }

private:
    template <typename Character>
    unsigned SumOfWidths(Character const* text, unsigned length)
    {
        if (!this->valid) return length;
        unsigned sum = 0;
        for (Character const* const end = text + length; text != end; ++text)
            sum += this->CharWidth(*text);
        return sum;
    }
};

#pragma once

#include <tessella/pixel/wide_formats.h>

/// What the alpha values of sixteen pixels have in common. Icons consist of runs of 0 and 255, with little
/// between them.
enum class AlphaRun { Clear, Opaque, Mixed };

GR_INLINE AlphaRun RunOf(std::uint8_t alpha)
{
    return alpha == 0 ? AlphaRun::Clear : alpha == 255 ? AlphaRun::Opaque : AlphaRun::Mixed;
}

/// The source of a blend in one format, sixteen pixels at a time. It has colours of its own or else the fore
/// colour, and alpha values or else a uniform one.
template <typename Format, bool kHasColors, bool kHasAlphas>
struct WideSource {
    GR_INLINE explicit WideSource(GrBlend const& source)
        : blend(source), run(RunOf(source.alpha)), alpha(Splat(source.alpha)),
          color(Splat(Format::Colors::FromPixel(static_cast<typename Format::Colors::Pixel>(source.fore))))
    {}

    /// Takes `count` pixels of a row from column `x` on.
    GR_INLINE void Load(std::ptrdiff_t y, int x, int count)
    {
        std::ptrdiff_t const index = y * blend.sourceWidth + x;
        if constexpr (kHasColors) color = LoadSome<4, WideWords>(blend.colors + index * 4, count);
        if constexpr (kHasAlphas) {
            unsigned char few[kWide] = {};
            unsigned char const* alphas = blend.alphas + index;
            if (count < kWide) [[unlikely]]
                alphas =
                    static_cast<unsigned char*>(std::memcpy(few, alphas, static_cast<std::size_t>(count)));
            std::uint64_t halves[2];
            std::memcpy(halves, alphas, sizeof halves);
            run = (halves[0] | halves[1]) == 0                 ? AlphaRun::Clear
                : (halves[0] & halves[1]) == ~std::uint64_t{0} ? AlphaRun::Opaque
                                                               : AlphaRun::Mixed;
            WideBytes bytes;
            std::memcpy(&bytes, alphas, sizeof bytes);
            alpha = Widened(bytes);
        }
    }

    /// The colours over pixels of the target. They mean something only where the alpha is neither 0 nor 255.
    GR_INLINE WideWords MixedOver(WideWords const& pixels) const
    {
        WideChannels source = SplitColors(color);
        if constexpr (!kHasColors || !kHasAlphas) source = Scaled(source, alpha);
        return Mixed(source, Format::Split(pixels), alpha);
    }

    GrBlend const blend;  // a copy: no store can change it
    AlphaRun run;
    WideWords alpha;
    WideWords color;
};

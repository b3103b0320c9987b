#pragma once

#include <tessella/pixel/blend.h>
#include <tessella/pixel/wide_format.h>

namespace wide {

/// What the alpha values of some pixels have in common. Icons consist of runs of 0 and 255, with little
/// between them.
enum class AlphaRun { Clear, Opaque, Mixed };

GR_INLINE AlphaRun RunOf(std::uint8_t alpha)
{
    return alpha == 0 ? AlphaRun::Clear : alpha == 255 ? AlphaRun::Opaque : AlphaRun::Mixed;
}

/// The source of a blend in one format, as many pixels at a time as there are lanes. It has colours of its
/// own or else the fore colour, and alpha values or else a uniform one.
template <typename Format, bool kHasColors, bool kHasAlphas>
struct WideSource {
    using W = typename Format::Wide;
    using Words = typename W::Words;

    GR_INLINE explicit WideSource(GrBlend const& source)
        : blend(source), run(RunOf(source.alpha)), alpha(W::Splat(source.alpha)),
          color(W::Splat(Format::Policy::FromPixel(static_cast<typename Format::Policy::Pixel>(source.fore))))
    {}

    /// Takes up to `count` pixels of row `y` from column `x` on.
    GR_INLINE void Load(std::ptrdiff_t y, int x, int count)
    {
        std::ptrdiff_t const index = y * blend.sourceWidth + x;
        if constexpr (kHasColors) color = W::template Load<std::uint32_t>(blend.colors + index * 4, count);
        if constexpr (kHasAlphas) {
            unsigned char few[W::kLanes];
            unsigned char const* alphas = blend.alphas + index;
            if (count < W::kLanes) [[unlikely]] {
                W::CopyFirst(few, alphas, count);
                alphas = few;
            }
            using Some = std::conditional_t<sizeof few == 4, std::uint32_t, std::uint64_t>;
            Some any = 0, all = static_cast<Some>(~Some{0});
            for (std::size_t i = 0; i < W::kLanes; i += sizeof(Some)) {
                Some some;
                std::memcpy(&some, alphas + i, sizeof some);
                any |= some;
                all &= some;
            }
            run = any == 0                           ? AlphaRun::Clear
                : all == static_cast<Some>(~Some{0}) ? AlphaRun::Opaque
                                                     : AlphaRun::Mixed;
            alpha = W::template Load<std::uint8_t>(alphas, W::kLanes);
        }
    }

    /// The colours over pixels of the target. They mean something only where the alpha is neither 0 nor 255.
    GR_INLINE Words MixedOver(Words const& pixels) const
    {
        auto const factors = W::Factors(alpha);
        typename W::Channels channels = W::Split(color);
        if constexpr (!kHasColors || !kHasAlphas) channels = W::Scaled(channels, factors);
        return W::Mixed(channels, Format::Split(pixels), factors);
    }

    GrBlend const blend;  // a copy: no store can change it
    AlphaRun run;
    Words alpha;
    Words color;
};

}

#pragma once

#include <tessella/pixel/colors.h>
#include <tessella/pixel/surface.h>
#include <tessella/pixel/wide.h>

#include <type_traits>

/// The three bytes of a pixel as they lie there, whichever is red: for colours whose channels all fare alike,
/// and without running over.
struct GrColorsUnturned : GrColors24 {
    static constexpr GrColor FromPixel(Pixel pixel) { return pixel; }
};

/// A format in the vectors of `W`, a `GrWide`.
template <typename W, GrSurfacePolicy Surface, GrColorsPolicy Colors>
struct GrWideFormat {
    using Wide = W;
    using Words = typename W::Words;
    using Channels = typename W::Channels;
    using Policy = Colors;
    static constexpr int kBytes = Surface::kBytes;

    /// The same for the fore colour alone: what alpha values leave of two colours never runs over.
    using Unturned = GrWideFormat<W, Surface,
        std::conditional_t<std::is_same_v<Colors, GrColors24>, GrColorsUnturned, Colors>>;

    /// Moves up to `count` pixels, one in each word.
    GR_INLINE static Words Load(unsigned char const* from, int count)
    {
        if constexpr (kBytes == 3) {
            std::uint32_t pixels[W::kLanes] = {};
            for (int i = 0; i < W::kLanes && i < count; ++i)
                pixels[i] = Surface::ReadPixel(from, i);
            return W::Read(pixels);
        } else {
            return W::template Load<typename Surface::Pixel>(from, count);
        }
    }
    GR_INLINE static void Store(unsigned char* to, int count, Words const& words)
    {
        if constexpr (kBytes == 3) {
            std::uint32_t pixels[W::kLanes];
            W::Write(pixels, words);
            for (int i = 0; i < W::kLanes && i < count; ++i)
                Surface::WritePixel(to, i, pixels[i]);
        } else {
            W::template Store<typename Surface::Pixel>(to, count, words);
        }
    }

    GR_INLINE static Words FromPixels(Words const& pixels)
    {
        if constexpr (std::is_same_v<Colors, GrColors8>) {
            std::uint32_t words[W::kLanes];
            W::Write(words, pixels);
            for (std::uint32_t& word : words)
                word = GrColors8::FromPixel(static_cast<std::uint8_t>(word));
            return W::Read(words);
        } else if constexpr (std::is_same_v<Colors, GrColorsRGB> ||
            std::is_same_v<Colors, GrColorsUnturned>) {
            return pixels;
        } else {
            return W::Join(Split(pixels));
        }
    }

    /// The same, without the alpha, taken apart.
    GR_INLINE static Channels Split(Words const& pixels)
    {
        if constexpr (std::is_same_v<Colors, GrColors15>)
            return {(pixels >> 7 & 0xF8) | (pixels & 0x1F) << 19, pixels >> 2 & 0xF8};
        else if constexpr (std::is_same_v<Colors, GrColors16>)
            return {(pixels >> 8 & 0xF8) | (pixels & 0x1F) << 19, pixels >> 3 & 0xFC};
        else if constexpr (std::is_same_v<Colors, GrColors24>)
            return {W::Turned(pixels & 0x00FF00FF), pixels >> 8 & 0xFF};
        else
            return W::Split(FromPixels(pixels));
    }

    GR_INLINE static Words ToPixels(Words const& colors)
    {
        if constexpr (std::is_same_v<Colors, GrColors8>) {
            // (channel + 25) / 51 in numbers below 2^16
            auto const levels = [](Words const& channels) GR_INLINE_LAMBDA {
                return (Words)(((typename W::Halves)channels + 25) * 161 >> 13);
            };
            Channels const channels = W::Split(colors);
            Words const redBlue = levels(channels.redBlue);
            return (redBlue & 0xFFFF) + (redBlue >> 16) * 36 + (levels(channels.green) & 0xFFFF) * 6 + 20;
        } else if constexpr (std::is_same_v<Colors, GrColors15>) {
            return (colors << 7 & 0x7C00) | (colors >> 6 & 0x03E0) | (colors >> 19 & 0x001F);
        } else if constexpr (std::is_same_v<Colors, GrColors16>) {
            return (colors << 8 & 0xF800) | (colors >> 5 & 0x07E0) | (colors >> 19 & 0x001F);
        } else if constexpr (std::is_same_v<Colors, GrColors24>) {
            return W::Turned(colors & 0x00FF00FF) | (colors & 0xFF00);
        } else if constexpr (std::is_same_v<Colors, GrColorsUnturned>) {
            return colors & 0x00FFFFFF;
        } else {
            return colors;
        }
    }
};

#pragma once

#include <tessella/pixel/wide.h>

// The formats sixteen pixels at a time. `Load` and `Store` move up to sixteen, one in each word; `FromPixels`
// and `ToPixels` are the conversions of the colours; `Split` is the colours taken apart, without the alpha.

template <typename Packed>
struct WidePacked {
    static constexpr int kBytes = sizeof(Packed) / kWide;

    GR_INLINE static WideWords Load(unsigned char const* from, int count)
    {
        return Widened(LoadSome<kBytes, Packed>(from, count));
    }
    GR_INLINE static void Store(unsigned char* to, int count, WideWords const& pixels)
    {
        StoreSome<kBytes>(to, count, Narrowed<Packed>(pixels));
    }
};

struct Wide8 : WidePacked<WideBytes> {
    using Width = GrSurface8;
    using Colors = GrColors8;

    /// The level 0 to 5 of a channel, for each half: (channel + 25) / 51 in numbers below 2^16.
    GR_INLINE static WideWords Levels(WideWords const& channels)
    {
        return (WideWords)(((WideHalves)channels + 25) * 161 >> 13);
    }
    GR_INLINE static WideWords FromPixels(WideWords const& pixels)
    {
        WideWords colors;
        for (int i = 0; i < kWide; ++i)
            colors[i] = GrColors8::FromPixel(static_cast<std::uint8_t>(pixels[i]));
        return colors;
    }
    GR_INLINE static WideChannels Split(WideWords const& pixels) { return SplitColors(FromPixels(pixels)); }
    GR_INLINE static WideWords ToPixels(WideWords const& colors)
    {
        WideChannels const channels = SplitColors(colors);
        WideWords const levels = Levels(channels.redBlue);
        return (levels & 0xFFFF) + (levels >> 16) * 36 + (Levels(channels.green) & 0xFFFF) * 6 + 20;
    }
};

struct Wide15 : WidePacked<WideShorts> {
    using Width = GrSurface16;
    using Colors = GrColors15;

    GR_INLINE static WideChannels Split(WideWords const& pixels)
    {
        return {(pixels >> 7 & 0xF8) | (pixels & 0x1F) << 19, pixels >> 2 & 0xF8};
    }
    GR_INLINE static WideWords FromPixels(WideWords const& pixels) { return JoinChannels(Split(pixels)); }
    GR_INLINE static WideWords ToPixels(WideWords const& colors)
    {
        return (colors << 7 & 0x7C00) | (colors >> 6 & 0x03E0) | (colors >> 19 & 0x001F);
    }
};

struct Wide16 : WidePacked<WideShorts> {
    using Width = GrSurface16;
    using Colors = GrColors16;

    GR_INLINE static WideChannels Split(WideWords const& pixels)
    {
        return {(pixels >> 8 & 0xF8) | (pixels & 0x1F) << 19, pixels >> 3 & 0xFC};
    }
    GR_INLINE static WideWords FromPixels(WideWords const& pixels) { return JoinChannels(Split(pixels)); }
    GR_INLINE static WideWords ToPixels(WideWords const& colors)
    {
        return (colors << 8 & 0xF800) | (colors >> 5 & 0x07E0) | (colors >> 19 & 0x001F);
    }
};

/// The colour with red and blue exchanged, in three bytes or in four.
template <typename Surface>
struct Wide24 {
    using Width = Surface;
    using Colors = GrColors24;

    GR_INLINE static WideWords Load(unsigned char const* from, int count)
    {
        if constexpr (Surface::kBytes == 4) return LoadSome<4, WideWords>(from, count);
        WideWords pixels{};
        for (int i = 0; i < kWide && i < count; ++i)
            pixels[i] = Surface::ReadPixel(from, i);
        return pixels;
    }
    GR_INLINE static void Store(unsigned char* to, int count, WideWords const& pixels)
    {
        if constexpr (Surface::kBytes == 4) return StoreSome<4>(to, count, pixels);
        for (int i = 0; i < kWide && i < count; ++i)
            Surface::WritePixel(to, i, pixels[i]);
    }
    GR_INLINE static WideChannels Split(WideWords const& pixels)
    {
        return {Turned(pixels & 0x00FF00FF), pixels >> 8 & 0xFF};
    }
    GR_INLINE static WideWords FromPixels(WideWords const& pixels) { return JoinChannels(Split(pixels)); }
    GR_INLINE static WideWords ToPixels(WideWords const& colors)
    {
        return Turned(colors & 0x00FF00FF) | (colors & 0xFF00);
    }
};

struct WideRGB {
    using Width = GrSurface32;
    using Colors = GrColorsRGB;

    GR_INLINE static WideWords Load(unsigned char const* from, int count)
    {
        return LoadSome<4, WideWords>(from, count);
    }
    GR_INLINE static void Store(unsigned char* to, int count, WideWords const& pixels)
    {
        StoreSome<4>(to, count, pixels);
    }
    GR_INLINE static WideWords FromPixels(WideWords const& pixels) { return pixels; }
    GR_INLINE static WideChannels Split(WideWords const& pixels) { return SplitColors(pixels); }
    GR_INLINE static WideWords ToPixels(WideWords const& colors) { return colors; }
};

// The format of a surface with its colours. There is none for 16 colours, which are looked up one by one, and
// for premultiplied colours, which are divided.
Wide8 WideOf(GrSurface8, GrColors8);
Wide15 WideOf(GrSurface16, GrColors15);
Wide16 WideOf(GrSurface16, GrColors16);
Wide24<GrSurface24> WideOf(GrSurface24, GrColors24);
Wide24<GrSurface32> WideOf(GrSurface32, GrColors24);
WideRGB WideOf(GrSurface32, GrColorsRGB);

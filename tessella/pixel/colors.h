#pragma once

#include <tessella/color.h>

#include <atomic>
#include <concepts>
#include <cstdint>

/// The pixel formats. Each is an empty class with two pure conversions between a colour and the pixel as it
/// lies in memory. The conversions are not inverse to each other, and nothing may rely on a round trip.

/// What a format owes to the contexts.
template <typename Colors>
concept GrColorsPolicy = std::unsigned_integral<typename Colors::Pixel> &&
    std::same_as<decltype(Colors::ToPixel(GrColor{})), typename Colors::Pixel> &&
    std::same_as<decltype(Colors::FromPixel(typename Colors::Pixel{})), GrColor> &&
    std::same_as<decltype(Colors::kBits), int const> &&    // the depth that images of the format have
    std::same_as<decltype(Colors::kDithers), bool const>;  // whether converting images diffuses the error

/// The index 0 to 15 of the 16-colour palette's entry nearest to a colour; the lower index wins a tie.
int NearestPaletteIndex(GrColor color);

/// 16 colours: an index into the standard VGA text palette.
struct GrColors4 {
    using Pixel = std::uint8_t;
    static constexpr int kBits = 4;
    static constexpr bool kDithers = true;

    static GrColor const palette[16];

    /// The nearest palette index for 3 bits a channel; zero until `BuildColorCube` has run. Every run writes
    /// the same values, so there is no lock.
    static std::atomic<Pixel> colorCube[512];
    static void BuildColorCube();

    static Pixel ToPixel(GrColor c)
    {
        return colorCube[(GrRed(c) >> 5) | (GrGreen(c) >> 5) << 3 | (GrBlue(c) >> 5) << 6].load(
            std::memory_order_relaxed);
    }

    // Inverting gives pixels above 15; they read as their low four bits.
    static GrColor FromPixel(Pixel p) { return palette[p & 15]; }
};

/// A 6 by 6 by 6 cube from index 20, red varying fastest. Indices 0 and 255 lie outside the cube and read as
/// black and white; the other indices outside it run through the same arithmetic in 8 bits.
struct GrColors8 {
    using Pixel = std::uint8_t;
    static constexpr int kBits = 8;
    static constexpr bool kDithers = true;

    static constexpr Pixel ToPixel(GrColor c)
    {
        return static_cast<Pixel>(
            20 + (GrRed(c) + 25) / 51 + 6 * ((GrGreen(c) + 25) / 51) + 36 * ((GrBlue(c) + 25) / 51));
    }

    static constexpr GrColor FromPixel(Pixel p)
    {
        if (p == 0) return 0;
        if (p == 255) return 0xFFFFFF;
        unsigned const q = static_cast<Pixel>(p - 20);
        return ((q / 36 << 16) + (q / 6 % 6 << 8) + q % 6) * 51;
    }
};

/// 5-5-5: red in bits 10-14, green 5-9, blue 0-4. Reading only shifts, so white comes back as 0xF8F8F8.
struct GrColors15 {
    using Pixel = std::uint16_t;
    static constexpr int kBits = 15;
    static constexpr bool kDithers = true;

    static constexpr Pixel ToPixel(GrColor c)
    {
        return static_cast<Pixel>((c << 7 & 0x7C00) | (c >> 6 & 0x03E0) | (c >> 19 & 0x001F));
    }

    static constexpr GrColor FromPixel(Pixel p)
    {
        return (p & 0x7C00u) >> 7 | (p & 0x03E0u) << 6 | (p & 0x001Fu) << 19;
    }
};

/// 5-6-5: red in bits 11-15, green 5-10, blue 0-4. Reading only shifts, so white comes back as 0xF8FCF8.
struct GrColors16 {
    using Pixel = std::uint16_t;
    static constexpr int kBits = 16;
    static constexpr bool kDithers = true;

    static constexpr Pixel ToPixel(GrColor c)
    {
        return static_cast<Pixel>((c << 8 & 0xF800) | (c >> 5 & 0x07E0) | (c >> 19 & 0x001F));
    }

    static constexpr GrColor FromPixel(Pixel p)
    {
        return (p & 0xF800u) >> 8 | (p & 0x07E0u) << 5 | (p & 0x001Fu) << 19;
    }
};

/// The framebuffer's layout of true colour: blue, green, red in memory, then a zero byte or nothing.
struct GrColors24 {
    using Pixel = std::uint32_t;
    static constexpr int kBits = 24;
    static constexpr bool kDithers = false;

    static constexpr Pixel ToPixel(GrColor c) { return (c & 0xFF) << 16 | (c & 0xFF00) | (c >> 16 & 0xFF); }
    static constexpr GrColor FromPixel(Pixel p) { return ToPixel(p); }
};

/// True-colour images: the colour itself.
struct GrColorsRGB {
    using Pixel = std::uint32_t;
    static constexpr int kBits = 32;
    static constexpr bool kDithers = false;

    static constexpr Pixel ToPixel(GrColor c) { return c; }
    static constexpr GrColor FromPixel(Pixel p) { return p; }
};

/// True-colour images whose colours are premultiplied by their alpha. The product is shifted and not rounded:
/// an opaque 255 becomes 254.
struct GrColorsRGBA {
    using Pixel = std::uint32_t;
    static constexpr int kBits = 32;
    static constexpr bool kDithers = false;

    static constexpr Pixel ToPixel(GrColor c)
    {
        auto const channel = [c](unsigned shift) { return ((c >> shift & 0xFF) * (c >> 24) >> 8) << shift; };
        return channel(0) | channel(8) | channel(16) | (c & 0xFF000000);
    }

    // A stored channel above its alpha gives a quotient above 255, which spills into the next field.
    static constexpr GrColor FromPixel(Pixel p)
    {
        std::uint32_t const alpha = p >> 24;
        if (alpha == 0) return 0;
        return (p << 8 & 0xFFFF) / alpha | (p & 0xFF00) / alpha << 8 | (p >> 8 & 0xFF00) / alpha << 16 |
            alpha << 24;
    }
};

static_assert(GrColorsPolicy<GrColors4> && GrColorsPolicy<GrColors8> && GrColorsPolicy<GrColors15> &&
    GrColorsPolicy<GrColors16> && GrColorsPolicy<GrColors24> && GrColorsPolicy<GrColorsRGB> &&
    GrColorsPolicy<GrColorsRGBA>);

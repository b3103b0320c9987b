#pragma once

#include <tessella/pixel/fill_rows.h>

#include <concepts>
#include <cstdint>
#include <cstring>

/// The pixel widths. Each surface is an empty class of static operations on a row: it knows how wide a pixel
/// is, and neither where the row lies nor what the pixel means. Pixels go through `memcpy`, since nothing
/// promises that rows are aligned; it compiles to plain loads and stores.

/// What a surface owes to the layers above: its pixel type, bytes a pixel, the pixel with all bits set,
/// reading and writing one pixel, and filling a rectangle.
template <typename Surface>
concept GrSurfacePolicy = std::unsigned_integral<typename Surface::Pixel> &&
    std::same_as<decltype(Surface::kBytes), int const> &&
    std::same_as<decltype(Surface::kAllBits), typename Surface::Pixel const> &&
    requires(unsigned char* row, unsigned char const* source, typename Surface::Pixel pixel, int x)
{
    pixel = Surface::ReadPixel(source, x);
    Surface::WritePixel(row, x, pixel);
    Surface::FillRows(GrRows{row, 0, x, 1}, pixel);
};

struct GrSurface8 {
    using Pixel = std::uint8_t;
    static constexpr int kBytes = 1;
    static constexpr Pixel kAllBits = 0xFF;

    static Pixel ReadPixel(unsigned char const* row, int x) { return row[x]; }
    static void WritePixel(unsigned char* row, int x, Pixel pixel) { row[x] = pixel; }
    static void FillRows(GrRows const& rows, Pixel pixel) { FillRows8(rows, pixel); }
};

struct GrSurface16 {
    using Pixel = std::uint16_t;
    static constexpr int kBytes = 2;
    static constexpr Pixel kAllBits = 0xFFFF;

    static Pixel ReadPixel(unsigned char const* row, int x)
    {
        Pixel pixel;
        std::memcpy(&pixel, row + std::ptrdiff_t{x} * kBytes, kBytes);
        return pixel;
    }
    static void WritePixel(unsigned char* row, int x, Pixel pixel)
    {
        std::memcpy(row + std::ptrdiff_t{x} * kBytes, &pixel, kBytes);
    }
    static void FillRows(GrRows const& rows, Pixel pixel) { FillRows16(rows, pixel); }
};

/// Three bytes a pixel, held in 32 bits with the top byte 0. Only the pixel's own three bytes are touched:
/// a fourth would belong to the neighbour, or lie behind the last row.
struct GrSurface24 {
    using Pixel = std::uint32_t;
    static constexpr int kBytes = 3;
    static constexpr Pixel kAllBits = 0x00FFFFFF;

    static Pixel ReadPixel(unsigned char const* row, int x)
    {
        unsigned char const* const bytes = row + std::ptrdiff_t{x} * kBytes;
        return bytes[0] | static_cast<Pixel>(bytes[1]) << 8 | static_cast<Pixel>(bytes[2]) << 16;
    }
    static void WritePixel(unsigned char* row, int x, Pixel pixel)
    {
        std::memcpy(row + std::ptrdiff_t{x} * kBytes, &pixel, kBytes);
    }
    static void FillRows(GrRows const& rows, Pixel pixel) { FillRows24(rows, pixel); }
};

struct GrSurface32 {
    using Pixel = std::uint32_t;
    static constexpr int kBytes = 4;
    static constexpr Pixel kAllBits = 0xFFFFFFFF;

    static Pixel ReadPixel(unsigned char const* row, int x)
    {
        Pixel pixel;
        std::memcpy(&pixel, row + std::ptrdiff_t{x} * kBytes, kBytes);
        return pixel;
    }
    static void WritePixel(unsigned char* row, int x, Pixel pixel)
    {
        std::memcpy(row + std::ptrdiff_t{x} * kBytes, &pixel, kBytes);
    }
    static void FillRows(GrRows const& rows, Pixel pixel) { FillRows32(rows, pixel); }
};

static_assert(GrSurfacePolicy<GrSurface8> && GrSurfacePolicy<GrSurface16> && GrSurfacePolicy<GrSurface24> &&
    GrSurfacePolicy<GrSurface32>);

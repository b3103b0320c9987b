#pragma once

#include <tessella/image.h>
#include <tessella/pixel/surface.h>
#include <tessella/types.h>

#include <cstddef>
#include <cstdint>

/// Joins the place of the pixels (`Base`, over an image or the screen) to their width (`Surface`), and paints
/// rows through pattern and raster mode. All coordinates are surface coordinates; nothing is checked here,
/// the caller has clipped.
///
/// A pattern byte belongs to a row; its bit x & 7 decides the pixel in column x: set paints in the fore
/// colour, clear in the back colour, or not at all if `transparent`. With a raster mode other than copy the
/// bits that would be painted are complemented instead.
template <typename Base, GrSurfacePolicy Surface>
class GrGenericSurface : public Base, private Surface {
public:
    using Width = Surface;
    using Surface::kAllBits;
    using Surface::kBytes;
    using typename Surface::Pixel;
    static constexpr bool kPacked = true;  ///< each pixel has bytes of its own, at `PixelAddress`

    using Base::Base;

protected:
    using Surface::FillRows;
    using Surface::ReadPixel;
    using Surface::WritePixel;

    unsigned char* RowAddress(int y) const { return this->PixelBase() + y * this->Stride(); }
    static unsigned char* PixelAddress(unsigned char* row, int x) { return row + std::ptrdiff_t{x} * kBytes; }

    /// Fills `count` pixels from `address` on.
    static void FillPixels(unsigned char* address, Pixel pixel, int count)
    {
        FillRows({address, 0, count, 1}, pixel);
    }

    /// Writes `count` pixels, each `step` bytes behind the one before.
    static void StepPixels(unsigned char* address, std::ptrdiff_t step, std::uint64_t count, Pixel pixel)
    {
        for (; count > 0; --count, address += step)
            WritePixel(address, 0, pixel);
    }

    void PatternPixel(
        unsigned char* row, int x, std::uint8_t patternByte, bool transparent, std::uint32_t mode) const;

    /// Paints `count` pixels of a row from column `x` on; `count` is at least 1.
    void PatternSpan(unsigned char* row, int x, int count, std::uint8_t patternByte, bool transparent,
        std::uint32_t mode) const;

    /// True if painting is filling with the fore colour, whatever the row.
    bool IsSolid() const;

    /// Paints `count` pixels downward from `x`, `y` with the context's pattern in the two given pixels. The
    /// raster mode is not looked at: callers that invert do so themselves.
    void PatternColumn(int x, int y, int count, Pixel setPixel, Pixel clearPixel) const;

    /// Complements `count` pixels downward from `x`, `y`: those that the context's pattern would paint.
    void InvertColumn(int x, int y, int count) const;

    /// Fills a rectangle, whatever pattern and raster mode are.
    void FillRange(GrRange xRange, GrRange yRange, Pixel pixel) const
    {
        FillRows({PixelAddress(RowAddress(yRange.r1), xRange.r1), this->Stride(), xRange.r2 - xRange.r1,
                     yRange.r2 - yRange.r1},
            pixel);
    }

    /// Copies the rows of a rectangle from an image of the same format, whose `sx`, `sy` goes to its top
    /// left.
    void CopyRowsIn(GrRange xRange, GrRange yRange, GrImage const& image, int sx, int sy) const;
    /// Copies the rows of a rectangle to an image of the same format, from `dx`, `dy` there on.
    void CopyRowsOut(GrRange xRange, GrRange yRange, GrImage& image, int dx, int dy) const;

    Pixel foreColor = 0;
    Pixel backColor = kAllBits;
    std::uint32_t rasterMode = GrRasterModeCopy;
};

#include <tessella/pixel/generic_surface.inl>

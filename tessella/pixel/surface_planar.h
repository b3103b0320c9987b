#pragma once

#include <tessella/image.h>
#include <tessella/pixel/screen_base.h>
#include <tessella/pixel/surface.h>

#include <cstddef>
#include <cstdint>
#include <utility>

/// The screen of a VGA in its 16-colour mode, where a byte stands for 8 pixels in 4 bit planes, the leftmost
/// pixel in the highest bit. Nothing is stored to memory as such: the graphics controller is told which
/// pixels of a byte to let through, and then a stored byte is their colour. Nor can anything be read back.
/// Images in this format have one byte a pixel.
///
/// It offers what `GrGenericSurface` does, with rows of bytes of 8 pixels; `kPacked` tells contexts that
/// pixels have no address of their own.
///
///     x        0 1 2 3 4 5 6 7   8 9 ...        PlanarSpan from x = 6, 20 pixels:
///     byte          0              1            byte 0 with the mask 0x03, bytes 1 and 2 whole,
///     mask    80 . .  .  . . . 01  80           byte 3 with the mask 0xC0
///
/// Before a store nothing is loaded, on purpose: the pixels of a byte that the mask holds back take what the
/// controller's latches hold since the latest load, whatever that was.
class GrSurface4 : public GrScreenContextBase {
public:
    using Pixel = std::uint8_t;
    using Width = GrSurface8;  ///< of images
    static constexpr int kBytes = Width::kBytes;
    static constexpr bool kPacked = false;

    using GrScreenContextBase::GrScreenContextBase;

protected:
    /// Any guard of the screen, with the ports requested and the controller set up for drawing: the cursor
    /// that made way has left it otherwise.
    template <typename Plain>
    class Planar : public Plain {
    public:
        template <typename... Arguments>
        explicit Planar(Arguments&&... arguments) : Plain(std::forward<Arguments>(arguments)...)
        {
            StartDrawing();
        }
    };
    using Guard = Planar<GrScreenContextBase::Guard>;
    using TextGuard = Planar<GrScreenContextBase::TextGuard>;
    using WalkGuard = Planar<GrScreenContextBase::WalkGuard>;

    static unsigned char* RowAddress(int y) { return PixelBase() + y * Stride(); }

    /// All pixels read as entry 0.
    static Pixel ReadPixel(unsigned char const* /*row*/, int /*x*/) { return 0; }
    static void WritePixel(unsigned char* row, int x, Pixel pixel);

    // As in `GrGenericSurface`; inverting changes all four planes.
    void PatternPixel(
        unsigned char* row, int x, std::uint8_t patternByte, bool transparent, std::uint32_t mode) const;
    void PatternSpan(unsigned char* row, int x, int count, std::uint8_t patternByte, bool transparent,
        std::uint32_t mode) const;
    void PatternColumn(int x, int y, int count, Pixel setPixel, Pixel clearPixel) const;
    void InvertColumn(int x, int y, int count) const;
    static void FillRange(GrRange xRange, GrRange yRange, Pixel pixel);
    static bool IsSolid() { return false; }
    static void CopyRowsIn(GrRange xRange, GrRange yRange, GrImage const& image, int sx, int sy);

    /// Not what the screen shows: the bytes that the controller gives, from the one on that as many bytes as
    /// there are pixels before the range are away from the row's start, 8 of them stored over one another to
    /// each byte of the image.
    static void CopyRowsOut(GrRange xRange, GrRange yRange, GrImage& image, int dx, int dy);

    Pixel foreColor = 0;
    Pixel backColor = Width::kAllBits;
    std::uint32_t rasterMode = GrRasterModeCopy;

private:
    static void StartDrawing();
};

#include <tessella/pixel/surface_planar.h>

#include <tessella/vga_l.h>

#include <algorithm>
#include <cstring>

namespace {

constexpr unsigned MaskOf(int x) { return 0x80u >> (x & 7); }

void SetBitMask(unsigned mask) { WriteVgaPort(mask << 8 | 8); }

/// Each store has an effect of its own in the controller, so none is left out or joined with others.
void Store(unsigned char* address, unsigned char byte)
{
    *const_cast<unsigned char volatile*>(address) = byte;
}
unsigned char Load(unsigned char const* address)
{
    return *const_cast<unsigned char const volatile*>(address);
}

void PlanarPixel(unsigned char* row, int x, std::uint8_t color)
{
    SetBitMask(MaskOf(x));
    Store(row + (x >> 3), color);
}

/// A span in three parts: the first byte's pixels, whole bytes, the last byte's.
template <typename FillBytes>
void StoreSpan(unsigned char* row, int x, int count, std::uint8_t color, FillBytes fillBytes)
{
    int const offset = x & 7;
    unsigned char* byte = row + (x >> 3);
    if (offset != 0 && count <= 8 - offset) {
        SetBitMask(((1u << count) - 1) << (8 - offset - count));
        return Store(byte, color);
    }
    if (offset != 0) {
        SetBitMask((1u << (8 - offset)) - 1);
        Store(byte++, color);
        count -= 8 - offset;
    }
    if (count > 7) {
        WriteVgaPort(GrVgaMaskAll);
        fillBytes(byte, count / 8);
        byte += count / 8;
        count &= 7;
    }
    if (count == 0) return;
    SetBitMask(0xFFu << (8 - count) & 0xFF);
    Store(byte, color);
}

void PlanarSpan(unsigned char* row, int x, int count, std::uint8_t color)
{
    StoreSpan(row, x, count, color, [color](unsigned char* bytes, int length) {
        std::memset(bytes, color, static_cast<std::size_t>(length));
    });
}

/// The exclusive or is with the latches: each byte is stored once, by itself.
void PlanarXorSpan(unsigned char* row, int x, int count)
{
    WriteVgaPort(GrVgaXor);
    StoreSpan(row, x, count, 0xFF, [](unsigned char* bytes, int length) {
        for (int i = 0; i < length; ++i)
            Store(bytes + i, 0xFF);
    });
    WriteVgaPort(GrVgaReplace);
}

void PlanarRowOut(unsigned char* row, int x, unsigned char const* source, int count)
{
    unsigned char* byte = row + (x >> 3);
    for (unsigned mask = MaskOf(x); count > 0; --count, ++source) {
        SetBitMask(mask);
        Store(byte, Load(source));
        mask >>= 1;
        if (mask != 0) continue;
        mask = 0x80;
        ++byte;
    }
}

}

void GrSurface4::StartDrawing()
{
    RequestVgaPorts();
    WriteVgaPort(GrVgaWriteColor);
}

void GrSurface4::WritePixel(unsigned char* row, int x, Pixel pixel) { PlanarPixel(row, x, pixel); }

void GrSurface4::PatternPixel(
    unsigned char* row, int x, std::uint8_t patternByte, bool transparent, std::uint32_t mode) const
{
    bool const set = patternByte >> (x & 7) & 1;
    if (!set && transparent) return;
    if (mode == GrRasterModeCopy) return PlanarPixel(row, x, set ? foreColor : backColor);
    WriteVgaPort(GrVgaXor);
    PlanarPixel(row, x, 0xFF);
    WriteVgaPort(GrVgaReplace);
}

void GrSurface4::PatternSpan(unsigned char* row, int x, int count, std::uint8_t patternByte, bool transparent,
    std::uint32_t mode) const
{
    if (mode != GrRasterModeCopy && (!transparent || patternByte == 0xFF)) {
        PlanarXorSpan(row, x, count);
    } else if (mode == GrRasterModeCopy && patternByte == 0xFF) {
        PlanarSpan(row, x, count, foreColor);
    } else if (mode == GrRasterModeCopy && patternByte == 0) {
        if (!transparent) PlanarSpan(row, x, count, backColor);
    } else {
        for (int const end = x + count; x < end; ++x)
            PatternPixel(row, x, patternByte, transparent, mode);
    }
}

void GrSurface4::PatternColumn(int x, int y, int count, Pixel setPixel, Pixel clearPixel) const
{
    SetBitMask(MaskOf(x));
    unsigned char* byte = RowAddress(y) + (x >> 3);
    for (int const end = y + count; y < end; ++y, byte += Stride()) {
        bool const set = pattern[y & 7] & 1u << (x & 7);
        if (set || !patternTransparent) Store(byte, set ? setPixel : clearPixel);
    }
}

void GrSurface4::InvertColumn(int x, int y, int count) const
{
    WriteVgaPort(GrVgaXor);
    PatternColumn(x, y, count, 0xFF, 0xFF);
    WriteVgaPort(GrVgaReplace);
}

void GrSurface4::FillRange(GrRange xRange, GrRange yRange, Pixel pixel)
{
    unsigned char* row = RowAddress(yRange.r1);
    for (int y = yRange.r1; y < yRange.r2; ++y, row += Stride())
        PlanarSpan(row, xRange.r1, xRange.r2 - xRange.r1, pixel);
}

void GrSurface4::CopyRowsIn(GrRange xRange, GrRange yRange, GrImage const& image, int sx, int sy)
{
    if (!image.pixels) return;
    unsigned char const* source = image.pixels + std::ptrdiff_t{sy} * image.width + sx;
    unsigned char* row = RowAddress(yRange.r1);
    for (int y = yRange.r1; y < yRange.r2; ++y, source += image.width, row += Stride())
        PlanarRowOut(row, xRange.r1, source, xRange.r2 - xRange.r1);
}

void GrSurface4::CopyRowsOut(GrRange xRange, GrRange yRange, GrImage& image, int dx, int dy)
{
    if (!image.pixels) return;
    unsigned char* target = image.pixels + std::ptrdiff_t{dy} * image.width + dx;
    unsigned char const* source = RowAddress(yRange.r1) + xRange.r1;
    // In modes with more memory than the usual ones, the last rows may lead beyond the window.
    auto const* const end = GrScreen.fbMemory + GrScreen.fbLength;
    for (int y = yRange.r1; y < yRange.r2 && source < end; ++y, target += image.width, source += Stride())
        PlanarRowOut(target, 0, source,
            static_cast<int>(std::min<std::ptrdiff_t>(xRange.r2 - xRange.r1, end - source)));
}

#pragma once

#include <cstddef>
#include <cstdint>

/// The rows of a rectangle of pixels. Nothing needs to be aligned.
struct GrRows {
    unsigned char* address;  ///< of the first pixel
    std::ptrdiff_t stride;   ///< bytes from row to row
    int width;               ///< pixels a row
    int height;
};

/// Rectangles of equal pixels, and of complemented bytes: the loops that large fills spend their time in.
/// They are compiled for several generations of processors, and the best is chosen when the library is
/// loaded. Any thread.
void FillRows8(GrRows const& rows, std::uint8_t pixel);
void FillRows16(GrRows const& rows, std::uint16_t pixel);
void FillRows24(GrRows const& rows, std::uint32_t pixel);  ///< three bytes a pixel
void FillRows32(GrRows const& rows, std::uint32_t pixel);
void InvertRows(GrRows const& rows, int bytesPerPixel);

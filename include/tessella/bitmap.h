#pragma once

#include <tessella/export.h>

#include <cstdint>

/// A mask of one bit a pixel. A row is (`width` + 7) / 8 bytes; within a byte, bit 0 is the leftmost pixel.
///
/// A bitmap has no lock: one thread at a time uses it.
class GR_API GrBitmap {
public:
    std::int32_t width;   ///< in pixels
    std::int32_t height;  ///< in pixels
    unsigned char* data;  ///< rows from the top, without padding between them; owned; null if there are none

    /// A bitmap of clear bits. Without a positive width and height it is empty: all its fields are 0. If
    /// memory runs out, `std::bad_alloc` leaves the constructor.
    GrBitmap(int bitmapWidth, int bitmapHeight);
    GrBitmap(GrBitmap const&) = delete;
    GrBitmap& operator=(GrBitmap const&) = delete;
    ~GrBitmap();

    /// Copies all rows from `rows`, which is laid out like `data`.
    void Load(unsigned char const* rows);
};

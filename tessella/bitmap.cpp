#include <tessella/bitmap.h>

#include <cstddef>
#include <cstring>

namespace {

constexpr std::size_t kSpareBytes = 3;  // so that a bit may be fetched with the three bytes behind its own

std::size_t SizeOf(int width, int height)
{
    return (static_cast<std::size_t>(width) + 7) / 8 * static_cast<std::size_t>(height);
}

}

GrBitmap::GrBitmap(int bitmapWidth, int bitmapHeight) : width(0), height(0), data(nullptr)
{
    if (bitmapWidth < 1 || bitmapHeight < 1) return;
    std::size_t const size = SizeOf(bitmapWidth, bitmapHeight);
    data = new unsigned char[size + kSpareBytes];
    std::memset(data, 0, size);
    width = bitmapWidth;
    height = bitmapHeight;
}

GrBitmap::~GrBitmap() { delete[] data; }

void GrBitmap::Load(unsigned char const* rows)
{
    if (data != nullptr) std::memcpy(data, rows, SizeOf(width, height));
}

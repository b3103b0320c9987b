#include <tessella/pixel/fill_rows.h>

#include <cstring>

// Sanitizers would instrument the choice of the version too, which happens before they are ready; and clang does
// not know all of these processors.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__) || defined(__clang__)
#define GR_CLONES
#else
#define GR_CLONES __attribute__((target_clones("arch=x86-64-v4", "avx2", "default")))
#endif

void FillRows8(GrRows rows, std::uint8_t pixel)
{
    for (; rows.height > 0; --rows.height, rows.address += rows.stride)
        std::memset(rows.address, pixel, static_cast<unsigned>(rows.width));
}

GR_CLONES void FillRows16(GrRows rows, std::uint16_t pixel)
{
    for (; rows.height > 0; --rows.height, rows.address += rows.stride)
        for (std::ptrdiff_t x = 0; x < rows.width; ++x)
            std::memcpy(rows.address + x * 2, &pixel, 2);
}

GR_CLONES void FillRows32(GrRows rows, std::uint32_t pixel)
{
    for (; rows.height > 0; --rows.height, rows.address += rows.stride)
        for (std::ptrdiff_t x = 0; x < rows.width; ++x)
            std::memcpy(rows.address + x * 4, &pixel, 4);
}

GR_CLONES void InvertRows(GrRows rows, int bytesPerPixel)
{
    std::ptrdiff_t const length = std::ptrdiff_t{rows.width} * bytesPerPixel;
    for (; rows.height > 0; --rows.height, rows.address += rows.stride)
        for (std::ptrdiff_t i = 0; i < length; ++i)
            rows.address[i] = static_cast<unsigned char>(~rows.address[i]);
}

// Pixels of three bytes repeat every three words, and every three blocks of words; a, b and c are the words at
// the three phases. A row is a whole number of pixels, so its last block begins at the third phase whatever its
// length, and may overlap the block before.
GR_CLONES void FillRows24(GrRows rows, std::uint32_t pixel)
{
    using Block = std::uint32_t __attribute__((vector_size(64)));
    using SmallBlock = std::uint32_t __attribute__((vector_size(16)));

    pixel &= 0x00FFFFFF;
    std::uint32_t const a = pixel | pixel << 24;
    std::uint32_t const b = pixel >> 8 | pixel << 16;
    std::uint32_t const c = pixel >> 16 | pixel << 8;
    std::ptrdiff_t const length = std::ptrdiff_t{rows.width} * 3;

    auto const fill = [&]<typename Vector>(Vector const& first, Vector const& second, Vector const& third) {
        constexpr std::ptrdiff_t kSize = sizeof(Vector);
        for (; rows.height > 0; --rows.height, rows.address += rows.stride) {
            unsigned char* to = rows.address;
            unsigned char* const end = to + length;
            for (; end - to >= 3 * kSize; to += 3 * kSize) {
                std::memcpy(to, &first, kSize);
                std::memcpy(to + kSize, &second, kSize);
                std::memcpy(to + 2 * kSize, &third, kSize);
            }
            if (end - to >= kSize) std::memcpy(to, &first, kSize);
            if (end - to >= 2 * kSize) std::memcpy(to + kSize, &second, kSize);
            std::memcpy(end - kSize, &third, kSize);
        }
    };

    if (length >= std::ptrdiff_t{sizeof(Block)}) {
        fill(Block{a, b, c, a, b, c, a, b, c, a, b, c, a, b, c, a},
            Block{b, c, a, b, c, a, b, c, a, b, c, a, b, c, a, b},
            Block{c, a, b, c, a, b, c, a, b, c, a, b, c, a, b, c});
    } else if (length >= std::ptrdiff_t{sizeof(SmallBlock)}) {
        fill(SmallBlock{a, b, c, a}, SmallBlock{b, c, a, b}, SmallBlock{c, a, b, c});
    } else {
        for (; rows.height > 0; --rows.height, rows.address += rows.stride)
            for (std::ptrdiff_t i = 0; i < length; i += 3)
                std::memcpy(rows.address + i, &pixel, 3);
    }
}

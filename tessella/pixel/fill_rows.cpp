#include <tessella/pixel/fill_rows.h>

#include <algorithm>
#include <cstring>
#include <iterator>

// Sanitizers would instrument the choice of the version too, which happens before they are ready; and clang
// does not know the names of these processors.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__) || defined(__clang__) ||                   \
    !defined(__x86_64__)
#define GR_CLONES
#else
#define GR_CLONES __attribute__((target_clones("arch=x86-64-v4", "avx2", "default")))
#endif

namespace {

/// Equal pixels as words: those of one, two or four bytes repeat in every word, those of three bytes in every
/// third, `a`, `b` and `c` being the words at the three phases.
struct Words {
    std::uint32_t a, b, c;
};

// A row is stored in blocks of words, which repeat after three blocks. It is a whole number of pixels, so its
// last block begins at the third phase whatever the length, and may overlap the block before. Rows shorter
// than a block are few and narrow; they are stored byte by byte.
//
// Blocks that straddle cache lines cost twice. Where all words are equal, the second block moves back to
// where a line begins, if that is a whole number of pixels and the row is long enough to gain by it.
GR_CLONES void FillWords(GrRows const& rows, int bytesPerPixel, Words words)
{
    using Block = std::uint32_t __attribute__((vector_size(64)));
    using SmallBlock = std::uint32_t __attribute__((vector_size(16)));

    auto const [a, b, c] = words;
    std::ptrdiff_t const length = std::ptrdiff_t{rows.width} * bytesPerPixel;
    std::ptrdiff_t const stride = rows.stride;
    unsigned char* row = rows.address;
    int height = rows.height;

    auto const position = reinterpret_cast<std::uintptr_t>(row) | static_cast<std::uintptr_t>(stride);
    bool const equal = bytesPerPixel != 3;  // then a power of 2
    bool const linesUp =
        length >= 256 && equal && (position & (static_cast<unsigned>(bytesPerPixel) - 1)) == 0;

    auto const fill = [&]<typename Vector>(Vector const& first, Vector const& second, Vector const& third) {
        constexpr std::ptrdiff_t kSize = sizeof(Vector);
        for (; height > 0; --height, row += stride) {
            unsigned char* to = row;
            unsigned char* const end = to + length;
            if (linesUp) {
                std::memcpy(to, &first, kSize);
                to += kSize - static_cast<std::ptrdiff_t>(reinterpret_cast<std::uintptr_t>(to) % kSize);
            }
            for (; end - to >= 3 * kSize; to += 3 * kSize) {
                std::memcpy(to, &first, kSize);
                std::memcpy(to + kSize, &second, kSize);
                std::memcpy(to + 2 * kSize, &third, kSize);
            }
            if (end - to >= kSize) {
                std::memcpy(to, &first, kSize);
                to += kSize;
                if (end - to >= kSize) {
                    std::memcpy(to, &second, kSize);
                    to += kSize;
                }
            }
            if (to != end) std::memcpy(end - kSize, &third, kSize);
        }
    };

    // Laying out three blocks costs a short row more than storing them, so equal words make one only; and
    // from an array, since the compiler would set the words of a large vector one by one.
    if (length >= std::ptrdiff_t{sizeof(Block)} && equal) {
        std::uint32_t same[sizeof(Block) / sizeof a];
        std::fill(std::begin(same), std::end(same), a);
        Block block;
        std::memcpy(&block, same, sizeof block);
        fill(block, block, block);
    } else if (length >= std::ptrdiff_t{sizeof(Block)}) {
        fill(Block{a, b, c, a, b, c, a, b, c, a, b, c, a, b, c, a},
            Block{b, c, a, b, c, a, b, c, a, b, c, a, b, c, a, b},
            Block{c, a, b, c, a, b, c, a, b, c, a, b, c, a, b, c});
    } else if (length >= std::ptrdiff_t{sizeof(SmallBlock)} && equal) {
        SmallBlock const block = SmallBlock{} + a;
        fill(block, block, block);
    } else if (length >= std::ptrdiff_t{sizeof(SmallBlock)}) {
        fill(SmallBlock{a, b, c, a}, SmallBlock{b, c, a, b}, SmallBlock{c, a, b, c});
    } else {
        std::uint32_t const phases[] = {a, b, c};
        for (; height > 0; --height, row += stride)
            for (std::ptrdiff_t i = 0; i < length; ++i)
                row[i] = static_cast<unsigned char>(phases[i / 4 % 3] >> i % 4 * 8);
    }
}

}

void FillRows8(GrRows const& rows, std::uint8_t pixel)
{
    std::uint32_t const word = pixel * 0x01010101u;
    FillWords(rows, 1, {word, word, word});
}

void FillRows16(GrRows const& rows, std::uint16_t pixel)
{
    std::uint32_t const word = pixel * 0x00010001u;
    FillWords(rows, 2, {word, word, word});
}

void FillRows24(GrRows const& rows, std::uint32_t pixel)
{
    pixel &= 0x00FFFFFF;
    FillWords(rows, 3, {pixel | pixel << 24, pixel >> 8 | pixel << 16, pixel >> 16 | pixel << 8});
}

void FillRows32(GrRows const& rows, std::uint32_t pixel) { FillWords(rows, 4, {pixel, pixel, pixel}); }

GR_CLONES void InvertRows(GrRows const& rows, int bytesPerPixel)
{
    std::ptrdiff_t const length = std::ptrdiff_t{rows.width} * bytesPerPixel;
    unsigned char* row = rows.address;
    for (int height = rows.height; height > 0; --height, row += rows.stride)
        for (std::ptrdiff_t i = 0; i < length; ++i)
            row[i] = static_cast<unsigned char>(~row[i]);
}

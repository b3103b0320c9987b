#pragma once

#include <tessella/bitmap.h>
#include <tessella/pixel/fill_rows.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>

/// A picture of one bit a pixel. Its rows begin `pitch` bytes apart, the leftmost pixel in the highest or the
/// lowest bit of a byte; or, with a pitch of 0, follow each other bit by bit, always the lowest first.
struct GrBits {
    std::uint8_t const* data;
    int width, height;
    int pitch;
    bool msbFirst;

    bool IsSet(int row, int column) const
    {
        std::ptrdiff_t const index = pitch == 0 ? std::ptrdiff_t{row} * width + column
            : msbFirst                          ? column ^ 7
                                                : column;
        return data[std::ptrdiff_t{row} * pitch + index / 8] >> index % 8 & 1;
    }
};

inline GrBits BitsOf(GrBitmap const& bitmap)
{
    int const pitch = static_cast<int>((static_cast<unsigned>(bitmap.width) + 7) / 8);
    return {bitmap.data, bitmap.width, bitmap.height, pitch, false};
}

/// A rectangle to paint from the pixel `column`, `row` of some bits on, clipped already. Clear bits leave
/// their pixels alone or paint them.
struct GrBitsBox {
    GrRows target;
    GrBits bits;
    int column, row;
    std::uint32_t fore, back;  ///< pixels
    bool transparent;
};

/// Takes many bits at a time, wherever they begin, and touches no byte that holds none. The picture has
/// pixels. Always inlined, since sources for several generations of processors use it.
class GrBitsReader {
public:
    [[gnu::always_inline]] explicit GrBitsReader(GrBits const& bits)
        : pitch(bits.pitch == 0 ? static_cast<std::size_t>(bits.width)
                                : static_cast<std::size_t>(bits.pitch) * 8),
          data(bits.data), isReversed(bits.pitch != 0 && bits.msbFirst)
    {
        std::size_t const size =
            (static_cast<unsigned>(bits.height - 1) * pitch + static_cast<unsigned>(bits.width) + 7) / 8;
        lastWord = size - kWord;
        if (size >= kWord) return;
        std::memcpy(few, data, size);
        data = few;
        lastWord = 0;
    }
    GrBitsReader(GrBitsReader const&) = delete;
    GrBitsReader& operator=(GrBitsReader const&) = delete;

    /// The pixels from bit `first` on, in the order of the picture, the first in the lowest bit: `kMost`, or
    /// all that there are. What comes behind them means nothing.
    [[gnu::always_inline]] std::uint64_t Read(std::size_t first) const
    {
        std::size_t const byte = std::min(first / 8, lastWord);
        std::uint64_t word;
        std::memcpy(&word, data + byte, sizeof word);
        if (isReversed) word = WithBytesReversed(word);
        return word >> (first - byte * 8);
    }

    static constexpr unsigned kMost = 57;
    std::size_t const pitch;  ///< bits from row to row

private:
    static constexpr std::size_t kWord = sizeof(std::uint64_t);

    /// The bits of each byte in opposite order.
    [[gnu::always_inline]] static constexpr std::uint64_t WithBytesReversed(std::uint64_t word)
    {
        word = (word >> 4 & 0x0F0F0F0F0F0F0F0F) | (word & 0x0F0F0F0F0F0F0F0F) << 4;
        word = (word >> 2 & 0x3333333333333333) | (word & 0x3333333333333333) << 2;
        return (word >> 1 & 0x5555555555555555) | (word & 0x5555555555555555) << 1;
    }

    unsigned char const* data;
    std::size_t lastWord;  // where the last whole word begins
    bool isReversed;
    unsigned char few[kWord] = {};  // all of the data, if it is less than a word
};

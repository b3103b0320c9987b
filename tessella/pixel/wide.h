#pragma once

#include <tessella/pixel/blend.h>
#include <tessella/pixel/clones.h>

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <type_traits>

// Sixteen pixels at a time: how each format loads and stores them, and how their colours are mixed. Written in
// the compilers' own vectors, which become what registers there are.

// Everything here is inlined, so that no vector is ever passed in a way that depends on the processor.
#pragma GCC diagnostic ignored "-Wpsabi"

constexpr int kWide = 16;
using WideWords = std::uint32_t __attribute__((vector_size(64)));  ///< one word a pixel
using WideShorts = std::uint16_t __attribute__((vector_size(32)));
using WideBytes = std::uint8_t __attribute__((vector_size(16)));
using WideHalves = std::uint16_t __attribute__((vector_size(64)));  ///< two a pixel

/// Colours taken apart, so that there is room for products: red in bits 0 to 7 and blue in 16 to 23 of one
/// word, green in bits 0 to 7 of the other.
struct WideChannels {
    WideWords redBlue, green;
};

GR_INLINE WideWords Splat(std::uint32_t word)
{
    std::uint32_t words[kWide];
    for (std::uint32_t& one : words)
        one = word;
    WideWords splat;
    std::memcpy(&splat, words, sizeof splat);
    return splat;
}

// Word by word and through memory, as it seems: compilers find the one instruction for it, where there is one,
// better than for their own vectors.
template <typename Packed>
GR_INLINE WideWords Widened(Packed const& packed)
{
    std::remove_cvref_t<decltype(packed[0])> parts[kWide];
    std::memcpy(parts, &packed, sizeof parts);
    std::uint32_t words[kWide];
    for (int i = 0; i < kWide; ++i)
        words[i] = parts[i];
    WideWords widened;
    std::memcpy(&widened, words, sizeof widened);
    return widened;
}

template <typename Packed>
GR_INLINE Packed Narrowed(WideWords const& wide)
{
    std::uint32_t words[kWide];
    std::memcpy(words, &wide, sizeof words);
    Packed packed;
    std::remove_cvref_t<decltype(packed[0])> parts[kWide];
    for (int i = 0; i < kWide; ++i)
        parts[i] = static_cast<std::remove_cvref_t<decltype(packed[0])>>(words[i]);
    std::memcpy(&packed, parts, sizeof packed);
    return packed;
}

GR_INLINE WideChannels SplitColors(WideWords const& colors)
{
    return {colors & 0x00FF00FF, colors >> 8 & 0xFF};
}

GR_INLINE WideWords JoinChannels(WideChannels const& channels)
{
    return channels.redBlue | channels.green << 8;
}

/// The word's halves exchanged.
GR_INLINE WideWords Turned(WideWords const& words) { return words << 16 | words >> 16; }

/// Both halves of each word times those of `factors`, / 256.
GR_INLINE WideWords Scaled(WideWords const& words, WideWords const& factors)
{
    return (WideWords)((WideHalves)words * (WideHalves)factors >> 8);
}

GR_INLINE WideChannels Scaled(WideChannels const& channels, WideWords const& factors)
{
    WideWords const both = factors | factors << 16;
    return {Scaled(channels.redBlue, both), Scaled(channels.green, both)};
}

/// `Mixed` of sixteen colours: ninth bits spill into the next channel here, too.
GR_INLINE WideWords Mixed(
    WideChannels const& source, WideChannels const& destination, WideWords const& alphas)
{
    WideChannels const rest = Scaled(destination, 255 - alphas);
    return (source.redBlue + rest.redBlue) | (source.green + rest.green) << 8 | 0xFF000000;
}

/// Where the sixteen columns begin that contain `next`, out of `from` to `to`. The last ones go back over some
/// that are done already, unless there are fewer than sixteen in all.
constexpr int WideStart(int next, int from, int to)
{
    return to - next < kWide && to - from >= kWide ? to - kWide : next;
}

/// Reads and writes `count` pixels of `Bytes` each as sixteen; those beyond are 0, and not written.
template <int Bytes, typename Vector>
GR_INLINE Vector LoadSome(unsigned char const* from, int count)
{
    if (count < kWide) [[unlikely]] {
        Vector few{};
        std::memcpy(&few, from, static_cast<std::size_t>(Bytes * count));
        return few;
    }
    Vector pixels;
    std::memcpy(&pixels, from, Bytes * kWide);
    return pixels;
}

template <int Bytes, typename Vector>
GR_INLINE void StoreSome(unsigned char* to, int count, Vector const& pixels)
{
    if (count < kWide) [[unlikely]] {
        Vector const few = pixels;
        std::memcpy(to, &few, static_cast<std::size_t>(Bytes * count));
    } else {
        std::memcpy(to, &pixels, Bytes * kWide);
    }
}

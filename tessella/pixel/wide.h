#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

// Several pixels at a time, in vectors of one word a pixel, as wide as the processor's registers. Sources
// that include this are compiled for one generation of processors each; everything here is inlined, or
// depends on the number of lanes, so that they share no code.

#define GR_INLINE [[gnu::always_inline]] inline
#define GR_INLINE_LAMBDA __attribute__((always_inline))

// No vector is ever passed to a function that is called.
#pragma GCC diagnostic ignored "-Wpsabi"

template <int kLanes>
struct GrWideVectors;
template <>
struct GrWideVectors<16> {
    using Words = std::uint32_t __attribute__((vector_size(64)));
    using Anywhere = std::uint32_t __attribute__((vector_size(64), aligned(1), may_alias));
    using Signs = std::int32_t __attribute__((vector_size(64)));
    using Halves = std::uint16_t __attribute__((vector_size(64)));  // two a word
};
template <>
struct GrWideVectors<8> {
    using Words = std::uint32_t __attribute__((vector_size(32)));
    using Anywhere = std::uint32_t __attribute__((vector_size(32), aligned(1), may_alias));
    using Signs = std::int32_t __attribute__((vector_size(32)));
    using Halves = std::uint16_t __attribute__((vector_size(32)));
};
template <>
struct GrWideVectors<4> {
    using Words = std::uint32_t __attribute__((vector_size(16)));
    using Anywhere = std::uint32_t __attribute__((vector_size(16), aligned(1), may_alias));
    using Signs = std::int32_t __attribute__((vector_size(16)));
    using Halves = std::uint16_t __attribute__((vector_size(16)));
};

/// Vectors of one word a pixel, and what is done with the pixels of all formats.
template <int kLaneCount>
struct GrWide : GrWideVectors<kLaneCount> {
    static constexpr int kLanes = kLaneCount;
    using typename GrWideVectors<kLaneCount>::Words;
    using typename GrWideVectors<kLaneCount>::Anywhere;
    using typename GrWideVectors<kLaneCount>::Halves;

    /// Colours taken apart, so that there is room for products: red in bits 0 to 7 and blue in 16 to 23 of
    /// one word, green in bits 0 to 7 of the other.
    struct Channels {
        Words redBlue, green;
    };

    GR_INLINE static Words Splat(std::uint32_t word)
    {
        std::uint32_t words[kLanes];
        for (std::uint32_t& each : words)
            each = word;
        return At(words);
    }

    GR_INLINE static Channels Split(Words const& colors) { return {colors & 0x00FF00FF, colors >> 8 & 0xFF}; }
    GR_INLINE static Words Join(Channels const& channels) { return channels.redBlue | channels.green << 8; }

    /// The word's halves exchanged.
    GR_INLINE static Words Turned(Words const& words) { return words << 16 | words >> 16; }

    /// Each channel times a factor, / 256.
    GR_INLINE static Channels Scaled(Channels const& channels, Words const& factors)
    {
        Halves const both = (Halves)(factors | factors << 16);
        return {(Words)((Halves)channels.redBlue * both >> 8), (Words)((Halves)channels.green * both >> 8)};
    }

    /// `Mixed` of the colours: ninth bits spill into the next channel here, too.
    GR_INLINE static Words Mixed(Channels const& source, Channels const& destination, Words const& alphas)
    {
        Channels const rest = Scaled(destination, 255 - alphas);
        return (source.redBlue + rest.redBlue) | (source.green + rest.green) << 8 | 0xFF000000;
    }

    /// Reads and writes `count` unsigned numbers of type `Part`, of which there may be more than lanes; lanes
    /// beyond are 0, and not written.
    template <typename Part>
    GR_INLINE static Words Load(unsigned char const* from, int count)
    {
        Part parts[kLanes];
        if (count < kLanes) [[unlikely]] {
            std::memset(parts, 0, sizeof parts);
            std::memcpy(parts, from, sizeof(Part) * static_cast<std::size_t>(count));
            return Widened(parts);
        }
        if constexpr (sizeof(Part) == 4) return At(from);
        std::memcpy(parts, from, sizeof parts);
        return Widened(parts);
    }
    template <typename Part>
    GR_INLINE static void Store(unsigned char* to, int count, Words const& vector)
    {
        if constexpr (sizeof(Part) == 4) {
            if (count >= kLanes) [[likely]] {
                At(to) = vector;
                return;
            }
        }
        std::uint32_t words[kLanes];
        At(words) = vector;
        Part parts[kLanes];
        for (int i = 0; i < kLanes; ++i)
            parts[i] = static_cast<Part>(words[i]);
        if (count >= kLanes) [[likely]]
            std::memcpy(to, parts, sizeof parts);
        else
            std::memcpy(to, parts, sizeof(Part) * static_cast<std::size_t>(count));
    }

    /// The vector that lies at some address.
    GR_INLINE static Anywhere& At(void* address) { return *static_cast<Anywhere*>(address); }
    GR_INLINE static Anywhere const& At(void const* address)
    {
        return *static_cast<Anywhere const*>(address);
    }

    /// Where the lanes begin that contain column `next`, out of `from` to `to`. The last ones go back over
    /// some columns that are done already, unless there are fewer columns than lanes in all.
    static constexpr int Start(int next, int from, int to)
    {
        return to - next < kLanes && to - from >= kLanes ? to - kLanes : next;
    }

private:
    // By way of memory, as it seems: compilers see the one instruction for it in loops over words better than
    // in their own vectors.
    template <typename Part>
    GR_INLINE static Words Widened(Part const (&parts)[kLanes])
    {
        std::uint32_t words[kLanes];
        for (int i = 0; i < kLanes; ++i)
            words[i] = parts[i];
        return At(words);
    }
};

#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

#ifdef __x86_64__
#include <immintrin.h>
#endif

// Loads and stores of some lanes only, for words, halves and bytes.
#if defined __AVX512BW__ && defined __AVX512VL__
#define GR_WIDE_MASKS
#endif

// Several pixels at a time, in vectors of one word a pixel, as wide as the processor's registers. Sources
// that include this are compiled for one generation of processors each; everything here is inlined, or
// depends on the number of lanes, so that they share no code. What is taken for narrow rows, with fewer lanes
// than a source is there for, is inlined.

#define GR_INLINE [[gnu::always_inline]] inline
#define GR_INLINE_LAMBDA __attribute__((always_inline))

// No vector is ever passed to a function that is called.
#pragma GCC diagnostic ignored "-Wpsabi"

template <int kLanes>
struct GrWideVectors;
template <>
struct GrWideVectors<16> {
    using Words = std::uint32_t __attribute__((vector_size(64)));
    using Signs = std::int32_t __attribute__((vector_size(64)));
    using Halves = std::uint16_t __attribute__((vector_size(64)));  // two a word
};
template <>
struct GrWideVectors<8> {
    using Words = std::uint32_t __attribute__((vector_size(32)));
    using Signs = std::int32_t __attribute__((vector_size(32)));
    using Halves = std::uint16_t __attribute__((vector_size(32)));
};
template <>
struct GrWideVectors<4> {
    using Words = std::uint32_t __attribute__((vector_size(16)));
    using Signs = std::int32_t __attribute__((vector_size(16)));
    using Halves = std::uint16_t __attribute__((vector_size(16)));
};

/// Vectors of one word a pixel, and what is done with the pixels of all formats.
template <int kLaneCount>
struct GrWide : GrWideVectors<kLaneCount> {
    static constexpr int kLanes = kLaneCount;
    using typename GrWideVectors<kLaneCount>::Words;
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
        return Read(words);
    }

    GR_INLINE static Channels Split(Words const& colors) { return {colors & 0x00FF00FF, colors >> 8 & 0xFF}; }
    GR_INLINE static Words Join(Channels const& channels) { return channels.redBlue | channels.green << 8; }

    /// The word's halves exchanged.
    GR_INLINE static Words Turned(Words const& words) { return words << 16 | words >> 16; }

    /// Factors of pixels, below 256, for each of their halves; at its top, where a product's upper half is
    /// all that is needed.
    GR_INLINE static Halves Factors(Words const& factors)
    {
        Words const upper = factors << 8;
        return (Halves)(upper | upper << 16);
    }

    /// Each channel times a factor, / 256.
    GR_INLINE static Channels Scaled(Channels const& channels, Halves const& factors)
    {
        return {UpperProducts(channels.redBlue, factors), UpperProducts(channels.green, factors)};
    }

    /// `Mixed` of the colours: ninth bits spill into the next channel here, too.
    GR_INLINE static Words Mixed(Channels const& source, Channels const& destination, Halves const& alphas)
    {
        Channels const rest = Scaled(destination, alphas ^ 0xFF00);
        return (source.redBlue + rest.redBlue) | (source.green + rest.green) << 8 | 0xFF000000;
    }

    /// Reads and writes `count` unsigned numbers of type `Part`, of which there may be more than lanes; lanes
    /// beyond are 0, and not written.
    template <typename Part>
    GR_INLINE static Words Load(unsigned char const* from, int count)
    {
        if (count < kLanes) [[unlikely]]
            return LoadFirst<Part>(from, count);
        Part parts[kLanes];
        if constexpr (sizeof(Part) == 4) return Read(from);
        std::memcpy(parts, from, sizeof parts);
        return Widened(parts);
    }
    template <typename Part>
    GR_INLINE static void Store(unsigned char* to, int count, Words const& vector)
    {
        if constexpr (sizeof(Part) == 4) {
            if (count >= kLanes) [[likely]] {
                Write(to, vector);
                return;
            }
        }
        if (count < kLanes) [[unlikely]]
            return StoreSome<Part>(to, FirstLanes(count), vector);
        std::uint32_t words[kLanes];
        Write(words, vector);
        Part parts[kLanes];
        for (int i = 0; i < kLanes; ++i)
            parts[i] = static_cast<Part>(words[i]);
        std::memcpy(to, parts, sizeof parts);
    }

    /// Lanes are numbered by the bits of a word, from the lowest on: the first `count`, or all; and which of
    /// them a word names.
    GR_INLINE static unsigned FirstLanes(int count)
    {
        return count < kLanes ? (1u << count) - 1 : (1u << kLanes) - 1;
    }
    GR_INLINE static auto Named(unsigned lanes)
    {
        std::uint32_t bits[kLanes];
        for (int i = 0; i < kLanes; ++i)
            bits[i] = 1u << i;
        return (Read(bits) & Splat(lanes)) != 0;
    }

    /// As many bytes as there are lanes: the first `count` from memory, the others 0.
    GR_INLINE static void CopyFirst(unsigned char (&to)[kLanes], unsigned char const* from, int count)
    {
#ifdef GR_WIDE_MASKS
        if constexpr (kLanes >= 8) {
            auto const bytes = _mm_maskz_loadu_epi8(static_cast<__mmask16>(FirstLanes(count)), from);
            std::memcpy(to, &bytes, sizeof to);
            return;
        }
#endif
        std::memset(to, 0, sizeof to);
        std::memcpy(to, from, static_cast<std::size_t>(count));
    }

    /// Writes the named lanes, and touches no memory of others.
    template <typename Part>
    GR_INLINE static void StoreSome(unsigned char* to, unsigned lanes, Words const& vector)
    {
#ifdef GR_WIDE_MASKS
        if constexpr (kLanes == 16) {
            auto const named = static_cast<__mmask16>(lanes);
            if constexpr (sizeof(Part) == 4) _mm512_mask_storeu_epi32(to, named, (__m512i)vector);
            if constexpr (sizeof(Part) == 2)
                _mm256_mask_storeu_epi16(to, named, _mm512_maskz_cvtepi32_epi16(named, (__m512i)vector));
            if constexpr (sizeof(Part) == 1)
                _mm_mask_storeu_epi8(to, named, _mm512_maskz_cvtepi32_epi8(named, (__m512i)vector));
            return;
        } else if constexpr (kLanes == 8) {
            auto const named = static_cast<__mmask8>(lanes);
            if constexpr (sizeof(Part) == 4) _mm256_mask_storeu_epi32(to, named, (__m256i)vector);
            if constexpr (sizeof(Part) == 2)
                _mm_mask_storeu_epi16(to, named, _mm256_maskz_cvtepi32_epi16(named, (__m256i)vector));
            if constexpr (sizeof(Part) == 1)
                _mm_mask_storeu_epi8(to, named, _mm256_maskz_cvtepi32_epi8(named, (__m256i)vector));
            return;
        }
#elif defined __AVX2__
        if constexpr (kLanes == 8 && sizeof(Part) == 4)
            return _mm256_maskstore_epi32(reinterpret_cast<int*>(to), (__m256i)Named(lanes), (__m256i)vector);
#endif
        std::uint32_t words[kLanes];
        Write(words, vector);
        for (; lanes != 0; lanes &= lanes - 1) {
            auto const lane = static_cast<unsigned>(__builtin_ctz(lanes));
            auto const part = static_cast<Part>(words[lane]);
            std::memcpy(to + lane * sizeof(Part), &part, sizeof(Part));
        }
    }

    GR_INLINE static Words Read(void const* from) { return static_cast<Anywhere const*>(from)->vector; }
    GR_INLINE static void Write(void* to, Words const& vector)
    {
        static_cast<Anywhere*>(to)->vector = vector;
    }

    /// Where the lanes begin that contain column `next`, out of `from` to `to`. The last ones go back over
    /// some columns that are done already, unless there are fewer columns than lanes in all.
    GR_INLINE static constexpr int Start(int next, int from, int to)
    {
        return to - next < kLanes && to - from >= kLanes ? to - kLanes : next;
    }

private:
    /// A vector that may lie at any address, among values of any type.
    struct [[gnu::packed, gnu::may_alias]] Anywhere { Words vector; };

    GR_INLINE static Words UpperProducts(Words const& a, Halves const& b)
    {
#if defined __AVX512BW__
        if constexpr (kLanes == 16) return (Words)_mm512_mulhi_epu16((__m512i)a, (__m512i)b);
#endif
#if defined __AVX2__
        if constexpr (kLanes == 8) return (Words)_mm256_mulhi_epu16((__m256i)a, (__m256i)b);
#endif
#if defined __x86_64__
        if constexpr (kLanes == 4) return (Words)_mm_mulhi_epu16((__m128i)a, (__m128i)b);
#endif
        // One of the factors has nothing in its lower half.
        return (Words)((Halves)a * (b >> 8) >> 8);
    }

    template <typename Part>
    GR_INLINE static Words LoadFirst(unsigned char const* from, int count)
    {
#ifdef GR_WIDE_MASKS
        if constexpr (kLanes == 16) {
            auto const named = static_cast<__mmask16>(FirstLanes(count));
            if constexpr (sizeof(Part) == 4) return (Words)_mm512_maskz_loadu_epi32(named, from);
            if constexpr (sizeof(Part) == 2)
                return (Words)_mm512_maskz_cvtepu16_epi32(named, _mm256_maskz_loadu_epi16(named, from));
            return (Words)_mm512_maskz_cvtepu8_epi32(named, _mm_maskz_loadu_epi8(named, from));
        } else if constexpr (kLanes == 8) {
            auto const named = static_cast<__mmask8>(FirstLanes(count));
            if constexpr (sizeof(Part) == 4) return (Words)_mm256_maskz_loadu_epi32(named, from);
            if constexpr (sizeof(Part) == 2)
                return (Words)_mm256_maskz_cvtepu16_epi32(named, _mm_maskz_loadu_epi16(named, from));
            return (Words)_mm256_maskz_cvtepu8_epi32(named, _mm_maskz_loadu_epi8(named, from));
        }
#endif
        Part parts[kLanes] = {};
        std::memcpy(parts, from, sizeof(Part) * static_cast<std::size_t>(count));
        return Widened(parts);
    }

    // By way of memory, as it seems: compilers see the one instruction for it in loops over words better than
    // in their own vectors.
    template <typename Part>
    GR_INLINE static Words Widened(Part const (&parts)[kLanes])
    {
        std::uint32_t words[kLanes];
        for (int i = 0; i < kLanes; ++i)
            words[i] = parts[i];
        return Read(words);
    }
};

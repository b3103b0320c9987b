#include <tessella/region_storage.h>

#include <limits>

#ifdef __x86_64__
#include <immintrin.h>
#endif

// The check that ends every merge. Nearly always nothing is wrong, and the check must not cost more than the
// merge: so a quick pass looks for the next band that is not in perfect order, which is a stricter question
// with a simpler answer, and only the bands that it stops at are judged by the rules.

using Band = GrRegion::Band;

Band const* FirstImperfectPlain(Band const* band, Band const* end, int above)
{
    for (; band != end; ++band) {
        if (band->r1 < above || band->r1 >= band->r2) return band;
        above = band->r1;
        bool disorder = false;
        for (int i = 0; i < band->item_count; ++i)
            disorder |= band->items[i].r1 >= band->items[i].r2;
        for (int i = 1; i < band->item_count; ++i)
            disorder |= band->items[i - 1].r2 > band->items[i].r1;
        if (disorder) return band;
    }
    return end;
}

#ifdef __x86_64__
/// Ends that are compared at a time, each with the one after it; even, so that an r1 comes first.
static constexpr int kPairs = 8;

/// Of the first `pairs` ends, those that are not before the one after them.
[[gnu::target("avx512f,avx512vl")]] inline static unsigned WrongPairs(int const* ends, __mmask8 pairs)
{
    __m256i const mayTouch = _mm256_set1_epi64x(1LL << 32);  // an r2 may equal the r1 after it
    __m256i const here = _mm256_maskz_loadu_epi32(pairs, ends);
    __m256i const next = _mm256_maskz_loadu_epi32(pairs, ends + 1);
    return _mm256_mask_cmple_epi32_mask(pairs, next, _mm256_sub_epi32(here, mayTouch));
}

// How many ranges the next band has is hard to foresee: up to four take the same path, and so does none, for
// which nothing is read.
[[gnu::target("avx512f,avx512vl,bmi2")]] Band const* FirstImperfectWide(
    Band const* band, Band const* end, int above)
{
    constexpr unsigned kAll = (1U << kPairs) - 1;
    for (; band != end; ++band) {
        if (band->r1 < above || band->r1 >= band->r2) return band;
        above = band->r1;
        int const* ends = band->items != nullptr ? &band->items->r1 : &band->r1;
        int count = 2 * band->item_count;
        for (; count > kPairs; count -= kPairs, ends += kPairs)
            if (WrongPairs(ends, kAll) != 0) return band;
        unsigned const pairs = _bzhi_u32(kAll, static_cast<unsigned>(count)) >> 1;
        if (WrongPairs(ends, static_cast<__mmask8>(pairs)) != 0) return band;
    }
    return end;
}

bool WideRegistersPresent()
{
    return __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512vl") &&
        __builtin_cpu_supports("bmi2");
}
#else
Band const* FirstImperfectWide(Band const* band, Band const* end, int above)
{
    return FirstImperfectPlain(band, end, above);
}

bool WideRegistersPresent() { return false; }
#endif

namespace {

/// False, and reported, if a range ends before it begins or begins before its predecessor does. A predecessor
/// that begins at 0 is not compared.
bool VerifyBand(Band const& band)
{
    int previous = 0;
    for (int i = 0; i < band.item_count; ++i) {
        GrRange const& range = band.items[i];
        if (range.r1 >= range.r2 || (previous != 0 && range.r1 <= previous))
            return GR_ASSERT_TEXT(false, "false");
        previous = range.r1;
    }
    return true;
}

}

bool VerifyRegion(GrRegion const& region)
{
    Band const* const end = EndOf(region.bands);
    auto* const firstImperfect = WideRegistersPresent() ? FirstImperfectWide : FirstImperfectPlain;
    int previous = std::numeric_limits<int>::min();
    for (Band const* item = region.bands.items; item != end; ++item) {
        item = firstImperfect(item, end, previous);
        if (item == end) break;
        previous = item == region.bands.items ? 0 : item[-1].r1;
        if (item->r1 >= item->r2) return GR_ASSERT_TEXT(false, "false");
        if (previous != 0 && item->r1 < previous) return GR_ASSERT_TEXT(false, "false");
        GR_ASSERT(VerifyBand(*item));
        previous = item->r1;
    }
    return true;
}

void CheckRegion(GrRegion const& region) { GR_ASSERT_TEXT(VerifyRegion(region), "VerifyRegion(*this)"); }

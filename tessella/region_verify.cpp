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
static constexpr int kPairs = 14;

/// Of `pairs` ends, at most 14, those that are not before the one after them. All 14 if `pairs` is -1.
[[gnu::target("avx512f,bmi2")]] inline static unsigned WrongPairs(int const* ends, int pairs)
{
    __m512i const mayTouch = _mm512_set1_epi64(1LL << 32);  // an r2 may equal the r1 after it
    auto const ofPairs = static_cast<__mmask16>(_bzhi_u32((1U << kPairs) - 1, static_cast<unsigned>(pairs)));
    auto const ofEnds = static_cast<__mmask16>(2 * ofPairs + 1);
    __m512i const here = _mm512_maskz_loadu_epi32(ofEnds, ends);
    __m512i const next = _mm512_maskz_alignr_epi32(ofPairs, here, here, 1);
    return _mm512_mask_cmple_epi32_mask(ofPairs, next, _mm512_sub_epi32(here, mayTouch));
}

[[gnu::target("avx512f,bmi2")]] Band const* FirstImperfectWide(Band const* band, Band const* end, int above)
{
    static constexpr int kPerfect[kPairs + 1] = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14};
    for (; band != end; ++band) {
        if (band->r1 < above || band->r1 >= band->r2) return band;
        above = band->r1;
        int const* ends = band->item_count > 0 ? &band->items->r1 : kPerfect;
        int pairs = 2 * band->item_count - 1;
        for (; pairs > kPairs; pairs -= kPairs, ends += kPairs)
            if (WrongPairs(ends, kPairs) != 0) return band;
        if (WrongPairs(ends, pairs) != 0) return band;
    }
    return end;
}

bool WideRegistersPresent() { return __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("bmi2"); }
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

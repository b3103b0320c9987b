#include <tessella/region_storage.h>

#include <limits>

#ifdef __x86_64__
#include <immintrin.h>
#endif

// The check that ends every merge. Nearly always nothing is wrong, and the check must not cost more than the merge:
// so a quick pass looks for the next band that is not in perfect order, which is a stricter question with a simpler
// answer, and only the bands that it stops at are judged by the rules.

using Band = GrRegion::Band;

namespace {

/// The first band that is empty, begins above its predecessor (which begins at `above`), or has a range that is
/// empty or begins before its predecessor ends. `end` if there is none.
[[gnu::target("default")]] Band const* FirstImperfect(Band const* band, Band const* end, int above)
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
/// The same with 16 ends at a time, each but the last compared with the one after it.
[[gnu::target("avx512f"), maybe_unused]] Band const* FirstImperfect(
    Band const* band, Band const* end, int above)
{
    constexpr int kStep = 14;  // even, so that an r1 comes first each time
    static constexpr int kNoEnds[2] = {};
    __m512i const mayTouch = _mm512_set1_epi64(1LL << 32);  // an r2 may equal the r1 after it
    for (; band != end; ++band) {
        int pairs = std::max(2 * band->item_count - 1, 0);
        int const* ends = pairs > 0 ? &band->items->r1 : kNoEnds;
        unsigned disorder = band->r1 < above || band->r1 >= band->r2;
        above = band->r1;
        do {
            auto const ofPairs = static_cast<__mmask16>((1U << std::min(pairs, kStep)) - 1);
            auto const ofEnds = static_cast<__mmask16>(2 * ofPairs + 1);
            __m512i const here = _mm512_maskz_loadu_epi32(ofEnds, ends);
            __m512i const next = _mm512_alignr_epi32(here, here, 1);
            disorder |= _mm512_mask_cmple_epi32_mask(ofPairs, next, _mm512_sub_epi32(here, mayTouch));
            pairs -= kStep;
            ends += kStep;
        } while (pairs > 0);
        if (disorder != 0) return band;
    }
    return end;
}
#endif

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
    int previous = std::numeric_limits<int>::min();
    for (Band const* item = region.bands.items; item != end; ++item) {
        item = FirstImperfect(item, end, previous);
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

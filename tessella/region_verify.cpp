#include <tessella/region_storage.h>

#include <cstdint>
#include <limits>

#ifdef __x86_64__
#include <immintrin.h>
#endif

// The check that ends every merge. Nearly always nothing is wrong, and the check must not cost more than the
// merge: so a quick pass looks for the next band that is not in perfect order, which is a stricter question
// with a simpler answer, and only the bands that it stops at are judged by the rules.

using Band = GrRegion::Band;

/// True if a range is empty, or begins before its predecessor ends.
inline static bool HasDisorder(Band const& band)
{
    GrRange const* range = band.items;
    for (int left = band.item_count; left > 0; ++range) {
        if (range->r1 >= range->r2) return true;
        if (--left > 0 && range[1].r1 < range->r2) return true;
    }
    return false;
}

Band const* FirstImperfectPlain(Band const* band, Band const* end, int above)
{
    for (; band != end; ++band) {
        if (band->r1 < above || band->r1 >= band->r2 || HasDisorder(*band)) return band;
        above = band->r1;
    }
    return end;
}

#ifdef __x86_64__
/// Ranges whose ends are compared at a time, each with the one after it.
static constexpr int kRanges = 4;

/// Of the ends of up to four ranges, which ones another one follows.
static constexpr std::uint8_t kFollowed[kRanges + 1] = {0, 0b1, 0b111, 0b11111, 0b1111111};

/// True if one of the ends that `followed` tells is not before the one after it.
[[gnu::target("avx512dq,avx512vl")]] inline static bool Disordered(int const* ends, __mmask8 followed)
{
    __m256i const mayTouch = _mm256_set1_epi64x(1LL << 32);  // an r2 may equal the r1 after it
    __m256i const here = _mm256_maskz_loadu_epi32(followed, ends);
    __m256i const next = _mm256_maskz_loadu_epi32(followed, ends + 1);
    __mmask8 const wrong = _mm256_mask_cmple_epi32_mask(followed, next, _mm256_sub_epi32(here, mayTouch));
    return _kortestz_mask8_u8(wrong, wrong) == 0;
}

// How many ranges the next band has is hard to foresee: up to four take the same path, and so does none, for
// which nothing is read.
[[gnu::target("avx512dq,avx512vl")]] Band const* FirstImperfectWide(
    Band const* band, Band const* end, int above)
{
    for (; band != end; ++band) {
        if (band->r1 < above || band->r1 >= band->r2) return band;
        above = band->r1;
        int const* ends = band->items != nullptr ? &band->items->r1 : &band->r1;
        auto ranges = static_cast<unsigned>(band->item_count);
        if (ranges > kRanges) [[unlikely]] {
            int count = band->item_count;
            for (; count > kRanges; count -= kRanges, ends += 2 * kRanges)
                if (Disordered(ends, 0xFF)) return band;
            ranges = static_cast<unsigned>(std::max(count, 0));
        }
        if (Disordered(ends, kFollowed[ranges])) return band;
    }
    return end;
}

bool WideRegistersPresent()
{
    return __builtin_cpu_supports("avx512dq") && __builtin_cpu_supports("avx512vl");
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

Band const* FirstImperfect(Band const* band, Band const* end, int above)
{
    constexpr std::ptrdiff_t kFew = 24;
    // A few bands, just written, are sooner looked at one by one than waited for.
    return end - band > kFew && WideRegistersPresent() ? FirstImperfectWide(band, end, above)
                                                       : FirstImperfectPlain(band, end, above);
}

/// Judges `item`, the first imperfect band, and those after it.
[[gnu::cold]] bool VerifyFrom(Band const* item, GrItemArray<Band> const& bands)
{
    Band const* const end = EndOf(bands);
    while (item != end) {
        int const previous = item == bands.items ? 0 : item[-1].r1;
        if (item->r1 >= item->r2) return GR_ASSERT_TEXT(false, "false");
        if (previous != 0 && item->r1 < previous) return GR_ASSERT_TEXT(false, "false");
        GR_ASSERT(VerifyBand(*item));
        item = FirstImperfect(item + 1, end, item->r1);
    }
    return true;
}

}

bool VerifyRegion(GrRegion const& region)
{
    Band const* const end = EndOf(region.bands);
    Band const* const imperfect = FirstImperfect(region.bands.items, end, std::numeric_limits<int>::min());
    return imperfect == end || VerifyFrom(imperfect, region.bands);
}

void CheckRegion(GrRegion const& region) { GR_ASSERT_TEXT(VerifyRegion(region), "VerifyRegion(*this)"); }

#include <tessella/region_rewriter.h>

// How two regions are merged. Both lists run from top to bottom; one cursor walks each, and the merge
// rewrites this region's list in place:
//
//     this region    other          union          difference     intersection
//      0 +--------+
//        |  from  |   3 +------+    (0,3)  from    (0,3)  from
//        |        |     | src  |    (3,6)  both    (3,6)  less    (3,6)  common
//      6 +--------+     |      |    (6,8)  src
//                     8 +------+
//
// A band that the other's band cuts horizontally is split: its upper part becomes a new band above it, and it
// goes on with the rest. So each step commits one finished band and shortens or leaves behind what it was
// made of.
//
// What holds the lists together:
//   - A band that loses all its ranges stays, empty. Where bands lie apart, a union puts an empty band
//     between them; only what it appends at the very end may leave a hole with no band in it.
//   - Committing a band with the same ranges as the one above makes that one longer instead. It asks for
//     nothing else, so a hole between equal bands is filled when a merge passes over it.
//   - A union that has taken part of `src` already (it reached beyond the band it met) merges the rest into
//     the bands that follow, but no longer adds rows between them; and what is left above the next band comes
//     as a whole, so that bands can overlap.
//   - An intersection cuts rows that meet no band of the other region with that region's next band below: an
//     empty one, unless they lie in a hole without a band.
//
// Bands, counts and recorded capacities, also those of spare slots, are exactly what merging slot by slot
// leaves; BandRewriter and the merges of bands keep that account while moving blocks.

using Band = GrRegion::Band;

namespace {

/// The operand of the operators that take a rectangle: one band with one range, or none.
class SingleRegion {
public:
    SingleRegion()
    {
        Allocate(region.bands, 1);
        Allocate(region.bands.items[0], 1);
    }

    GrItemArray<Band> const& Load(GrRect const& rect)
    {
        Band& band = region.bands.items[0];
        region.bands.item_count = rect.IsEmpty() ? 0 : 1;
        band.item_count = 1;
        band.r1 = rect.y1;
        band.r2 = rect.y2;
        band.items[0] = {rect.x1, rect.x2};
        return region.bands;
    }

private:
    GrRegion region;
};

SingleRegion rectRegion;

/// Appends the bands behind the last one, none of them joined; one that would begin above its end is
/// shortened.
void Append(GrItemArray<Band>& bands, Band const* src, Band const* srcEnd)
{
    int const need = bands.item_count + static_cast<int>(srcEnd - src);
    if (need > bands.item_capacity) Resize(bands, GrownCapacity(bands.item_capacity, need));
    for (; src != srcEnd; ++src) {
        Band& added = bands.items[bands.item_count++];
        Assign(added, *src);
        added.r1 = std::max(added.r1, (&added)[-1].r2);
    }
}

void Unite(GrRegion& region, GrItemArray<Band> const& other)
{
    Band const* src = other.items;
    Band const* const srcEnd = EndOf(other);
    bool whole = true;  // no part of src has been merged yet
    {
        BandRewriter list(region.bands, FirstEndingAfter(region.bands, src->r1));
        while (src != srcEnd && !list.AtEnd()) {
            if (src->r2 <= list.Next().r1) {
                Assign(list.OpenSlot(srcEnd - src), *src);
                list.Commit();
                if (src->r2 < list.Next().r1) {
                    Band& gap = list.OpenSlot(srcEnd - src);
                    gap.item_count = 0;
                    gap.r1 = src->r2;
                    gap.r2 = list.Next().r1;
                    list.Commit();
                }
                ++src;
                continue;
            }
            GR_ASSERT_TEXT(src->r1 <= list.Next().r2, "src_from->r1 <= dst_from->r2");
            if (whole && src->r1 < list.Next().r1) {
                Band& above = list.OpenSlot(srcEnd - src);
                Assign(above, *src);
                above.r2 = list.Next().r1;
                list.Commit();
            } else if (whole && src->r1 > list.Next().r1) {
                Band& above = list.OpenSlot(srcEnd - src);
                Assign(above, list.Next());
                above.r2 = list.Next().r1 = src->r1;
                list.Commit();
            }
            if (src->r2 >= list.Next().r2) {
                AssignUnion(list.Next(), list.Next(), *src);
                whole = src->r2 == list.Next().r2;
                if (whole) ++src;
                list.Keep();
            } else {
                Band& both = list.OpenSlot(srcEnd - src);
                AssignUnion(both, list.Next(), *src);
                both.r2 = list.Next().r1 = src->r2;
                whole = true;
                ++src;
                list.Commit();
            }
        }
        list.KeepRest();
    }
    Append(region.bands, src, srcEnd);
    CheckRegion(region);
}

void Subtract(GrRegion& region, GrItemArray<Band> const& other)
{
    if (!ExtentsMeet(region.bands, other)) return;
    Band const* src = other.items;
    Band const* const srcEnd = EndOf(other);
    {
        BandRewriter list(region.bands, FirstEndingAfter(region.bands, src->r1));
        while (src != srcEnd && !list.AtEnd()) {
            if (src->r2 <= list.Next().r1) {
                ++src;
            } else if (src->r1 >= list.Next().r2) {
                list.Keep();
            } else if (list.Next().r1 < src->r1) {
                Band& above = list.OpenSlot(srcEnd - src);
                Assign(above, list.Next());
                above.r2 = list.Next().r1 = src->r1;
                list.Commit();
            } else if (src->r2 < list.Next().r2) {
                Band& less = list.OpenSlot(srcEnd - src);
                AssignDifference(less, list.Next(), *src);
                less.r2 = list.Next().r1 = src->r2;
                list.Commit();
                ++src;
            } else {
                AssignDifference(list.Next(), list.Next(), *src);
                if (src->r2 == list.Next().r2) ++src;
                list.Keep();
            }
        }
        list.KeepRest();
    }
    CheckRegion(region);
}

void Intersect(GrRegion& region, GrItemArray<Band> const& other)
{
    if (!ExtentsMeet(region.bands, other)) {
        region.bands.item_count = 0;
        return;
    }
    Band const* src = other.items;
    Band const* const srcEnd = EndOf(other);
    {
        BandRewriter list(region.bands, FirstEndingAfter(region.bands, src->r1));
        list.DropWritten();
        if (!list.AtEnd()) list.Next().r1 = std::max(list.Next().r1, src->r1);
        while (src != srcEnd && !list.AtEnd()) {
            if (src->r2 <= list.Next().r1) {
                ++src;
            } else if (list.Next().r1 < src->r1) {
                Band& between = list.OpenSlot(srcEnd - src);
                AssignIntersection(between, list.Next(), *src);
                between.r2 = list.Next().r1 = src->r1;
                list.Commit();
            } else if (src->r2 >= list.Next().r2) {
                AssignIntersection(list.Next(), list.Next(), *src);
                if (src->r2 == list.Next().r2) ++src;
                list.Keep();
            } else {
                Band& common = list.OpenSlot(srcEnd - src);
                AssignIntersection(common, list.Next(), *src);
                common.r2 = list.Next().r1 = src->r2;
                list.Commit();
                ++src;
            }
        }
    }
    CheckRegion(region);
}

}

GrRegion& GrRegion::operator+=(GrRegion const& other)
{
    if (&other == this || !HasRanges(other.bands)) return *this;
    if (!HasRanges(bands)) return *this = other;
    Unite(*this, other.bands);
    return *this;
}

GrRegion& GrRegion::operator+=(GrRect const& rect)
{
    if (rect.IsEmpty()) return *this;
    if (!HasRanges(bands)) return *this = rect;
    Unite(*this, rectRegion.Load(rect));
    return *this;
}

GrRegion& GrRegion::operator-=(GrRegion const& other)
{
    if (!HasRanges(bands) || !HasRanges(other.bands)) return *this;
    if (&other == this) {
        bands.item_count = 0;
        return *this;
    }
    Subtract(*this, other.bands);
    return *this;
}

GrRegion& GrRegion::operator-=(GrRect const& rect)
{
    if (rect.IsEmpty() || !HasRanges(bands)) return *this;
    Subtract(*this, rectRegion.Load(rect));
    return *this;
}

GrRegion& GrRegion::operator&=(GrRegion const& other)
{
    if (!HasRanges(bands) || &other == this) return *this;
    if (HasRanges(other.bands))
        Intersect(*this, other.bands);
    else
        bands.item_count = 0;
    return *this;
}

GrRegion& GrRegion::operator&=(GrRect const& rect)
{
    if (rect.IsEmpty())
        bands.item_count = 0;
    else if (HasRanges(bands))
        Intersect(*this, rectRegion.Load(rect));
    return *this;
}

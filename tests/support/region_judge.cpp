#include <support/region_judge_steps.h>

#include <algorithm>

namespace judge {

namespace {

std::vector<std::string> reports;

bool SameRanges(Band const& a, Band const& b)
{
    return a.item_count == b.item_count && std::equal(a.items, a.items + a.item_count, b.items);
}

struct BandCursors : Cursors<Band> {
    using Cursors<Band>::Cursors;

    void CommitBand()
    {
        if (to != begin && SameRanges(*to, to[-1]))
            to[-1].r2 = to->r2;
        else
            ++to;
    }

    void Keep()
    {
        if (from != to) Swap(*from, *to);
        ++from;
        CommitBand();
    }

    void SlideDown()
    {
        while (Unread())
            Keep();
    }
};

bool VerifyBand(Band const& band)
{
    int previous = 0;
    for (int i = 0; i < band.item_count; ++i) {
        if (!(band.items[i].r1 < band.items[i].r2)) return Report(false, "false");
        if (previous != 0 && !(band.items[i].r1 > previous)) return Report(false, "false");
        previous = band.items[i].r1;
    }
    return true;
}

bool VerifyRegion(GrRegion const& region)
{
    int previous = 0;
    for (int i = 0; i < region.bands.item_count; ++i) {
        Band const& band = region.bands.items[i];
        if (!(band.r1 < band.r2)) return Report(false, "false");
        if (previous != 0 && band.r1 < previous) return Report(false, "false");
        previous = band.r1;
        Report(VerifyBand(band), "VerifyBand(*item)");
    }
    return true;
}

void Check(GrRegion const& region) { Report(VerifyRegion(region), "VerifyRegion(*this)"); }

bool HasPixels(GrRegion const& region)
{
    for (int i = 0; i < region.bands.item_count; ++i)
        if (region.bands.items[i].item_count != 0) return true;
    return false;
}

/// A region of one rectangle with capacities of 1.
struct SingleRegion : GrRegion {
    explicit SingleRegion(GrRect const& rect)
    {
        Allocate(bands, 1);
        Allocate(bands.items[0], 1);
        bands.item_count = bands.items[0].item_count = 1;
        bands.items[0].r1 = rect.y1;
        bands.items[0].r2 = rect.y2;
        bands.items[0].items[0] = {rect.x1, rect.x2};
    }
};

bool ListsApart(GrRegion const& region, GrRegion const& other)
{
    auto const& a = region.bands;
    auto const& b = other.bands;
    return b.items[0].r1 >= a.items[a.item_count - 1].r2 || b.items[b.item_count - 1].r2 <= a.items[0].r1;
}

}

bool Report(bool condition, char const* text)
{
    if (!condition) reports.emplace_back(text);
    return condition;
}

std::vector<std::string> TakeReports() { return std::exchange(reports, {}); }

void Assign(GrRegion& region, GrRect const& rect)
{
    region.bands.item_count = 0;
    if (rect.IsEmpty()) return;
    if (region.bands.items == nullptr) Allocate(region.bands, 10);
    Band& band = region.bands.items[0];
    band.r1 = rect.y1;
    band.r2 = rect.y2;
    region.bands.item_count = 1;
    if (band.items == nullptr) Allocate(band, 10);
    band.items[0] = {rect.x1, rect.x2};
    band.item_count = 1;
}

void Assign(GrRegion& region, GrRegion const& other)
{
    if (&other == &region) return;
    if (other.bands.item_capacity > region.bands.item_capacity)
        Resize(region.bands, other.bands.item_capacity);
    for (int i = 0; i < other.bands.item_count; ++i)
        AssignBand(region.bands.items[i], other.bands.items[i]);
    region.bands.item_count = other.bands.item_count;
    Check(region);
}

void Add(GrRegion& region, GrRect const& rect)
{
    if (rect.IsEmpty()) return;
    if (HasPixels(region))
        Add(region, SingleRegion(rect));
    else
        Assign(region, rect);
}

void Add(GrRegion& region, GrRegion const& other)
{
    if (&other == &region || !HasPixels(other)) return;
    if (!HasPixels(region)) return Assign(region, other);
    Band const* src = other.bands.items;
    Band const* const srcEnd = src + other.bands.item_count;
    bool whole = true;
    BandCursors c(region.bands, FirstEndingAfter(region.bands, src->r1));
    while (src != srcEnd && c.Unread()) {
        if (src->r2 <= c.from->r1) {
            Band& slot = c.Slot();
            AssignBand(slot, *src);
            slot.r1 = src->r1;
            if (src->r2 < c.from->r1) {
                slot.r2 = src->r2;
                c.CommitBand();
                Band& gap = c.Slot();
                gap.item_count = 0;
                gap.r1 = src->r2;
                gap.r2 = c.from->r1;
            } else {
                slot.r2 = c.from->r1;
            }
            ++src;
            c.CommitBand();
            continue;
        }
        Report(src->r1 <= c.from->r2, "src_from->r1 <= dst_from->r2");
        if (whole && src->r1 < c.from->r1) {
            Band& slot = c.Slot();
            AssignBand(slot, *src);
            slot.r2 = c.from->r1;
            c.CommitBand();
        } else if (whole && src->r1 > c.from->r1) {
            Band& slot = c.Slot();
            AssignBand(slot, *c.from);
            slot.r2 = src->r1;
            c.from->r1 = src->r1;
            if (src->r2 > c.from->r2) AddBand(*c.from, *src);
            c.CommitBand();
        }
        if (src->r2 >= c.from->r2) {
            AddBand(*c.from, *src);
            if (src->r2 <= c.from->r2) {
                ++src;
                whole = true;
            } else {
                whole = false;
            }
            c.Keep();
        } else {
            Band& slot = c.Slot();
            AssignBand(slot, *c.from);
            whole = true;
            slot.r2 = src->r2;
            c.from->r1 = src->r2;
            AddBand(slot, *src);
            ++src;
            c.CommitBand();
        }
    }
    if (src != srcEnd) {
        c.SetCount();
        for (; src != srcEnd; ++src) {
            if (region.bands.item_count >= region.bands.item_capacity)
                Resize(region.bands, region.bands.item_capacity + 10);
            Band& slot = region.bands.items[region.bands.item_count++];
            AssignBand(slot, *src);
            int const above = region.bands.items[region.bands.item_count - 2].r2;
            if (slot.r1 < above) slot.r1 = above;
        }
    } else {
        c.SlideDown();
        c.SetCount();
    }
    Check(region);
}

void Subtract(GrRegion& region, GrRect const& rect)
{
    if (!rect.IsEmpty()) Subtract(region, SingleRegion(rect));
}

void Subtract(GrRegion& region, GrRegion const& other)
{
    if (!HasPixels(region) || !HasPixels(other)) return;
    if (&other == &region) {
        region.bands.item_count = 0;
        return;
    }
    if (ListsApart(region, other)) return;
    Band const* src = other.bands.items;
    Band const* const srcEnd = src + other.bands.item_count;
    BandCursors c(region.bands, FirstEndingAfter(region.bands, src->r1));
    while (src != srcEnd && c.Unread()) {
        if (src->r2 <= c.from->r1) {
            ++src;
        } else if (src->r1 >= c.from->r2) {
            c.Keep();
        } else if (c.from->r1 < src->r1) {
            Band& slot = c.Slot();
            AssignBand(slot, *c.from);
            slot.r2 = c.from->r1 = src->r1;
            c.CommitBand();
        } else if (src->r2 < c.from->r2) {
            Band& slot = c.Slot();
            AssignBand(slot, *c.from);
            if (slot.item_count > 0) RemoveBand(slot, *src);
            slot.r2 = c.from->r1 = src->r2;
            c.CommitBand();
            ++src;
        } else {
            if (c.from->item_count > 0) RemoveBand(*c.from, *src);
            if (src->r2 <= c.from->r2) ++src;
            c.Keep();
        }
    }
    c.SlideDown();
    c.SetCount();
    Check(region);
}

void Intersect(GrRegion& region, GrRect const& rect)
{
    if (rect.IsEmpty())
        region.bands.item_count = 0;
    else
        Intersect(region, SingleRegion(rect));
}

void Intersect(GrRegion& region, GrRegion const& other)
{
    if (!HasPixels(region) || &other == &region) return;
    if (!HasPixels(other) || ListsApart(region, other)) {
        region.bands.item_count = 0;
        return;
    }
    Band const* src = other.bands.items;
    Band const* const srcEnd = src + other.bands.item_count;
    BandCursors c(region.bands, FirstEndingAfter(region.bands, src->r1));
    c.to = c.begin;
    if (c.Unread() && c.from->r1 < src->r1) c.from->r1 = src->r1;
    while (src != srcEnd && c.Unread()) {
        if (src->r2 <= c.from->r1) {
            ++src;
        } else if (c.from->r1 < src->r1) {
            Band& slot = c.Slot();
            AssignBand(slot, *c.from);
            if (slot.item_count > 0) IntersectBand(slot, *src);
            slot.r2 = c.from->r1 = src->r1;
            c.CommitBand();
        } else if (src->r2 >= c.from->r2) {
            if (c.from->item_count > 0) IntersectBand(*c.from, *src);
            if (!(src->r2 > c.from->r2)) ++src;
            c.Keep();
        } else {
            Band& slot = c.Slot();
            AssignBand(slot, *c.from);
            if (slot.item_count > 0) IntersectBand(slot, *src);
            slot.r2 = c.from->r1 = src->r2;
            c.CommitBand();
            ++src;
        }
    }
    c.SetCount();
    Check(region);
}

}

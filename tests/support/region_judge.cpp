#include "support/region_judge.h"

#include <algorithm>
#include <utility>

namespace judge {

namespace {

using Band = GrRegion::Band;

std::vector<std::string> reports;

bool Report(bool condition, char const* text)
{
    if (!condition) reports.emplace_back(text);
    return condition;
}

// Single slots.

void Copy(GrRange& to, GrRange const& from) { to = from; }

/// Bytewise: storage and all.
void Copy(Band& to, Band const& from)
{
    to.r1 = from.r1;
    to.r2 = from.r2;
    to.items = from.items;
    to.item_count = from.item_count;
    to.item_capacity = from.item_capacity;
}

void Swap(Band& a, Band& b)
{
    std::swap(a.r1, b.r1);
    std::swap(a.r2, b.r2);
    std::swap(a.items, b.items);
    std::swap(a.item_count, b.item_count);
    std::swap(a.item_capacity, b.item_capacity);
}

// Storage.

template <typename T>
T* NewArray(int n)
{
    return new T[static_cast<std::size_t>(n)]();
}

template <typename T>
void Allocate(GrItemArray<T>& list, int n)
{
    list.item_capacity = n;
    Report(list.items == nullptr, "items==0");
    list.items = NewArray<T>(n);
    list.item_count = 0;
}

template <typename T>
void Resize(GrItemArray<T>& list, int n)
{
    if (list.item_capacity < n) {
        T* const items = NewArray<T>(n);
        for (int i = 0; i < list.item_capacity; ++i)
            Copy(items[i], list.items[i]);
        delete[] list.items;
        list.items = items;
    }
    list.item_capacity = n;
}

template <typename T>
int FirstEndingAfter(GrItemArray<T> const& list, int v)
{
    int lo = 0;
    int hi = list.item_count;
    while (lo < hi) {
        int const mid = (lo + hi) / 2;
        if (v >= list.items[mid].r2)
            lo = mid + 1;
        else
            hi = mid;
    }
    return lo;
}

int LocateItem(Band const& band, int v, int& slot, int lo, int hi)
{
    if (band.item_count < 1) return slot = -1;
    while (lo < hi) {
        int const mid = (lo + hi + 1) / 2;
        if (v < band.items[mid].r1)
            hi = mid - 1;
        else
            lo = mid;
    }
    slot = lo;
    return lo != -1 && v < band.items[lo].r2 ? lo : -1;
}

void InsertItemAfter(Band& band, int i)
{
    int const need = band.item_count > i ? band.item_count + 1 : i + 2;
    if (need > band.item_capacity) {
        int capacity = band.item_capacity;
        while (need > capacity)
            capacity += 10;
        Resize(band, capacity);
    }
    for (int k = band.item_count; k > i + 1; --k)
        band.items[k] = band.items[k - 1];
    band.item_count = need;
}

void RemoveItems(Band& band, int from, int to)
{
    int const tail = band.item_count - to - 1;
    for (int k = 0; k < tail; ++k)
        band.items[from + k] = band.items[to + 1 + k];
    band.item_count = tail + from;
}

void AssignBand(Band& band, Band const& other)
{
    if (other.item_count > 0) {
        Resize(band, other.item_capacity);
        for (int i = 0; i < other.item_count; ++i)
            band.items[i] = other.items[i];
    }
    band.item_count = other.item_count;
    band.r1 = other.r1;
    band.r2 = other.r2;
}

bool SameRanges(Band const& a, Band const& b)
{
    return a.item_count == b.item_count && std::equal(a.items, a.items + a.item_count, b.items);
}

/// The two cursors of a merge in place.
template <typename T>
struct Cursors {
    Cursors(GrItemArray<T>& items, int index) : list(items), begin(items.items), from(begin + index), to(from) {}

    GrItemArray<T>& list;
    T* begin;
    T* from;
    T* to;

    bool Unread() const { return from - begin < list.item_count; }

    void ShiftTail(GrRange* end, int free) const
    {
        for (GrRange* k = end; k-- != from;)
            k[free] = *k;
    }
    void ShiftTail(Band* end, int free) const
    {
        for (Band* k = end; k-- != from;)
            Swap(*k, k[free]);
    }

    void OpenGap()
    {
        Report(from == to, "from==to");
        int const free = list.item_capacity - list.item_count;
        if (free > 0) {
            ShiftTail(begin + list.item_count, free);
            from += free;
        } else {
            list.item_capacity += 10;
            T* const fresh = NewArray<T>(list.item_capacity);
            int const written = static_cast<int>(to - begin);
            int const count = list.item_count;
            for (int i = 0; i < written; ++i)
                Copy(fresh[i], begin[i]);
            for (int i = written; i < count; ++i)
                Copy(fresh[i + 10], begin[i]);
            delete[] begin;
            list.items = begin = fresh;
            to = begin + written;
            from = to + 10;
        }
        list.item_count = list.item_capacity;
    }

    T& Slot()
    {
        if (from == to) OpenGap();
        return *to;
    }

    void SetCount() { list.item_count = static_cast<int>(to - begin); }
};

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

struct RangeCursors : Cursors<GrRange> {
    using Cursors<GrRange>::Cursors;

    void Keep()
    {
        if (to != from) *to = *from;
        ++to;
        ++from;
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

std::vector<std::string> TakeReports() { return std::exchange(reports, {}); }

void AddRange(Band& band, int a, int b)
{
    int lo = 0;
    int hi = 0;
    int const hit1 = LocateItem(band, a, lo, -1, band.item_count - 1);
    int const hit2 = LocateItem(band, b - 1, hi, lo, band.item_count - 1);
    if (hit1 != -1 && hit2 == hit1) return;
    if (hi == -1) {
        InsertItemAfter(band, -1);
        band.items[0] = {a, b};
        return;
    }
    int const end = hit2 != -1 ? band.items[hit2].r2 : b;
    if (hi != lo) {
        if (hit1 == -1) ++lo;
        if (a < band.items[lo].r1) band.items[lo].r1 = a;
        if (hi > lo) RemoveItems(band, lo + 1, hi);
    } else if (hit1 == -1) {
        InsertItemAfter(band, hi);
        ++lo;
        band.items[lo].r1 = a;
    }
    band.items[lo].r2 = end;
}

void AddBand(Band& band, Band const& other)
{
    for (int i = 0; i < other.item_count; ++i)
        AddRange(band, other.items[i].r1, other.items[i].r2);
}

void RemoveBand(Band& band, Band const& other)
{
    if (other.item_count == 0) return;
    if (other.items[other.item_count - 1].r2 <= band.items[0].r1) return;
    if (other.items[0].r1 >= band.items[band.item_count - 1].r2) return;
    GrRange const* src = other.items;
    GrRange const* const srcEnd = src + other.item_count;
    RangeCursors c(band, FirstEndingAfter(band, src->r1));
    while (src != srcEnd && c.Unread()) {
        if (src->r2 <= c.from->r1) {
            ++src;
        } else if (src->r1 >= c.from->r2) {
            c.Keep();
        } else if (c.from->r1 >= src->r1 && src->r2 >= c.from->r2) {
            ++c.from;
        } else if (c.from->r1 >= src->r1) {
            c.from->r1 = src->r2;
            ++src;
        } else if (src->r2 >= c.from->r2) {
            c.from->r2 = src->r1;
            c.Keep();
        } else {
            GrRange& slot = c.Slot();
            slot = {c.from->r1, src->r1};
            ++c.to;
            c.from->r1 = src->r2;
            ++src;
        }
    }
    while (c.Unread())
        c.Keep();
    c.SetCount();
}

void IntersectBand(Band& band, Band const& other)
{
    if (other.item_count == 0 || other.items[other.item_count - 1].r2 <= band.items[0].r1 ||
        other.items[0].r1 >= band.items[band.item_count - 1].r2) {
        band.item_count = 0;
        return;
    }
    GrRange const* src = other.items;
    GrRange const* const srcEnd = src + other.item_count;
    RangeCursors c(band, FirstEndingAfter(band, src->r1));
    c.to = c.begin;
    int g = std::min(src->r1, c.from->r1);
    while (src != srcEnd && c.Unread()) {
        if (src->r1 <= c.from->r1) {
            g = src->r2;
            ++src;
        } else if (g >= c.from->r2) {
            c.Keep();
        } else if (g <= c.from->r1 && src->r1 >= c.from->r2) {
            ++c.from;
        } else if (g <= c.from->r1) {
            c.from->r1 = src->r1;
            g = src->r2;
            ++src;
        } else if (src->r1 >= c.from->r2) {
            c.from->r2 = g;
            c.Keep();
        } else {
            GrRange& slot = c.Slot();
            slot = {c.from->r1, g};
            ++c.to;
            c.from->r1 = src->r1;
            g = src->r2;
            ++src;
        }
    }
    while (c.Unread()) {
        if (g <= c.from->r1) break;
        if (g <= c.from->r2) c.from->r2 = g;
        c.Keep();
    }
    c.SetCount();
}

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
    if (other.bands.item_capacity > region.bands.item_capacity) Resize(region.bands, other.bands.item_capacity);
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

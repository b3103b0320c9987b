#include <support/region_judge_steps.h>

#include <algorithm>

namespace judge {

namespace {

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

struct RangeCursors : Cursors<GrRange> {
    using Cursors<GrRange>::Cursors;

    void Keep()
    {
        if (to != from) *to = *from;
        ++to;
        ++from;
    }
};

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

}

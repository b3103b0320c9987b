#pragma once

#include <common/assert.h>
#include <tessella/region_blocks.h>

#include <algorithm>
#include <cstring>

/// How the lists of a region are kept, searched and moved; shared by the files of the region family.

/// The whole family reports its assertions as one module.
static constexpr char kSource[] = GR_SOURCE("tessella/region");

/// More than memory holds; counts that stay below it can be calculated with.
constexpr int kMostSlots = 1 << 30;

/// The recorded capacity after the growth, step by step, that gives room for `need` slots.
constexpr int GrownCapacity(int capacity, int need)
{
    return need <= capacity ? capacity : capacity + (need - capacity + kGrowth - 1) / kGrowth * kGrowth;
}

/// Single slots, field by field: one field has often just been written, and a wider read would wait for it.
inline void MoveSlot(GrRange& to, GrRange const& from) { to = from; }

inline void MoveSlot(GrRegion::Band& to, GrRegion::Band const& from)
{
    to.r1 = from.r1;
    to.r2 = from.r2;
    to.items = from.items;
    to.item_count = from.item_count;
    to.item_capacity = from.item_capacity;
}

/// Block moves of slots. A band moves with its storage: the slot it leaves must be overwritten, or a copy of
/// a slot that was saved before must go somewhere, so that each range array keeps exactly one owner.
template <typename T>
void MoveSlots(T* to, T const* from, std::ptrdiff_t count)
{
    if (count <= 0) return;
    // Nearly always a few; a call costs more than such moves.
    constexpr std::size_t kPair = 2 * sizeof(T);
    void const* const source = from;
    if (count == 1) {
        MoveSlot(*to, *from);
    } else if (count <= 4) {
        unsigned char firstPair[kPair];
        unsigned char lastPair[kPair];
        void const* const lastSource = from + count - 2;
        std::memcpy(firstPair, source, kPair);
        std::memcpy(lastPair, lastSource, kPair);
        std::memcpy(static_cast<void*>(to), firstPair, kPair);
        std::memcpy(static_cast<void*>(to + count - 2), lastPair, kPair);
    } else {
        std::memmove(static_cast<void*>(to), source, static_cast<std::size_t>(count) * sizeof(T));
    }
}

/// Makes the slots bands that own nothing. Field by field: for so few slots, the instruction that compilers
/// like to fill blocks with takes longer to begin than this does to end.
inline void ZeroSlots(GrRegion::Band* slots, std::ptrdiff_t count)
{
    for (std::ptrdiff_t i = 0; i < count; ++i) {
        slots[i].r1 = slots[i].r2 = 0;
        slots[i].items = nullptr;
        slots[i].item_count = slots[i].item_capacity = 0;
    }
}

/// They hold anything.
template <typename T>
T* TakeSlots(int count)
{
    return count == kGrowth ? SmallBlocks<T>::Take() : new T[static_cast<std::size_t>(count)];
}

inline GrRange* NewSlots(GrItemArray<GrRange> const&, int count) { return TakeSlots<GrRange>(count); }

inline GrRegion::Band* NewSlots(GrItemArray<GrRegion::Band> const&, int count)
{
    auto* const slots = TakeSlots<GrRegion::Band>(count);
    ZeroSlots(slots, count);
    return slots;
}

/// Only the slots themselves, of which there are at least `capacity`.
template <typename T>
void DeleteSlots(T* slots, int capacity)
{
    if (capacity == kGrowth)
        SmallBlocks<T>::Give(slots);
    else
        delete[] slots;
}

/// The first storage of a list that has none.
template <typename T>
void Allocate(GrItemArray<T>& list, int capacity)
{
    GR_ASSERT_TEXT(list.items == nullptr, "items==0");
    list.items = NewSlots(list, capacity);
    list.item_capacity = capacity;
    list.item_count = 0;
}

/// Records the capacity; the block is only ever replaced by a larger one. What it held stays.
template <typename T>
void Resize(GrItemArray<T>& list, int capacity)
{
    if (list.item_capacity < capacity) {
        T* const larger = NewSlots(list, capacity);
        MoveSlots(larger, list.items, list.item_capacity);
        DeleteSlots(list.items, list.item_capacity);
        list.items = larger;
    }
    list.item_capacity = capacity;
}

/// Of a sum that is not negative.
constexpr int Half(int sum) { return static_cast<int>(static_cast<unsigned>(sum) / 2); }

/// The first entry that ends after `v`, or `item_count`.
template <typename T>
int FirstEndingAfter(GrItemArray<T> const& list, int v)
{
    int lo = 0;
    int hi = list.item_count;
    while (lo < hi) {
        int const mid = Half(lo + hi);
        if (v >= list.items[mid].r2)
            lo = mid + 1;
        else
            hi = mid;
    }
    return lo;
}

/// The last entry that starts at or before `v`, or -1.
template <typename T>
int LastStartingBy(GrItemArray<T> const& list, int v)
{
    int lo = -1;
    int hi = list.item_count - 1;
    while (lo < hi) {
        int const mid = Half(lo + hi + 1);
        if (v < list.items[mid].r1)
            hi = mid - 1;
        else
            lo = mid;
    }
    return lo;
}

/// The entry that holds `v`, or null.
template <typename T>
T const* Locate(GrItemArray<T> const& list, int v)
{
    int const slot = LastStartingBy(list, v);
    return slot >= 0 && v < list.items[slot].r2 ? &list.items[slot] : nullptr;
}

inline GrRegion::Band const* EndOf(GrItemArray<GrRegion::Band> const& bands)
{
    return bands.items + bands.item_count;
}

/// The first band with ranges, or the list's end.
inline GrRegion::Band const* FirstWithRanges(GrItemArray<GrRegion::Band> const& bands)
{
    GrRegion::Band const* band = bands.items;
    while (band != EndOf(bands) && band->item_count == 0)
        ++band;
    return band;
}

inline bool HasRanges(GrItemArray<GrRegion::Band> const& bands)
{
    return FirstWithRanges(bands) != EndOf(bands);
}

/// False if one list ends before the other begins. Empty bands count; neither list is empty.
inline bool ExtentsMeet(GrItemArray<GrRegion::Band> const& a, GrItemArray<GrRegion::Band> const& b)
{
    return b.items[0].r1 < EndOf(a)[-1].r2 && EndOf(b)[-1].r2 > a.items[0].r1;
}

/// `result` = `band`: the ranges, the capacity that they have there, and the extent.
inline void Assign(GrRegion::Band& result, GrRegion::Band const& band)
{
    if (band.item_count > 0) {
        Resize(result, band.item_capacity);
        MoveSlots(result.items, band.items, band.item_count);
    }
    result.item_count = band.item_count;
    result.r1 = band.r1;
    result.r2 = band.r2;
}

inline bool SameRanges(GrRegion::Band const& a, GrRegion::Band const& b)
{
    if (a.item_count != b.item_count) [[likely]]
        return false;
    for (int i = 0; i < a.item_count; ++i)
        if (!(a.items[i] == b.items[i])) return false;
    return true;
}

/// `result` = `band`, followed by `AddBand`, `RemoveBand` or `IntersectBand` with `other`: the ranges and the
/// capacity come out as if done in these two steps. `result` may be `band` itself. A band without ranges
/// stays without under the latter two.
void AssignUnion(GrRegion::Band& result, GrRegion::Band const& band, GrRegion::Band const& other);
void AssignDifference(GrRegion::Band& result, GrRegion::Band const& band, GrRegion::Band const& other);
void AssignIntersection(GrRegion::Band& result, GrRegion::Band const& band, GrRegion::Band const& other);

/// The first band that is empty, begins above its predecessor (which begins at `above`), or has a range that
/// is empty or begins before its predecessor ends; `end` if there is none. The second form needs wide
/// registers.
GrRegion::Band const* FirstImperfectPlain(GrRegion::Band const* band, GrRegion::Band const* end, int above);
GrRegion::Band const* FirstImperfectWide(GrRegion::Band const* band, GrRegion::Band const* end, int above);
bool WideRegistersPresent();

/// False if the list of bands is out of order. Reports what it finds in detail, damaged ranges included.
bool VerifyRegion(GrRegion const& region);

/// Asserts the above. Whatever changes a region's bands ends with it.
void CheckRegion(GrRegion const& region);

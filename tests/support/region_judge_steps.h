#pragma once

#include <support/region_judge.h>

#include <utility>

/// What the plain steps are made of: slots, storage, the search, and two cursors over one list.
namespace judge {

using Band = GrRegion::Band;

/// Notes a failed assertion; returns the condition.
bool Report(bool condition, char const* text);

/// `band` = `other`, in its own storage.
void AssignBand(Band& band, Band const& other);

// Single slots.

inline void Copy(GrRange& to, GrRange const& from) { to = from; }

/// Bytewise: storage and all.
inline void Copy(Band& to, Band const& from)
{
    to.r1 = from.r1;
    to.r2 = from.r2;
    to.items = from.items;
    to.item_count = from.item_count;
    to.item_capacity = from.item_capacity;
}

inline void Swap(Band& a, Band& b)
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

/// The two cursors of a merge in place.
template <typename T>
struct Cursors {
    Cursors(GrItemArray<T>& items, int index) : list(items), begin(items.items), from(begin + index), to(from)
    {}

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

}

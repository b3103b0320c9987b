#include <support/region_judge.h>

#include <algorithm>
#include <span>
#include <utility>

namespace {

using Band = GrRegion::Band;

std::vector<std::string> reports;

bool Report(bool ok, char const* text) { return ok || (reports.emplace_back(text), false); }

template <typename T>
std::span<T> Items(GrItemArray<T> const& list)
{
    return {list.items, static_cast<std::size_t>(list.item_count)};
}

/// Bytewise: a band moves with its ranges' storage.
template <typename T>
void SwapSlots(T& a, T& b)
{
    std::swap(reinterpret_cast<char(&)[sizeof(T)]>(a), reinterpret_cast<char(&)[sizeof(T)]>(b));
}

template <typename T>
void Resize(GrItemArray<T>& list, int n)
{
    if (list.item_capacity < n) {
        T* const larger = new T[static_cast<std::size_t>(n)]();
        for (int i = 0; i < list.item_capacity; ++i)
            SwapSlots(larger[i], list.items[i]);
        delete[] std::exchange(list.items, larger);
    }
    list.item_capacity = n;
}

/// The first entry that ends after `v`.
template <typename T>
T* FirstEndingAfter(GrItemArray<T> const& list, int v)
{
    int lo = 0;
    for (int hi = list.item_count; lo < hi;) {
        int const mid = (lo + hi) / 2;
        bool const endsAbove = v >= list.items[mid].r2;
        (endsAbove ? lo : hi) = endsAbove ? mid + 1 : mid;
    }
    return list.items + lo;
}

/// True if neither list is empty or ends before the other begins.
template <typename T>
bool Meet(GrItemArray<T> const& a, GrItemArray<T> const& b)
{
    auto const [as, bs] = std::pair(Items(a), Items(b));
    return !as.empty() && !bs.empty() && bs.front().r1 < as.back().r2 && bs.back().r2 > as.front().r1;
}

bool Joined(GrRange const&, GrRange const&) { return false; }

bool Joined(Band& above, Band const& band)
{
    return std::ranges::equal(Items(above), Items(band)) && (above.r2 = band.r2, true);
}

/// A list that is rewritten in place: `from` reads, `to` writes behind it, and `src` reads the other list,
/// which has entries.
template <typename T>
struct Cursors {
    GrItemArray<T>& list;
    GrItemArray<T> const& other;
    T* from = FirstEndingAfter(list, other.items[0].r1);
    T* to = from;
    T const* src = other.items;
    T const* const srcEnd = src + other.item_count;

    bool Unread() const { return from - list.items < list.item_count; }
    bool BothUnread() const { return src != srcEnd && Unread(); }

    /// The slot at `to`. If reading has left none, a gap opens: spare slots, or 10 new ones, change places
    /// with what is unread.
    T& Slot()
    {
        if (from != to) return *to;
        std::ptrdiff_t const written = to - list.items;
        if (list.item_count == list.item_capacity) Resize(list, list.item_capacity + 10);
        int const free = list.item_capacity - list.item_count;
        to = list.items + written;
        from = to + free;
        for (T* slot = list.items + list.item_count; slot-- != to;)
            SwapSlots(*slot, slot[free]);
        list.item_count = list.item_capacity;
        return *to;
    }

    /// A band with the same ranges as the one above makes that one longer.
    void Commit() { to += to == list.items || !Joined(to[-1], *to); }

    void Keep()
    {
        if (from != to) SwapSlots(*from, *to);
        ++from;
        Commit();
    }

    void End() { list.item_count = static_cast<int>(to - list.items); }

    void KeepRest()
    {
        while (Unread())
            Keep();
        End();
    }
};

// The ranges of a band.

/// Takes `a` to `b` - 1 away from the range at `from`; true if that was all of it.
bool Remove(Cursors<GrRange>& c, int a, int b)
{
    if (b <= c.from->r1) return true;
    if (a >= c.from->r2) return c.Keep(), false;
    if (a <= c.from->r1 && b >= c.from->r2) return ++c.from, false;
    if (b >= c.from->r2) return c.from->r2 = a, c.Keep(), false;
    if (a > c.from->r1) c.Slot() = {c.from->r1, a}, c.Commit();
    c.from->r1 = b;
    return true;
}

void RemoveBand(Band& band, Band const& other)
{
    if (!Meet(band, other)) return;
    Cursors<GrRange> c{band, other};
    while (c.BothUnread())
        c.src += Remove(c, c.src->r1, c.src->r2);
    c.KeepRest();
}

/// Removes the gaps of the other band, of which `g` is where the current one begins.
void IntersectBand(Band& band, Band const& other)
{
    if (!Meet(band, other)) return void(band.item_count = 0);
    Cursors<GrRange> c{band, other};
    c.to = band.items;
    int g = std::min(c.src->r1, c.from->r1);
    while (c.BothUnread())
        if (Remove(c, g, c.src->r1)) g = c.src++->r2;
    for (; c.Unread() && g > c.from->r1; c.Keep())
        c.from->r2 = std::min(c.from->r2, g);
    c.End();
}

std::ptrdiff_t LastStartingBy(Band const& band, int v)
{
    return std::ranges::upper_bound(Items(band), v, {}, &GrRange::r1) - Items(band).begin() - 1;
}

GrRange& InsertItemAfter(Band& band, std::ptrdiff_t i)
{
    if (band.item_count == band.item_capacity) Resize(band, band.item_capacity + 10);
    GrRange* const end = band.items + band.item_count++;
    std::copy_backward(band.items + i + 1, end, end + 1);
    return band.items[i + 1];
}

void AddRange(Band& band, int a, int b)
{
    auto lo = LastStartingBy(band, a);
    auto const hi = LastStartingBy(band, b - 1);
    bool const hit1 = lo != -1 && a < band.items[lo].r2;
    bool const hit2 = hi != -1 && b - 1 < band.items[hi].r2;
    if (hit1 && hit2 && lo == hi) return;
    if (hi == -1) return void(InsertItemAfter(band, -1) = {a, b});
    int const end = hit2 ? band.items[hi].r2 : b;
    if (hi != lo) {
        if (!hit1) ++lo;
        band.items[lo].r1 = std::min(band.items[lo].r1, a);
        std::copy(band.items + hi + 1, band.items + band.item_count, band.items + lo + 1);
        band.item_count -= static_cast<int>(hi - lo);
    } else if (!hit1) {
        InsertItemAfter(band, lo++).r1 = a;
    }
    band.items[lo].r2 = end;
}

void AddBand(Band& band, Band const& other)
{
    for (GrRange const& range : Items(other))
        AddRange(band, range.r1, range.r2);
}

void SetRows(Band& band, GrRange const& rows) { static_cast<GrRange&>(band) = rows; }

Band& AssignBand(Band& band, Band const& other)
{
    if (other.item_count > 0) Resize(band, other.item_capacity);
    std::ranges::copy(Items(other), band.items);
    band.item_count = other.item_count;
    SetRows(band, other);
    return band;
}

// The bands of a region.

using Merge = void(Band& band, Band const& other);

struct BandMerge : Cursors<Band> {
    bool whole = true;  // no part of `src` has been added yet

    /// What lies above `y` of `from` becomes a band of its own, merged with `src`.
    void Split(int y, Merge* merge)
    {
        Slot();
        AssignBand(*to, *from);
        if (merge != nullptr) merge(*to, *src);
        to->r2 = from->r1 = y;
        Commit();
    }

    /// Merges `from` with `src`, down to where the first of the two ends.
    void Both(Merge* merge)
    {
        bool const fromEnds = src->r2 >= from->r2;
        whole = src->r2 <= from->r2;
        if (fromEnds) merge(*from, *src);
        fromEnds ? Keep() : Split(src->r2, merge);
        if (whole) ++src;
    }

    void Add()
    {
        if (src->r2 <= from->r1) {
            AssignBand(Slot(), *src);
            Commit();
            if (src++->r2 == from->r1) return;
            Slot().item_count = 0;
            SetRows(*to, {src[-1].r2, from->r1});
            return Commit();
        }
        Report(src->r1 <= from->r2, "src_from->r1 <= dst_from->r2");
        if (whole && src->r1 < from->r1) {
            AssignBand(Slot(), *src).r2 = from->r1;
            Commit();
        } else if (whole && src->r1 > from->r1) {
            Split(src->r1, nullptr);
            if (src->r2 > from->r2) AddBand(*from, *src);
        }
        Both(AddBand);
    }

    /// Whatever is left of the other list; the first begins where this list ends, if not below.
    void Append()
    {
        for (End(); src != srcEnd; ++src) {
            if (list.item_count == list.item_capacity) Resize(list, list.item_capacity + 10);
            Band& added = AssignBand(list.items[list.item_count++], *src);
            added.r1 = std::max(added.r1, (&added)[-1].r2);
        }
    }

    void Subtract()
    {
        if (src->r2 <= from->r1) return void(++src);
        if (src->r1 >= from->r2) return Keep();
        if (from->r1 < src->r1) return Split(src->r1, nullptr);
        Both(RemoveBand);
    }

    void Intersect()
    {
        if (src->r2 <= from->r1) return void(++src);
        if (from->r1 < src->r1) return Split(src->r1, IntersectBand);
        Both(IntersectBand);
    }
};

bool IsEmpty(GrRegion const& region) { return std::ranges::none_of(Items(region.bands), &Band::item_count); }

/// True if every entry begins `apart` behind its predecessor, unless that begins at 0.
template <typename T>
bool Verify(GrItemArray<T> const& list, int apart)
{
    for (int before = 0; T const& item : Items(list)) {
        if (item.r1 >= item.r2 || (before != 0 && item.r1 < before + apart)) return Report(false, "false");
        if constexpr (std::is_same_v<T, Band>) Report(Verify(item, 1), "VerifyBand(*item)");
        before = item.r1;
    }
    return true;
}

PlainRegion& Verified(PlainRegion& r) { return Report(Verify(r.bands, 0), "VerifyRegion(*this)"), r; }

/// The operand of the forms that take a rectangle.
struct Single : PlainRegion {
    explicit Single(GrRect const& rect)
    {
        Resize(bands, 1);
        Resize(bands.items[0], 1);
        PlainRegion::operator=(rect);
    }
};

}

std::vector<std::string> PlainRegion::TakeReports() { return std::exchange(reports, {}); }

PlainRegion& PlainRegion::operator=(GrRect const& rect)
{
    bands.item_count = 0;
    if (rect.IsEmpty()) return *this;
    if (bands.items == nullptr) Resize(bands, 10);
    Band& band = bands.items[0];
    if (band.items == nullptr) Resize(band, 10);
    SetRows(band, {rect.y1, rect.y2});
    band.items[0] = {rect.x1, rect.x2};
    bands.item_count = band.item_count = 1;
    return *this;
}

PlainRegion& PlainRegion::operator=(PlainRegion const& other)
{
    if (&other == this) return *this;
    if (other.bands.item_capacity > bands.item_capacity) Resize(bands, other.bands.item_capacity);
    for (int i = 0; i < other.bands.item_count; ++i)
        AssignBand(bands.items[i], other.bands.items[i]);
    bands.item_count = other.bands.item_count;
    return Verified(*this);
}

PlainRegion& PlainRegion::operator+=(PlainRegion const& other)
{
    if (&other == this || IsEmpty(other)) return *this;
    if (IsEmpty(*this)) return *this = other;
    BandMerge merge{{bands, other.bands}};
    while (merge.BothUnread())
        merge.Add();
    merge.src == merge.srcEnd ? merge.KeepRest() : merge.Append();
    return Verified(*this);
}

PlainRegion& PlainRegion::operator-=(PlainRegion const& other)
{
    if (IsEmpty(*this) || IsEmpty(other)) return *this;
    if (&other == this) bands.item_count = 0;
    if (!Meet(bands, other.bands)) return *this;
    BandMerge merge{{bands, other.bands}};
    while (merge.BothUnread())
        merge.Subtract();
    merge.KeepRest();
    return Verified(*this);
}

PlainRegion& PlainRegion::operator&=(PlainRegion const& other)
{
    if (IsEmpty(*this) || &other == this) return *this;
    if (IsEmpty(other) || !Meet(bands, other.bands)) bands.item_count = 0;
    if (bands.item_count == 0) return *this;
    BandMerge merge{{bands, other.bands}};
    merge.to = bands.items;
    if (merge.Unread()) merge.from->r1 = std::max(merge.from->r1, merge.src->r1);
    while (merge.BothUnread())
        merge.Intersect();
    merge.End();
    return Verified(*this);
}

PlainRegion& PlainRegion::operator+=(GrRect const& rect)
{
    return IsEmpty(*this) && !rect.IsEmpty() ? *this = rect : *this += Single(rect);
}

PlainRegion& PlainRegion::operator-=(GrRect const& rect) { return *this -= Single(rect); }

PlainRegion& PlainRegion::operator&=(GrRect const& rect)
{
    return rect.IsEmpty() ? *this = rect : *this &= Single(rect);
}

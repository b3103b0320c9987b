#include <tessella/coordinates.h>
#include <tessella/region_storage.h>

#include <memory>
#include <new>

// The three merges of range lists share one shape. Where the other band begins and ends is searched for; the
// ranges of this band in between, the window, are merged with the other's into a buffer; and what was made
// takes the window's place, in this band or in a copy of it. Ranges outside the window are at most moved as a
// block. Of small bands the window is all, and what is made goes straight to its place.
//
//     band    ===  ===   ====  ==  ===       other      ==  =====  =
//                  [   window   ]            made   ===  ========  ===
//
// Capacity. A list grows by 10 slots whenever a walk in place, writing behind its own reading, would have to
// write more than it has read. The buffer makes that walk unnecessary, but not its arithmetic: each merge
// notes the largest number of slots that the walk would need at any moment, and the capacity rises to it in
// tens.

using Band = GrRegion::Band;

namespace {

/// Room for a merge's outcome: on the stack, unless it is large.
class RangeBuffer {
public:
    explicit RangeBuffer(int capacity)
    {
        if (capacity > kFew)
            many = std::make_unique_for_overwrite<GrRange[]>(static_cast<std::size_t>(capacity));
    }
    GrRange* Items() { return many ? many.get() : few; }

private:
    static constexpr int kFew = 64;
    GrRange few[kFew];
    std::unique_ptr<GrRange[]> many;
};

/// The ranges `first` to `last` - 1 of `band`: all that the pixels `from` to `to` - 1 can touch.
struct Span {
    Span(Band const& band, int from, int to)
        : first(FirstEndingAfter(band, from)), last(std::max(first, LastStartingBy(band, Moved(to, -1)) + 1))
    {}

    int first, last;
};

/// The capacity that `result` has as a copy of `band`.
int Capacity(Band const& result, Band const& band)
{
    return band.item_count > 0 ? band.item_capacity : result.item_capacity;
}

/// Gives `result` the extent of `band`, and the capacity that a copy of it has after it was raised to give
/// room for `peak` ranges. They are different bands; the ranges of `result` are lost.
void Prepare(Band& result, Band const& band, int peak)
{
    int const capacity = GrownCapacity(Capacity(result, band), peak);
    if (result.item_capacity < capacity) {
        GrRange* const larger = NewSlots(result, capacity);
        DeleteSlots(result.items, result.item_capacity);
        result.items = larger;
    }
    result.item_capacity = capacity;
    result.r1 = band.r1;
    result.r2 = band.r2;
}

/// `result` = `band` with the ranges `first` to `last` - 1 replaced by `made`, and the capacity of `band`
/// raised to give room for `peak` ranges.
void Splice(Band& result, Band const& band, int first, int last, GrRange const* made,
    std::ptrdiff_t madeCount, int peak)
{
    int const count = static_cast<int>(madeCount);
    int const tail = band.item_count - last;
    peak = std::max(peak, first + count + tail);  // damaged lists can make more than any walk foresees
    if (&result == &band) {
        if (peak > result.item_capacity) Resize(result, GrownCapacity(result.item_capacity, peak));
        if (first + count != last) MoveSlots(result.items + first + count, result.items + last, tail);
    } else {
        Prepare(result, band, peak);
        MoveSlots(result.items, band.items, first);
        MoveSlots(result.items + first + count, band.items + last, tail);
    }
    MoveSlots(result.items + first, made, count);
    result.item_count = first + count + tail;
}

/// The union with one range, which is all that a rectangle brings.
void UniteWithOne(Band& result, Band const& band, GrRange joined)
{
    if (&result != &band && band.item_count <= 0) {  // rows that show nothing yet
        Prepare(result, band, 1);
        result.items[0] = joined;
        result.item_count = 1;
        return;
    }
    Span const span(band, joined.r1, joined.r2);
    int next = span.first;
    for (; next != span.last && band.items[next].r1 < joined.r2; ++next) {
        joined.r1 = std::min(joined.r1, band.items[next].r1);
        joined.r2 = std::max(joined.r2, band.items[next].r2);
    }
    int const peak = band.item_count + (next == span.first ? 1 : 0);
    Splice(result, band, span.first, next, &joined, 1, peak);
}

/// The difference to one range: of what it touches, the outer ends are left. One or two ranges are not worth
/// a search; there must be room for both ends of each, which damaged lists may need.
void SubtractOne(Band& result, Band const& band, GrRange cut)
{
    constexpr int kFew = 2;
    int const rangeCount = band.item_count;
    if (rangeCount <= std::min(kFew, band.item_capacity / 2)) {
        GrRange ranges[kFew];
        std::copy_n(band.items, rangeCount, ranges);
        if (&result != &band) Prepare(result, band, 0);
        GrRange* out = result.items;
        for (int i = 0; i < rangeCount; ++i) {
            GrRange const range = ranges[i];
            *out = {range.r1, std::min(range.r2, cut.r1)};
            out += range.r1 < cut.r1;
            *out = {std::max(range.r1, cut.r2), range.r2};
            out += range.r2 > cut.r2;
        }
        result.item_count = static_cast<int>(out - result.items);
        return;
    }
    Span const span(band, cut.r1, cut.r2);
    GrRange made[2];
    int count = 0;
    if (span.first != span.last) {
        int const left = band.items[span.first].r1;
        int const right = band.items[span.last - 1].r2;
        if (left < cut.r1) made[count++] = {left, cut.r1};
        if (cut.r2 < right) made[count++] = {cut.r2, right};
    }
    int const peak = band.item_count + (count > span.last - span.first ? 1 : 0);
    Splice(result, band, span.first, span.last, made, count, peak);
}

/// The ranges `next` to `end` of a band, merged from left to right with those of another into `made`.
struct Walk {
    GrRange const* next;
    GrRange const* end;
    GrRange const* readFrom;  // where a walk in place would begin to read, and to write
    GrRange* made;
    GrRange* out = made;
    std::ptrdiff_t lead = 0;  // by so many ranges at most would its writing overtake its reading

    void NoteLead(int more) { lead = std::max(lead, (out - made) + more - (next - readFrom)); }
};

enum class Outside { Stays, Goes };

/// Merges the window of `band`, or all of it if that is little and can go straight into the result. A band
/// that is its own result is then read from a copy.
template <void merge(Walk&, Band const&), Outside outside>
void MergeInto(Band& result, Band const& band, Band const& other)
{
    constexpr int kFew = 16;
    int const count = std::max(band.item_count, 0);
    int const most = count + other.item_count;
    if (most <= std::min(kFew, Capacity(result, band))) {
        GrRange copy[kFew];
        GrRange const* items = band.items;
        if (&result == &band) {
            MoveSlots(copy, items, count);
            items = copy;
        } else {
            Prepare(result, band, 0);
        }
        Walk walk{items, items + count, items, result.items};
        merge(walk, other);
        while (outside == Outside::Stays && walk.next != walk.end)
            *walk.out++ = *walk.next++;
        result.item_count = static_cast<int>(walk.out - walk.made);
        return;
    }
    Span const span(band, other.items[0].r1, other.items[other.item_count - 1].r2);
    RangeBuffer buffer(span.last - span.first + other.item_count);
    int const first = outside == Outside::Stays ? span.first : 0;
    Walk walk{band.items + span.first, band.items + span.last, band.items + first, buffer.Items()};
    merge(walk, other);
    auto const last = outside == Outside::Stays ? static_cast<int>(walk.next - band.items) : band.item_count;
    Splice(result, band, first, last, walk.made, walk.out - walk.made,
        band.item_count + static_cast<int>(walk.lead));
}

void Unite(Walk& walk, Band const& other)
{
    auto& [next, end, readFrom, made, out, lead] = walk;
    GrRange const* const addedEnd = other.items + other.item_count;
    for (GrRange const* added = other.items; added != addedEnd;) {
        while (next != end && next->r2 <= added->r1)
            *out++ = *next++;
        GrRange joined = *added++;
        if (next == end || next->r1 >= joined.r2) walk.NoteLead(1);
        // Whatever shares a pixel with the range melts into it; what only touches it stays apart.
        for (;;) {
            if (next != end && next->r1 < joined.r2) {
                joined.r1 = std::min(joined.r1, next->r1);
                joined.r2 = std::max(joined.r2, next->r2);
                ++next;
            } else if (added != addedEnd && added->r1 < joined.r2) {
                joined.r2 = std::max(joined.r2, added->r2);
                ++added;
            } else {
                break;
            }
        }
        *out++ = joined;
    }
}

void Subtract(Walk& walk, Band const& other)
{
    auto& [next, end, readFrom, made, out, lead] = walk;
    GrRange const* cut = other.items;
    GrRange const* const cutEnd = cut + other.item_count;
    for (; next != end; ++next) {
        GrRange rest = *next;
        bool gone = false;
        while (cut != cutEnd && cut->r1 < rest.r2) {
            if (cut->r2 <= rest.r1) {
                ++cut;
                continue;
            }
            if (cut->r1 > rest.r1) *out++ = {rest.r1, cut->r1};
            if (cut->r2 >= rest.r2) {
                gone = true;
                break;
            }
            // Two pieces of one range: only here is more written than was read.
            if (cut->r1 > rest.r1) walk.NoteLead(0);
            rest.r1 = cut->r2;
            ++cut;
        }
        if (!gone) *out++ = rest;
    }
}

void Intersect(Walk& walk, Band const& other)
{
    auto& [next, end, readFrom, made, out, lead] = walk;
    GrRange const* kept = other.items;
    GrRange const* const keptEnd = kept + other.item_count;
    while (kept != keptEnd && next != end) {
        GrRange const common{std::max(next->r1, kept->r1), std::min(next->r2, kept->r2)};
        if (common.r1 < common.r2) *out++ = common;
        if (kept->r2 >= next->r2) {
            ++next;
            continue;
        }
        ++kept;
        // A second piece of the same range follows: more is written than was read.
        if (common.r1 < common.r2 && kept != keptEnd && kept->r1 < next->r2) walk.NoteLead(0);
    }
}

/// True if the spans from the first to the last range have a pixel in common. Both bands have ranges.
bool SpansMeet(Band const& a, Band const& b)
{
    return b.items[b.item_count - 1].r2 > a.items[0].r1 && b.items[0].r1 < a.items[a.item_count - 1].r2;
}

void AssignEmpty(Band& result, Band const& band)
{
    if (&result != &band) Prepare(result, band, 0);
    result.item_count = 0;
}

}

void AssignUnion(Band& result, Band const& band, Band const& other)
{
    if (other.item_count == 1)
        UniteWithOne(result, band, other.items[0]);
    else if (other.item_count > 0)
        MergeInto<Unite, Outside::Stays>(result, band, other);
    else if (&result != &band)
        Assign(result, band);
}

void AssignDifference(Band& result, Band const& band, Band const& other)
{
    if (band.item_count <= 0 || other.item_count <= 0 || !SpansMeet(band, other)) {
        if (&result != &band) Assign(result, band);
    } else if (other.item_count == 1) {
        SubtractOne(result, band, other.items[0]);
    } else {
        MergeInto<Subtract, Outside::Stays>(result, band, other);
    }
}

void AssignIntersection(Band& result, Band const& band, Band const& other)
{
    if (band.item_count > 0 && other.item_count > 0 && SpansMeet(band, other))
        MergeInto<Intersect, Outside::Goes>(result, band, other);
    else
        AssignEmpty(result, band);
}

void Band::AddRange(int from, int to)
{
    if (from >= to) return;
    GrRange range{from, to};
    Band single;
    single.items = &range;
    single.item_count = 1;
    AssignUnion(*this, *this, single);
}

void Band::AddBand(Band const& other) { AssignUnion(*this, *this, other); }

void Band::RemoveBand(Band const& other) { AssignDifference(*this, *this, other); }

void Band::IntersectBand(Band const& other) { AssignIntersection(*this, *this, other); }

void Band::InsertItemAfter(int i)
{
    if (i < -1) return;
    if (i > kMostSlots - 2) throw std::bad_alloc();
    int const need = item_count > i ? item_count + 1 : i + 2;
    if (need > item_capacity) Resize(*this, GrownCapacity(item_capacity, need));
    MoveSlots(items + i + 2, items + i + 1, item_count - i - 1);
    item_count = need;
}

void Band::RemoveItems(int from, int to)
{
    if (!GR_ASSERT_TEXT(from >= 0, "from>=0")) return;
    if (!GR_ASSERT_TEXT(to >= from, "to>=from")) return;
    if (!GR_ASSERT_TEXT(to < item_count, "to<items.item_count")) return;
    int const tail = item_count - to - 1;
    MoveSlots(items + from, items + to + 1, tail);
    item_count = tail + from;
}

void Band::GetFullRange(GrRange& range) const
{
    range = item_count > 0 ? GrRange{items[0].r1, items[item_count - 1].r2} : GrRange{0, 0};
}

void Band::Offset(int dx)
{
    for (int i = 0; i < item_count; ++i) {
        items[i].r1 = Moved(items[i].r1, dx);
        items[i].r2 = Moved(items[i].r2, dx);
    }
}

Band& Band::operator=(Band const& other)
{
    Assign(*this, other);
    return *this;
}

bool Band::operator==(Band const& other) const { return SameRanges(*this, other); }

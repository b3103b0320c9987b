#pragma once

#include <tessella/export.h>
#include <tessella/types.h>

/// A plain growable list. `item_count` slots are in use; `item_capacity` is the number of slots that the
/// list regards as its own. `items` is null at first, and from `new[]` then. The storage is managed by the
/// class that holds the list, never by the list.
template <typename T>
struct GrItemArray {
    T* items;           ///< the slots
    int item_count;     ///< slots in use
    int item_capacity;  ///< slots that the list regards as its own
};

/// A set of pixels: bands from top to bottom, each with ranges from left to right, all ends exclusive.
///
///      x  0     6  9  12
///      0  +-----+              (0,4): 0-6
///      4  |     |  +--+        (4,8): 0-6 9-12
///      8  +-----+  |  |        (8,10): 9-12
///      10          +--+
///
/// The layout is public, and whoever draws walks it directly. A band may have no ranges: a region with bands
/// can still hold no pixel, so ask `operator bool`. Ranges that touch are not joined. Who builds a list by
/// hand keeps bands sorted by `r1` and ranges sorted and apart; each slot has an array of its own, and slots
/// never used are zero. Operations on other lists report failed assertions and give unspecified pixels.
///
/// Where regions are rectangles, or rows without gaps, the operators are those of sets of pixels. Gaps
/// between the rows of a region are another matter: adding something below leaves rows that no band covers,
/// and a later operation that passes over such rows, between bands with equal ranges, joins them and with
/// that adds the rows; adding something across them may leave some of its rows out, or bands that overlap;
/// intersecting cuts rows that meet no band of the other region with its next band. `Contains` and `FindBand`
/// look at the last band that begins at or above a row.
///
/// Storage stays with the region for reuse; only `Clear` and the destructor return it. If memory runs out,
/// `std::bad_alloc` leaves the operation and the region's contents are unspecified.
///
/// A region has no lock: one thread at a time uses an object. `+=`, `-=` and `&=` with a rectangle share one
/// region inside the library, so their callers must be on one thread or share one lock.
class GR_API GrRegion {
public:
    /// One horizontal band: its vertical extent `r1`, `r2`, and the x ranges that belong to the region in
    /// each of its rows. Plain data without constructor or destructor; a region owns the `items` of its
    /// bands. One that stands alone begins as `Band{}`, and its user deletes `items`.
    struct GR_API Band : GrRange, GrItemArray<GrRange> {
        /// Adds the pixels `from` to `to` - 1 to the ranges; none unless `from` < `to`. A range that it only
        /// touches stays a range of its own.
        void AddRange(int from, int to);

        /// Adds every range of `other`, in order, whatever the vertical extents.
        void AddBand(Band const& other);

        /// Takes the ranges of `other` away from this band's.
        void RemoveBand(Band const& other);

        /// Keeps what this band's ranges share with those of `other`.
        void IntersectBand(Band const& other);

        /// Opens a slot behind slot `i` (-1: at the head), whose contents the caller fills in. With `i`
        /// beyond the end the list grows to `i` + 2 slots, and those in between are uninitialised too. Below
        /// -1 nothing happens.
        void InsertItemAfter(int i);

        /// Removes the ranges `from` to `to`, both included. They must exist: otherwise an assertion fails
        /// and nothing is removed.
        void RemoveItems(int from, int to);

        /// From the first range's start to the last one's end; 0, 0 if there are none.
        void GetFullRange(GrRange& range) const;

        /// Moves all ranges by `dx`, at most to the ends of the range of coordinates.
        void Offset(int dx);

        /// Takes over extent and ranges, into this band's own storage, and the recorded capacity if there are
        /// ranges.
        Band& operator=(Band const& other);

        /// True if the ranges are the same; the vertical extents take no part.
        bool operator==(Band const& other) const;

        Band() = default;
        Band(Band const&) = delete;
    };

    /// The bands, sorted by `r1`. Slots at and beyond `item_count` may hold storage for reuse.
    GrItemArray<Band> bands{};

    /// An empty region; allocates nothing.
    GrRegion() = default;
    /// The pixels of `rect`.
    GrRegion(GrRect const& rect);
    /// The pixels of `other`.
    GrRegion(GrRegion const& other);
    ~GrRegion();

    /// Empties the region and returns its storage.
    void Clear();

    /// True if the region holds at least one pixel, that is, if some band has ranges.
    explicit operator bool() const;

    /// Becomes the pixels of `rect`.
    GrRegion& operator=(GrRect const& rect);
    /// Becomes the pixels of `other`. Assignment to itself does nothing.
    GrRegion& operator=(GrRegion const& other);

    /// Union: adds the pixels of `rect`. An empty one changes nothing.
    GrRegion& operator+=(GrRect const& rect);
    /// Union: adds the pixels of `other`. An empty one, or the region itself, changes nothing.
    GrRegion& operator+=(GrRegion const& other);

    /// Difference: takes the pixels of `rect` away. An empty one changes nothing.
    GrRegion& operator-=(GrRect const& rect);
    /// Difference: takes the pixels of `other` away. An empty one changes nothing.
    GrRegion& operator-=(GrRegion const& other);

    /// Intersection: keeps only the pixels of `rect`.
    GrRegion& operator&=(GrRect const& rect);
    /// Intersection: keeps only the pixels of `other`.
    GrRegion& operator&=(GrRegion const& other);

    /// Moves the region by `dx` to the right and `dy` downward, at most to the ends of the range of
    /// coordinates.
    void Offset(int dx, int dy);

    /// The smallest rectangle around all pixels; all zero for an empty region.
    void GetOuterRect(GrRect& rect) const;

    /// The leftmost pixel of the topmost row that has one; 0, 0 for an empty region.
    void GetSomePoint(int& x, int& y) const;

    /// True if the pixel belongs to the region.
    bool Contains(int x, int y) const;

    /// The band whose extent contains `y`, or null. Valid until the region changes.
    Band const* FindBand(int y) const;
};

static_assert(sizeof(GrRegion::Band) == 24 && sizeof(GrRegion) == 16);

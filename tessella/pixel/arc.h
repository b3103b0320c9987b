#pragma once

#include <tessella/pixel/clip_walk.h>
#include <tessella/pixel/edge_walker.h>
#include <tessella/region_cut.h>

#include <cstdint>
#include <utility>

/// The part of a pie that no box holds, between two straight segments that run downward: A on the left, B on
/// the right, ends included.
struct GrWedge {
    struct Segment {
        std::int32_t x0, y0, x1, y1;
    };
    Segment a, b;
};

/// An elliptical arc in the making. No angle is tested while drawing: the arc becomes a region, a union of
/// boxes, which holds the arc's part of the ellipse and not the rest of it. Each box is a quarter of the
/// ellipse's bounding box; the first and the last one are trimmed where the arc ends.
///
///     +------+------+
///     |  _.--|      |      The arc from 3 o'clock to E: the upper right quarter, and what lies right of
///     | E....|      |      E and above it in the upper left one. Of the pie, the triangle E, below E,
///     |  \   |      |      centre is missing: a wedge.
///     +------+------+
struct GrArcState {
    std::int32_t left = 0, upperRow = 0, right = 0, lowerRow = 0;
    std::uintptr_t upperAddress = 0, lowerAddress = 0;  ///< numbers: there may be no surface at these rows
    GrRegion region;                                    ///< where the arc may appear, within the clip
    GrWedge wedges[2]{};
    std::int32_t wedgeCount = 0;
    std::uint32_t stride = 0;
    std::int32_t topRow = 0;
    std::int64_t stepY = 0, stepX = 0, spanTerm = 0, rowTerm = 0;
    std::int64_t decision = 0;  ///< negative while the rows' columns have to move inward

    LocalRegion storage;  ///< lends `region` what it is made in

    GrArcState() { std::swap(region.bands, storage.Get().bands); }
    ~GrArcState() { std::swap(region.bands, storage.Get().bands); }
    GrArcState(GrArcState const&) = delete;
    GrArcState& operator=(GrArcState const&) = delete;
};

/// Follows an ellipse from its middle row, or middle two rows, up and down at once. Being a copy, it stays in
/// registers: nothing that is stored to pixels can reach it.
struct GrEllipseWalk {
    std::int32_t left, upperRow, right, lowerRow;
    std::uintptr_t upperAddress, lowerAddress;
    std::uint32_t const stride;
    std::int32_t const topRow;
    std::int64_t const stepY, stepX;
    std::int64_t spanTerm, rowTerm, decision;
    GrRange const rows;  ///< where there is something to paint

    explicit GrEllipseWalk(GrArcState const& arc)
        : left(arc.left), upperRow(arc.upperRow), right(arc.right), lowerRow(arc.lowerRow),
          upperAddress(arc.upperAddress), lowerAddress(arc.lowerAddress), stride(arc.stride),
          topRow(arc.topRow), stepY(arc.stepY), stepX(arc.stepX), spanTerm(arc.spanTerm),
          rowTerm(arc.rowTerm), decision(arc.decision), rows(RowsOf(arc.region))
    {}

    void MoveColumns()
    {
        Subtract(spanTerm, stepX);
        Add(decision, spanTerm);
        ++left;
        --right;
    }
    void MoveRows()
    {
        --upperRow;
        ++lowerRow;
        upperAddress -= stride;
        lowerAddress += stride;
        Add(rowTerm, stepY);
        Subtract(decision, rowTerm);
    }

    bool Meets(int row) const { return row >= rows.r1 && row < rows.r2; }

    /// True if there is nothing left to paint: rows only move outward.
    bool IsBeyond() const { return upperRow < rows.r1 && lowerRow >= rows.r2; }

private:
    // The terms of ellipses that are larger than any screen wrap around.
    static void Add(std::int64_t& term, std::int64_t amount)
    {
        term =
            static_cast<std::int64_t>(static_cast<std::uint64_t>(term) + static_cast<std::uint64_t>(amount));
    }
    static void Subtract(std::int64_t& term, std::int64_t amount)
    {
        term =
            static_cast<std::int64_t>(static_cast<std::uint64_t>(term) - static_cast<std::uint64_t>(amount));
    }
};

/// True if an arc goes all the way round, wherever it starts.
constexpr bool IsWholeTurn(int sweep) { return sweep <= -360 * 64 || sweep >= 360 * 64; }

/// Sets up the walk along the ellipse in the box of `w` by `h` pixels, which is not empty, at `x`, `y`, in
/// surface coordinates, and nothing else of the arc. `base` is where the surface's row 0 begins.
void WalkSetup(GrArcState& arc, int x, int y, int w, int h, unsigned char* base, std::uint32_t stride);

/// Sets up the arc in the box of `w` by `h` pixels at `x`, `y`, in surface coordinates, from angle `start` on
/// by `sweep`, in 64ths of a degree, anticlockwise. The region of an arc with an empty box is empty, and it
/// has no wedges.
void ArcSetup(GrArcState& arc, int x, int y, int w, int h, int start, int sweep, unsigned char* base,
    std::uint32_t stride, GrRegion const& clip);

/// A quarter of the box of `w` by `h` pixels at `x`, `y`: from 0 on upper right, upper left, lower left,
/// lower right, and round again. A middle row or column belongs to both of its sides.
GrRect QuadrantBox(int q, int x, int y, int w, int h);

/// Gives a wedge as lines, from top to bottom. Where only one of its segments is, the end of the other one
/// bounds the line.
class GrWedgeWalker {
public:
    explicit GrWedgeWalker(GrWedge const& wedge);

    /// Around both segments.
    GrRect Bounds() const;

    /// False if there are no more lines.
    bool NextLine(GrRect& line);

private:
    GrWedge::Segment const a, b;
    int y;
    GrEdgeWalker aEdge, bEdge;
};

enum class Coverage { None, Part, All };

/// How much of a rectangle a region holds; nothing of an empty one.
Coverage CoverageOf(GrRect const& rect, GrRegion const& region);

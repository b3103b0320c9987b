#pragma once

#include <tessella/pixel/edge_walker.h>
#include <tessella/region_cut.h>

#include <cstdint>

/// Follows an ellipse from its middle row, or middle two rows, up and down at once. Walked as a copy of one's
/// own, it stays in registers: nothing that is stored to pixels can reach it.
struct GrEllipseWalk {
    int left = 0, upperRow = 0, right = 0, lowerRow = 0;
    unsigned char* upperAddress = nullptr;
    unsigned char* lowerAddress = nullptr;
    std::uint32_t stride = 0;
    int topRow = 0;
    std::int64_t stepY = 0, stepX = 0, spanTerm = 0, rowTerm = 0;
    std::int64_t decision = 0;  ///< negative while the rows' columns have to move inward

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

/// An elliptical arc in the making. No angle is tested while drawing: the arc becomes a region, a union of
/// boxes, which holds the arc's part of the ellipse and not the rest of it. Each box is a quarter of the
/// ellipse's bounding box; the first and the last one are trimmed where the arc ends.
///
///     +------+------+
///     |  _.--|      |      The arc from 3 o'clock to E: the upper right quarter, and what lies right of
///     | E....|      |      E and above it in the upper left one. Of the pie, the triangle E, below E,
///     |  \   |      |      centre is missing: a wedge.
///     +------+------+
struct GrArcState : GrEllipseWalk {
    /// The part of a pie that no box holds, between two straight segments that run downward: A on the left,
    /// B on the right, ends included.
    struct Wedge {
        struct Segment {
            int x0, y0, x1, y1;
        };
        Segment a, b;
    };

    LocalRegion region;  ///< where the arc may appear, within the clip
    Wedge wedges[2]{};
    int wedgeCount = 0;
};

/// Sets up the arc in the box of `w` by `h` pixels at `x`, `y`, in surface coordinates, from angle `start` on
/// by `sweep`, in 64ths of a degree, anticlockwise. `base` is where the surface's row 0 begins. The region of
/// an arc with an empty box is empty, and it has no wedges.
void ArcSetup(GrArcState& arc, int x, int y, int w, int h, int start, int sweep, unsigned char* base,
    std::uint32_t stride, GrRegion const& clip);

/// A quarter of the box of `w` by `h` pixels at `x`, `y`: from 0 on upper right, upper left, lower left,
/// lower right, and round again. A middle row or column belongs to both of its sides.
GrRect QuadrantBox(int q, int x, int y, int w, int h);

/// Gives a wedge as lines, from top to bottom. Where only one of its segments is, the end of the other one
/// bounds the line.
class GrWedgeWalker {
public:
    explicit GrWedgeWalker(GrArcState::Wedge const& wedge);

    /// Around both segments.
    GrRect Bounds() const;

    /// The row of the next line.
    int Row() const { return y; }

    /// False if there are no more lines.
    bool NextLine(GrRect& line);

private:
    GrArcState::Wedge::Segment const a, b;
    int y;
    GrEdgeWalker aEdge, bEdge;
};

enum class Coverage { None, Part, All };

/// How much of a rectangle, which is not empty, a region holds.
Coverage CoverageOf(GrRect const& rect, GrRegion const& region);

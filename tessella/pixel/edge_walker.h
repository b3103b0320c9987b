#pragma once

/// Follows a straight edge downward, a row at a time, without dividing on the way. Where the edge passes
/// between two pixels, `x` is the right one of them.
struct GrEdgeWalker {
    int x;          ///< in the present row
    int error;      ///< from 0 to `dy` - 1; `x` steps back where it would fall below
    int dy;         ///< rows of the edge
    int remainder;  ///< what `step` leaves out of the edge's width; 0 or less
    int step;       ///< pixels from row to row, rounded up

    /// Stands at `x1` in row `y1`. Only an edge with `y1` < `y2` can be followed.
    void Init(int x1, int y1, int x2, int y2);

    void Step()
    {
        error += remainder;
        x += step;
        if (error < 0) {
            error += dy;
            --x;
        }
    }
};

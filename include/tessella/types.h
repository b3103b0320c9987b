#pragma once

#include <cstdint>

/// A rectangle of pixels. `x1`, `y1` is the first pixel inside, `x2`, `y2` the first one outside on the
/// right and below; y grows downward. The coordinate space is the one that the using operation names.
struct GrRect {
    int x1;  ///< left edge, inside
    int y1;  ///< top edge, inside
    int x2;  ///< right edge, outside
    int y2;  ///< bottom edge, outside

    /// True if the rectangle holds no pixel.
    constexpr bool IsEmpty() const { return x1 >= x2 || y1 >= y2; }

    /// True if all four edges are the same.
    friend constexpr bool operator==(GrRect const&, GrRect const&) = default;
};

/// A half-open interval of coordinates: `r1` is inside, `r2` is not.
struct GrRange {
    int r1;  ///< the first coordinate inside
    int r2;  ///< the first one outside

    /// True if both ends are the same.
    friend constexpr bool operator==(GrRange const&, GrRange const&) = default;
};

static_assert(sizeof(int) == 4 && sizeof(GrRect) == 16 && sizeof(GrRange) == 8);

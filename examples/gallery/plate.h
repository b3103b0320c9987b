#pragma once

#include "picture.h"

#include <tessella.h>

#include <algorithm>
#include <cstdint>
#include <functional>
#include <vector>

namespace gallery {

/// An area to draw on, a page or one of its pictures. The context's origin is its top left corner, and it
/// paints solid.
struct Plate {
    GrContext& context;
    ImageFormat format;  ///< the context's
    int width, height;

    int Side() const { return std::min(width, height); }
    Point Centre() const { return {width / 2, height / 2}; }
    GrRect All() const { return {0, 0, width, height}; }
    void Fill(GrRegion const& region, GrColor color) const;
};

using DrawPlate = std::function<void(Plate const&)>;

/// Where the i-th picture of a page lies.
GrRect PlateOnPage(int pageWidth, int pageHeight, int columns, int rows, int i);
/// Lays pictures out on a page, from left to right and from the top, with even gaps between them.
void DrawPlates(Plate const& page, int columns, std::vector<DrawPlate> const& plates);

/// The point of a circle at an angle, as those of arcs: in 64ths of a degree, anticlockwise.
Point OnCircle(Point centre, int radius, int angle);
constexpr int kFullCircle = 23040;

GrRegion Disc(Point centre, int radius);

using Pattern = std::uint8_t[8];
constexpr Pattern kSolid = {0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF};
constexpr int kPatternCount = 8;
extern Pattern const kPatterns[kPatternCount];

void DrawChecks(Plate const& plate, int size, GrColor first, GrColor second);

}

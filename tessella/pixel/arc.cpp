#include <tessella/pixel/arc.h>

#include <tessella/coordinates.h>

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <limits>

// The order of the fields is settled.
static_assert(offsetof(GrArcState, lowerRow) == 12 && offsetof(GrArcState, lowerAddress) == 24 &&
    offsetof(GrArcState, region) == 32 && offsetof(GrArcState, wedges) == 48 &&
    offsetof(GrArcState, wedgeCount) == 112 && offsetof(GrArcState, stride) == 116 &&
    offsetof(GrArcState, topRow) == 120 && offsetof(GrArcState, stepY) == 128 &&
    offsetof(GrArcState, decision) == 160);

namespace {

constexpr int kQuadrant = 90 * 64;
constexpr int kCircle = 4 * kQuadrant;

struct Point {
    int x, y;
};

/// The bounding box of the whole ellipse.
struct Box {
    int x, y, w, h;

    GrRect Quadrant(int q) const { return QuadrantBox(q, x, y, w, h); }

    /// Where the ellipse passes at an angle.
    Point At(int angle) const
    {
        double const radians = angle * 0.000272707695624114;  // 2 pi / 23040
        double const across = ((std::cos(radians) + 1.0) * (w - 1) + 1.0) * 0.5;
        double const down = 0.5 * (1.0 + (1.0 - std::sin(radians)) * (h - 1));
        return {Moved(x, static_cast<int>(across)), Moved(y, static_cast<int>(down))};
    }
};

constexpr bool IsLeft(int quadrant) { return (quadrant + 1) & 2; }
constexpr bool IsLower(int quadrant) { return quadrant & 2; }

enum class End { First, Last };

/// Trims `box`, the whole of a quadrant, to the part of the ellipse that follows the arc's first point, or
/// leads to its last one, and makes the wedge: from the point to the centre's row, one segment runs to the
/// centre and one straight up or down.
GrWedge Trim(GrRect& box, int quadrant, Point const& point, End end)
{
    bool const left = IsLeft(quadrant);
    bool const lower = IsLower(quadrant);
    bool const first = end == End::First;
    int const centre = left ? box.x2 - 1 : box.x1;
    int const top = lower ? box.y1 : point.y;
    int const bottom = lower ? point.y : box.y2 - 1;
    int const upright = first == (left != lower) ? point.x : centre;
    GrWedge::Segment const toCentre{lower ? centre : point.x, top, lower ? point.x : centre, bottom};
    GrWedge::Segment const straight{upright, top, upright, bottom};

    if (first == lower)
        box.x1 = point.x;
    else
        box.x2 = Moved(point.x, 1);
    if (first == left)
        box.y1 = point.y;
    else
        box.y2 = Moved(point.y, 1);
    return first == lower ? GrWedge{toCentre, straight} : GrWedge{straight, toCentre};
}

/// Makes the boxes of the arc between two angles, `start` being below a full turn, and the wedges.
void MakeBoxes(GrRegion& boxes, GrArcState& arc, Box const& ellipse, int start, int end)
{
    LocalRegion const one;
    auto const add = [&](GrRect const& box) {
        one.Get() = box;
        boxes += one.Get();
    };
    int q = start / kQuadrant;
    int const qEnd = end / kQuadrant;
    bool oneQuadrant = false;
    if (start % kQuadrant != 0) {
        GrRect box = ellipse.Quadrant(q);
        arc.wedges[arc.wedgeCount++] = Trim(box, q, ellipse.At(start), End::First);
        // An arc within one quadrant loses its first box: it reaches back to where the quadrant begins.
        oneQuadrant = q == qEnd;
        if (!oneQuadrant) {
            add(box);
            ++q;
        }
    }
    for (; q < qEnd; ++q)
        add(ellipse.Quadrant(q));
    if (end % kQuadrant == 0) return;
    GrRect box = ellipse.Quadrant(q);
    GrWedge const last = Trim(box, q, ellipse.At(end), End::Last);
    if (!oneQuadrant)
        arc.wedges[arc.wedgeCount++] = last;
    else if (IsLower(q))
        arc.wedges[0].b = last.b;
    else
        arc.wedges[0].a = last.a;
    add(box);
}

}

GrRect QuadrantBox(int q, int x, int y, int w, int h)
{
    return {IsLeft(q) ? x : Moved(x, w / 2), IsLower(q) ? Moved(y, h / 2) : y,
        Moved(x, IsLeft(q) ? w - w / 2 : w), Moved(y, IsLower(q) ? h : h - h / 2)};
}

void ArcSetup(GrArcState& arc, int x, int y, int w, int h, int start, int sweep, unsigned char* base,
    std::uint32_t stride, GrRegion const& clip)
{
    arc.region = GrRect{};
    arc.wedgeCount = 0;
    if (w < 1 || h < 1) return;

    LocalRegion const boxes;
    if (IsWholeTurn(sweep)) {
        boxes.Get() = GrRect{x, y, Moved(x, w), Moved(y, h)};  // all four quadrants
    } else {
        boxes.Get() = GrRect{};
        std::int64_t const from = std::int64_t{start} + std::min(sweep, 0);
        int const first = static_cast<int>((from % kCircle + kCircle) % kCircle);
        MakeBoxes(boxes.Get(), arc, {x, y, w, h}, first, first + std::abs(sweep));
    }
    CutRegion(arc.region, boxes.Get(), clip);
    WalkSetup(arc, x, y, w, h, base, stride);
}

void WalkSetup(GrArcState& arc, int x, int y, int w, int h, unsigned char* base, std::uint32_t stride)
{
    auto const columns = static_cast<std::uint64_t>(w);
    auto const rows = static_cast<std::uint64_t>(h);
    bool const oddRows = rows % 2 != 0;
    arc.left = x;
    arc.right = Moved(x, w - 1);
    arc.topRow = y;
    arc.lowerRow = Moved(y, h / 2);
    arc.upperRow = oddRows ? arc.lowerRow : arc.lowerRow - 1;
    arc.stride = stride;
    arc.lowerAddress =
        reinterpret_cast<std::uintptr_t>(base) + static_cast<std::uintptr_t>(arc.lowerRow) * stride;
    arc.upperAddress = oddRows ? arc.lowerAddress : arc.lowerAddress - stride;

    std::uint64_t const rowTerm = columns * columns * (oddRows ? 1 : 2);
    std::uint64_t const decision = (2 * columns - 1) * rows * rows - (oddRows ? 0 : columns * columns);
    arc.stepY = static_cast<std::int64_t>(2 * columns * columns);
    arc.stepX = static_cast<std::int64_t>(2 * rows * rows);
    arc.spanTerm = static_cast<std::int64_t>(columns * rows * rows);
    arc.rowTerm = static_cast<std::int64_t>(rowTerm);
    std::int64_t const quarter = static_cast<std::int64_t>(decision) >> 2;
    arc.decision = static_cast<std::int64_t>(static_cast<std::uint64_t>(quarter) - rowTerm);
}

GrWedgeWalker::GrWedgeWalker(GrWedge const& wedge) : a(wedge.a), b(wedge.b), y(std::min(a.y0, b.y0))
{
    aEdge.Init(a.x0, a.y0, a.x1, a.y1);
    bEdge.Init(Moved(b.x0, 1), b.y0, Moved(b.x1, 1), b.y1);
}

GrRect GrWedgeWalker::Bounds() const
{
    return {std::min(a.x0, a.x1), std::min(a.y0, b.y0), Moved(std::max(b.x0, b.x1), 1),
        Moved(std::max(a.y1, b.y1), 1)};
}

bool GrWedgeWalker::NextLine(GrRect& line)
{
    if (y > std::max(a.y1, b.y1)) return false;
    line = {b.x0, y, a.x0 + 1, y + 1};
    if (y > a.y1) line.x1 = b.x1;
    if (y > b.y1) line.x2 = a.x1 + 1;
    if (y >= a.y0 && y <= a.y1) {
        line.x1 = aEdge.x;
        aEdge.Step();
    }
    if (y >= b.y0 && y <= b.y1) {
        line.x2 = bEdge.x;
        bEdge.Step();
    }
    ++y;
    return true;
}

Coverage CoverageOf(GrRect const& rect, GrRegion const& region)
{
    std::int64_t inside = 0;
    bool apart = true;  // else pixels are counted twice, and the region may not find them
    int bottom = std::numeric_limits<int>::min();
    for (auto const& band : BandsOf(region)) {
        apart = apart && band.r1 >= bottom;
        bottom = band.r2;
        std::int64_t const rows = std::int64_t{std::min(band.r2, rect.y2)} - std::max(band.r1, rect.y1);
        if (rows <= 0) continue;
        for (auto const& range : RangesOf(band)) {
            std::int64_t const columns =
                std::int64_t{std::min(range.r2, rect.x2)} - std::max(range.r1, rect.x1);
            inside += rows * std::max<std::int64_t>(columns, 0);
        }
    }
    if (inside == 0) return Coverage::None;
    bool const all = apart && inside == (std::int64_t{rect.x2} - rect.x1) * (std::int64_t{rect.y2} - rect.y1);
    return all ? Coverage::All : Coverage::Part;
}

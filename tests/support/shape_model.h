#pragma once

#include <tessella/types.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <functional>
#include <utility>
#include <vector>

/// The judge of shapes: each is handed to `paint` pixel by pixel, unclipped. Edges are divided out for every
/// row, and regions are tests of single pixels.
namespace model {

using Paint = std::function<void(int x, int y)>;

/// Where an edge passes in row `y`, rounded up.
struct Edge {
    int x1, y1, x2, y2;
    int X(int y) const
    {
        double const exact = static_cast<double>(y - y1) * (x2 - x1) / std::max(y2 - y1, 1);
        return x1 + static_cast<int>(std::ceil(exact));
    }
};

inline void Line(Paint const& paint, int x1, int y1, int x2, int y2)
{
    if (y1 > y2) std::swap(x1, x2), std::swap(y1, y2);
    int const dx = std::abs(x2 - x1) + 1, dy = y2 - y1 + 1, n = std::max(dx, dy);
    for (int i = 0; i < n; ++i)
        paint(x1 + (x1 <= x2 ? 1 : -1) * (i * dx / n), y1 + i * dy / n);
}

inline void Polygon(Paint const& paint, std::vector<std::int16_t> const& xy)
{
    int const n = static_cast<int>(xy.size() / 2);
    if (n < 3) return;
    auto const x = [&](int i) { return xy[static_cast<std::size_t>(i % n * 2)]; };
    auto const y = [&](int i) { return xy[static_cast<std::size_t>(i % n * 2 + 1)]; };
    int top = 0, right = x(0);
    for (int i = 1; i < n; ++i) {
        if (y(i) < y(top)) top = i;
        right = std::max<int>(right, x(i));
    }
    int row = y(top), a = top + n - 1, b = top + 1;
    Edge aEdge{x(top), row, x(a), y(a)}, bEdge{x(top), row, x(b), y(b)};
    for (;; ++row) {
        for (; row >= y(a); a += n - 1) {
            if (a % n == b % n) return;
            aEdge = {x(a), row, x(a + n - 1), y(a + n - 1)};
        }
        for (; row >= y(b); ++b)
            bEdge = {x(b), row, x(b + 1), y(b + 1)};
        auto const [from, to] = std::minmax({aEdge.X(row), bEdge.X(row)});
        for (int i = from; i < std::min(to, right); ++i)
            paint(i, row);
    }
}

/// Boxes of an arc and wedges of its pie, in the ellipse's box of `w` by `h` pixels at `x`, `y`.
struct Arc {
    int x, y, w, h;
    std::vector<GrRect> boxes;
    std::vector<std::pair<Edge, Edge>> wedges;

    Arc(int boxX, int boxY, int width, int height, int start, int sweep)
        : x(boxX), y(boxY), w(width), h(height)
    {
        if (w < 1 || h < 1) return;
        bool const whole = std::abs(sweep) >= 23040;
        start = whole ? 0 : ((start + std::min(sweep, 0)) % 23040 + 23040) % 23040;
        int const end = whole ? 23040 : start + std::abs(sweep);
        int q = start / 5760;
        bool const same = start % 5760 != 0 && q == end / 5760;
        if (start % 5760 != 0) {
            auto const [box, wedge] = Trimmed(q, start, true);
            wedges.push_back(wedge);
            if (!same) boxes.push_back(box), ++q;
        }
        for (; q < end / 5760; ++q)
            boxes.push_back(Quadrant(q));
        if (end % 5760 == 0) return;
        auto const [box, wedge] = Trimmed(q, end, false);
        boxes.push_back(box);
        if (!same) wedges.push_back(wedge);
        if (same) (q & 2 ? wedges[0].second : wedges[0].first) = q & 2 ? wedge.second : wedge.first;
    }

    bool Contains(int px, int py) const
    {
        return std::any_of(boxes.begin(), boxes.end(),
            [&](GrRect const& box) { return px >= box.x1 && px < box.x2 && py >= box.y1 && py < box.y2; });
    }

    GrRect Quadrant(int q) const
    {
        bool const left = (q + 1) & 2, lower = q & 2;
        return {left ? x : x + w / 2, lower ? y + h / 2 : y, left ? x + (w + 1) / 2 : x + w,
            lower ? y + h : y + (h + 1) / 2};
    }

    /// The box of a quarter in which the arc begins or ends, and what is missing there of a pie, written out
    /// for each case.
    std::pair<GrRect, std::pair<Edge, Edge>> Trimmed(int q, int angle, bool first) const
    {
        auto const [l, t, r, b] = Quadrant(q);
        double const radians = angle * 0.000272707695624114;
        int const px = x + static_cast<int>(((std::cos(radians) + 1.0) * (w - 1) + 1.0) * 0.5);
        int const py = y + static_cast<int>(0.5 * (1.0 + (1.0 - std::sin(radians)) * (h - 1)));
        switch (q % 4 + (first ? 0 : 4)) {
        case 0: return {{l, t, px + 1, py + 1}, {{l, py, l, b - 1}, {px, py, l, b - 1}}};
        case 1: return {{l, py, px + 1, b}, {{px, py, px, b - 1}, {px, py, r - 1, b - 1}}};
        case 2: return {{px, py, r, b}, {{r - 1, t, px, py}, {r - 1, t, r - 1, py}}};
        case 3: return {{px, t, r, py + 1}, {{l, t, px, py}, {px, t, px, py}}};
        case 4: return {{px, py, r, b}, {{px, py, l, b - 1}, {px, py, px, b - 1}}};
        case 5: return {{px, t, r, py + 1}, {{px, py, r - 1, b - 1}, {r - 1, py, r - 1, b - 1}}};
        case 6: return {{l, t, px + 1, py + 1}, {{px, t, px, py}, {r - 1, t, px, py}}};
        default: return {{l, py, px + 1, b}, {{l, t, l, py}, {l, t, px, py}}};
        }
    }
};

enum class Kind { Outline, Interior };

inline void DrawEllipse(Paint const& paint, Arc const& arc, Kind kind)
{
    if (arc.boxes.empty()) return;
    bool const outline = kind == Kind::Outline;
    long long const w = arc.w, h = arc.h, even = h % 2 == 0;
    int left = arc.x, right = arc.x + arc.w - 1, lower = arc.y + arc.h / 2, upper = lower - (even ? 1 : 0);
    long long span = w * h * h, row = w * w * (even ? 2 : 1);
    long long decision = (((2 * w - 1) * h * h - (even ? w * w : 0)) >> 2) - row;
    for (;;) {
        for (int y = upper; y <= lower; y += std::max(lower - upper, 1))
            for (int x = left; x <= right; x += outline ? std::max(right - left, 1) : 1)
                if (arc.Contains(x, y)) paint(x, y);
        if (outline ? right - left < 2 : upper <= arc.y) return;
        while (decision < 0 && left <= right) {
            decision += span -= 2 * h * h;
            ++left, --right;
            if (outline) break;
        }
        if (left > right) return;
        if (decision < 0) continue;
        --upper, ++lower;
        decision -= row += 2 * w * w;
    }
}

inline void DrawArc(Paint const& paint, int x, int y, int w, int h, int start, int sweep)
{
    DrawEllipse(paint, Arc(x, y, w + 1, h + 1, start, sweep), Kind::Outline);
}

inline void FillArc(Paint const& paint, int x, int y, int w, int h, int start, int sweep)
{
    Arc const arc(x + 1, y + 1, w - 1, h - 1, start, sweep);
    DrawEllipse(paint, arc, Kind::Interior);
    for (auto const& [a, b] : arc.wedges)
        for (int row = std::min(a.y1, b.y1); row <= std::max(a.y2, b.y2); ++row) {
            int const from = row < a.y1 ? b.x1 : row <= a.y2 ? a.X(row) : b.x2;
            int const to = row < b.y1 ? a.x1 : row <= b.y2 ? b.X(row) : a.x2;
            for (int i = from; i <= to; ++i)
                if (!arc.Contains(i, row)) paint(i, row);
        }
}

}

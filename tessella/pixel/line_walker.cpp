#include <tessella/pixel/line_walker.h>

#include <tessella/pixel/clip_walk.h>

#include <algorithm>
#include <limits>

// Products of two lengths fit 64 bits, since lengths have at most 33 and only the full one needs them all.

namespace {

constexpr int kMin = std::numeric_limits<int>::min();
constexpr int kMax = std::numeric_limits<int>::max();

/// The coordinates around one that are all in the same item of a list, or all in the same gap.
template <typename Item>
struct Stretch {
    int r1 = kMin, r2 = kMax;
    Item const* item = nullptr;  ///< null in a gap

    Stretch(std::span<Item const> list, int v)
    {
        auto const next = std::ranges::upper_bound(list, v, {}, &Item::r1);
        if (next != list.end()) r2 = next->r1;
        if (next == list.begin()) return;
        Item const& before = next[-1];
        if (v < before.r2) {
            item = &before;
            r1 = before.r1;
            r2 = std::min(r2, before.r2);
        } else {
            r1 = before.r2;
        }
    }
};

std::uint64_t Distance(int from, int to) { return static_cast<std::uint64_t>(std::int64_t{to} - from); }

}

GrLineWalker::GrLineWalker(int x1, int y1, int x2, int y2) : x(x1), y(y1)
{
    std::uint64_t const columns = (x1 <= x2 ? Distance(x1, x2) : Distance(x2, x1)) + 1;
    std::uint64_t const rows = Distance(y1, y2) + 1;
    int const direction = x1 <= x2 ? 1 : -1;
    bool const alongX = columns >= rows;
    left = longer = alongX ? columns : rows;
    shorter = alongX ? rows : columns;
    longX = alongX ? direction : 0;
    longY = alongX ? 0 : 1;
    shortX = alongX ? 0 : direction;
    shortY = alongX ? 1 : 0;
}

std::uint64_t GrLineWalker::CountWithin(GrRect const& rect) const
{
    std::uint64_t const columns = longX + shortX > 0 ? Distance(x, rect.x2) : Distance(rect.x1, x) + 1;
    std::uint64_t const rows = Distance(y, rect.y2);
    std::uint64_t count = std::min(left, longX != 0 ? columns : rows);
    std::uint64_t const room = longX != 0 ? rows : columns;
    if (room < shorter) count = std::min(count, (room * longer - error + shorter - 1) / shorter);
    return std::max<std::uint64_t>(count, 1);  // the last coordinate of all lies behind every end
}

GrLineWalker::Run GrLineWalker::NextRun(GrRegion const& region) const
{
    Stretch const rows(BandsOf(region), y);
    if (rows.item == nullptr) return {CountWithin({kMin, rows.r1, kMax, rows.r2}), false};
    Stretch const columns(RangesOf(*rows.item), x);
    return {CountWithin({columns.r1, rows.r1, columns.r2, rows.r2}), columns.item != nullptr};
}

void GrLineWalker::Skip(std::uint64_t count)
{
    left -= count;
    if (left == 0) return;
    error += count * shorter;
    auto const along = static_cast<std::int64_t>(count);
    auto const across = static_cast<std::int64_t>(error / longer);
    error %= longer;
    x = static_cast<int>(x + along * longX + across * shortX);
    y = static_cast<int>(y + along * longY + across * shortY);
}

#pragma once

#include <tessella/types.h>

#include <algorithm>
#include <cstdint>
#include <limits>

/// A coordinate moved by an offset. It stops at the ends of its range: what lies out there is clipped away,
/// but must not come in again at the other side.
constexpr int Moved(int coordinate, int offset)
{
    using Limits = std::numeric_limits<int>;
    std::int64_t const sum = std::int64_t{coordinate} + offset;
    return static_cast<int>(std::clamp<std::int64_t>(sum, Limits::min(), Limits::max()));
}

/// The coordinate seen from `origin`.
constexpr int SeenFrom(int coordinate, int origin)
{
    using Limits = std::numeric_limits<int>;
    std::int64_t const difference = std::int64_t{coordinate} - origin;
    return static_cast<int>(std::clamp<std::int64_t>(difference, Limits::min(), Limits::max()));
}

/// Where in a source, whose coordinate `start` goes to `left`, that comes from which goes to `at`.
constexpr int SourceOf(int start, int at, int left)
{
    using Limits = std::numeric_limits<int>;
    std::int64_t const source = std::int64_t{start} + at - left;
    return static_cast<int>(std::clamp<std::int64_t>(source, Limits::min(), Limits::max()));
}

constexpr GrRect Moved(GrRect const& rect, int dx, int dy)
{
    return {Moved(rect.x1, dx), Moved(rect.y1, dy), Moved(rect.x2, dx), Moved(rect.y2, dy)};
}

#pragma once

#include <tessella/region.h>

#include <algorithm>
#include <limits>
#include <span>

/// The one order in which drawing walks a region: bands from top to bottom, in a band its ranges from left to
/// right, and each range over the full height of its band before the next one starts. What ends up on top
/// depends on it.
inline std::span<GrRegion::Band const> BandsOf(GrRegion const& region)
{
    return {region.bands.items, static_cast<std::size_t>(region.bands.item_count)};
}

inline std::span<GrRange const> RangesOf(GrRegion::Band const& band)
{
    return {band.items, static_cast<std::size_t>(band.item_count)};
}

inline bool IsOneRectangle(GrRegion const& region)
{
    return region.bands.item_count == 1 && region.bands.items[0].item_count == 1;
}

/// The rows from the first band to the last one. Bands can overlap, so any of them may be the one that
/// reaches farthest. A region without bands has none.
inline GrRange RowsOf(GrRegion const& region)
{
    GrRange rows{std::numeric_limits<int>::max(), std::numeric_limits<int>::min()};
    for (auto const& band : BandsOf(region))
        rows = {std::min(rows.r1, band.r1), std::max(rows.r2, band.r2)};
    return rows;
}

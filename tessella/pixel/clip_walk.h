#pragma once

#include <tessella/region.h>

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

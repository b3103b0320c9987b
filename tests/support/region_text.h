#pragma once

#include <tessella/region.h>

#include <string>
#include <vector>

/// A region's list of bands as text: "0..4: 0..6 | 4..8: 0..6 9..12 | 8..9:". The last band here is empty.
std::string BandsText(GrRegion const& region);

/// The recorded capacities: of the band list, then of each slot's ranges, those of spare slots behind a bar;
/// runs of slots without storage are left out at the end. "11: 10 1 | 11".
std::string CapacitiesText(GrRegion const& region);

/// A region with exactly these bands and ranges, sound or not, and no spare room.
GrRegion RegionOf(std::string const& text);

/// From here on failed assertions are collected instead of logged.
void CollectAssertions();

/// The expression texts of the assertions that failed since the last call; all must name the module of
/// regions.
std::vector<std::string> TakeAssertions();

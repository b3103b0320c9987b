#pragma once

#include <tessella/region.h>

#include <string>
#include <vector>

/// A region whose assignments and merges are plain steps: every range and every slot is moved on its own,
/// lists grow by 10 slots whenever that is due, and all is checked at the end. Slow on purpose, sharing no
/// code with the library's merges, and kept as the judge of whatever is faster: bands, counts and capacities
/// must agree, those of spare slots included.
struct PlainRegion : GrRegion {
    PlainRegion& operator=(PlainRegion const& other);
    PlainRegion& operator=(GrRect const& rect);
    PlainRegion& operator+=(PlainRegion const& other);
    PlainRegion& operator+=(GrRect const& rect);
    PlainRegion& operator-=(PlainRegion const& other);
    PlainRegion& operator-=(GrRect const& rect);
    PlainRegion& operator&=(PlainRegion const& other);
    PlainRegion& operator&=(GrRect const& rect);

    /// The expression texts of the assertions that failed since the last call.
    static std::vector<std::string> TakeReports();
};

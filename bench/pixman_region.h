#pragma once

#include <tessella/region.h>

#include <memory>

struct pixman_region32;

/// A region of pixman's for as long as the pointer lives.
struct PixmanRegionDeleter {
    void operator()(pixman_region32* region) const;
};
using PixmanRegion = std::unique_ptr<pixman_region32, PixmanRegionDeleter>;

PixmanRegion NewPixmanRegion();
/// The pixels of `region`, whose bands must not overlap.
PixmanRegion NewPixmanRegion(GrRegion const& region);

bool SamePixels(GrRegion const& ours, pixman_region32* theirs);

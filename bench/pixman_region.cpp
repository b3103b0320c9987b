#include <bench/pixman_region.h>

#include <pixman.h>

#include <vector>

void PixmanRegionDeleter::operator()(pixman_region32* region) const
{
    pixman_region32_fini(region);
    delete region;
}

PixmanRegion NewPixmanRegion()
{
    PixmanRegion region(new pixman_region32_t);
    pixman_region32_init(region.get());
    return region;
}

PixmanRegion NewPixmanRegion(GrRegion const& region)
{
    std::vector<pixman_box32_t> boxes;
    for (int i = 0; i < region.bands.item_count; ++i) {
        GrRegion::Band const& band = region.bands.items[i];
        for (int k = 0; k < band.item_count; ++k)
            boxes.push_back({band.items[k].r1, band.r1, band.items[k].r2, band.r2});
    }
    PixmanRegion result(new pixman_region32_t);
    pixman_region32_init_rects(result.get(), boxes.data(), static_cast<int>(boxes.size()));
    return result;
}

bool SamePixels(GrRegion const& ours, pixman_region32* theirs)
{
    // Empty regions of pixman's have a place, and are only equal at the same one.
    if (!ours) return pixman_region32_not_empty(theirs) == 0;
    return pixman_region32_equal(NewPixmanRegion(ours).get(), theirs) != 0;
}

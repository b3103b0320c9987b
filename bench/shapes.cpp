#include <bench/shapes.h>

#include <algorithm>

namespace {

constexpr GrRect kScreen{0, 0, kScreenWidth, kScreenHeight};

GrRect LowestPixel(GrRect const& field) { return {field.x1, field.y2 - 1, field.x1 + 1, field.y2}; }

}

GrRect RectSource::Next()
{
    int const width = 1 + Below(std::min(largest, field.x2 - field.x1));
    int const height = 1 + Below(std::min(largest, field.y2 - field.y1));
    int const x = field.x1 + Below(field.x2 - field.x1 - width + 1);
    int const y = field.y1 + Below(field.y2 - field.y1 - height + 1);
    return {x, y, x + width, y + height};
}

RectLoop::RectLoop(int width, int height)
{
    RectSource corners(6, {0, 0, kScreenWidth - width + 1, kScreenHeight - height + 1}, 1);
    for (GrRect& rect : rects) {
        GrRect const corner = corners.Next();
        rect = {corner.x1, corner.y1, corner.x1 + width, corner.y1 + height};
    }
}

std::vector<GrRect> RandomRects(int count)
{
    RectSource source(1, kScreen, 100);
    std::vector<GrRect> rects(static_cast<std::size_t>(count));
    std::generate(rects.begin(), rects.end(), [&source] { return source.Next(); });
    return rects;
}

GrRect SparseField(int count) { return {0, 0, 10'000, 10 * count + 100}; }

std::vector<GrRect> SparseRects(int count)
{
    RectSource source(2, SparseField(count), 20);
    std::vector<GrRect> rects(static_cast<std::size_t>(count), LowestPixel(SparseField(count)));
    std::generate(rects.begin() + 1, rects.end(), [&source] { return source.Next(); });
    return rects;
}

GrRegion ComplexRegion(std::uint32_t seed, int ranges)
{
    RectSource source(seed, kScreen, 32);
    GrRegion region(LowestPixel(kScreen));
    while (RangeCount(region) < ranges)
        region += source.Next();
    return region;
}

GrRegion ScreenWithHoles(std::uint32_t seed, int ranges)
{
    // Few holes are large ones, as windows are.
    RectSource source(seed, kScreen, std::max(32, 3000 / ranges));
    GrRegion region(kScreen);
    while (RangeCount(region) < ranges)
        region -= source.Next();
    return region;
}

int RangeCount(GrRegion const& region)
{
    int count = 0;
    for (int i = 0; i < region.bands.item_count; ++i)
        count += region.bands.items[i].item_count;
    return count;
}

#include "plate.h"

#include <algorithm>
#include <cmath>
#include <numbers>

namespace gallery {

namespace {

constexpr GrColor kGround = Rgb(82, 90, 108);

}

// Checks, scales, a twill, a grid, dots, bricks, a weave, waves.
Pattern const kPatterns[kPatternCount] = {{0x33, 0x33, 0xCC, 0xCC, 0x33, 0x33, 0xCC, 0xCC},
    {0x83, 0x44, 0x28, 0x10, 0x28, 0x44, 0x82, 0x01}, {0x11, 0x22, 0x44, 0x88, 0x11, 0x22, 0x44, 0x88},
    {0xFF, 0x01, 0x01, 0x01, 0x01, 0x01, 0x01, 0x01}, {0x00, 0x06, 0x06, 0x00, 0x00, 0x60, 0x60, 0x00},
    {0xFF, 0x01, 0x01, 0x01, 0xFF, 0x10, 0x10, 0x10}, {0x8B, 0x47, 0xE2, 0xD1, 0xB8, 0x74, 0x2E, 0x1D},
    {0x00, 0x18, 0x24, 0xC3, 0x00, 0x18, 0x24, 0xC3}};

void Plate::Fill(GrRegion const& region, GrColor color) const
{
    context.SetForeColor(color);
    context.FillRegion(region);
}

GrRect PlateOnPage(int pageWidth, int pageHeight, int columns, int rows, int i)
{
    int const gap = std::max(2, pageHeight / 48);
    int const width = (pageWidth - gap) / columns - gap;
    int const height = (pageHeight - gap) / rows - gap;
    // What doesn't divide goes to the rim.
    int const left = (pageWidth - columns * (width + gap) + gap) / 2 + i % columns * (width + gap);
    int const top = (pageHeight - rows * (height + gap) + gap) / 2 + i / columns * (height + gap);
    return {left, top, left + width, top + height};
}

void DrawPlates(Plate const& page, int columns, std::vector<DrawPlate> const& plates)
{
    GrContext& context = page.context;
    page.Fill(page.All(), kGround);
    int originX = 0, originY = 0;
    context.GetOrigin(originX, originY);
    int const count = static_cast<int>(plates.size());
    for (int i = 0; i < count; ++i) {
        GrRect const place = PlateOnPage(page.width, page.height, columns, count / columns, i);
        context.SetOrigin(originX + place.x1, originY + place.y1);
        Plate const plate{context, page.format, place.x2 - place.x1, place.y2 - place.y1};
        context.SetClipRegion(plate.All());
        plate.Fill(plate.All(), kPaper);
        plates[static_cast<std::size_t>(i)](plate);
        context.SetPattern(kSolid, 0, 0, false);
        context.SetRasterMode(GrRasterModeCopy);
        context.ResetClipRegion();
    }
    context.SetOrigin(originX, originY);
}

Point OnCircle(Point centre, int radius, int angle)
{
    double const radians = angle * 2 * std::numbers::pi / kFullCircle;
    // Halves, which a last bit more or less would send up or down, all go up.
    auto const rounded = [](double value) { return static_cast<int>(std::floor(value + 0.500001)); };
    return {centre.x + rounded(radius * std::cos(radians)), centre.y - rounded(radius * std::sin(radians))};
}

GrRegion Disc(Point centre, int radius)
{
    GrRegion disc;
    for (int y = -radius; y < radius; ++y) {
        int halfWidth = 0;
        while ((2 * halfWidth + 1) * (2 * halfWidth + 1) + (2 * y + 1) * (2 * y + 1) <= 4 * radius * radius)
            ++halfWidth;
        disc += GrRect{centre.x - halfWidth, centre.y + y, centre.x + halfWidth, centre.y + y + 1};
    }
    return disc;
}

void DrawChecks(Plate const& plate, int size, GrColor first, GrColor second)
{
    plate.Fill(plate.All(), first);
    GrRegion squares;
    for (int y = 0; y < plate.height; y += size)
        for (int x = y / size % 2 * size; x < plate.width; x += 2 * size)
            squares += GrRect{x, y, x + size, y + size};
    plate.Fill(squares, second);
}

}

// Regions, patterns, inversion and single pixels, in whatever mode the screen has.
//
// first_picture leaves its picture standing when it ends; first_picture --hold prints "ready", waits for a
// line on its standard input and then ends the session as an application does.
#include <tessella.h>

#include <cstring>
#include <iostream>
#include <string>

namespace {

int screenWidth, screenHeight;
int left, top;  // where the scene of 600 by 420 pixels lies on the screen

void Fill(GrContext& context, GrRegion const& region, GrColor color)
{
    context.SetForeColor(color);
    context.FillRegion(region);
}

/// The pixels of a disc, row by row.
GrRegion Disc(int centreX, int centreY, int radius)
{
    GrRegion disc;
    int halfWidth = 0;
    for (int y = -radius; y < radius; ++y) {
        while (halfWidth * halfWidth + y * y < radius * radius)
            ++halfWidth;
        while (halfWidth * halfWidth + y * y >= radius * radius && halfWidth > 0)
            --halfWidth;
        disc += GrRect{centreX - halfWidth, centreY + y, centreX + halfWidth + 1, centreY + y + 1};
    }
    return disc;
}

/// Every level of red, green, blue and grey, as far as the format tells them apart.
void DrawRamps(GrContext& context)
{
    for (int level = 0; level < 256; ++level) {
        auto const value = static_cast<std::uint8_t>(level);
        int const x = 32 + level * 2;
        GrColor const colors[] = {GrMakeColor(value, 0, 0), GrMakeColor(0, value, 0),
            GrMakeColor(0, 0, value), GrMakeColor(value, value, value)};
        for (int row = 0; row < 4; ++row)
            Fill(context, GrRect{x, 32 + row * 26, x + 2, 56 + row * 26}, colors[row]);
    }
}

/// Three discs, their overlaps found by region arithmetic and painted in the mixed colours.
void DrawDiscs(GrContext& context)
{
    GrRegion const red = Disc(200, 250, 90), green = Disc(270, 250, 90), blue = Disc(235, 310, 90);
    auto const common = [](GrRegion const& a, GrRegion const& b) {
        GrRegion region(a);
        region &= b;
        return region;
    };
    Fill(context, red, GrMakeColor(224, 32, 32));
    Fill(context, green, GrMakeColor(32, 200, 32));
    Fill(context, blue, GrMakeColor(48, 64, 232));
    Fill(context, common(red, green), GrMakeColor(240, 224, 32));
    Fill(context, common(green, blue), GrMakeColor(32, 216, 232));
    Fill(context, common(red, blue), GrMakeColor(224, 48, 224));
    Fill(context, common(common(red, green), blue), GrMakeColor(255, 255, 255));
}

/// Opaque and transparent patterns, and a pattern that inverts, over a two-coloured ground.
void DrawPatterns(GrContext& context)
{
    static constexpr std::uint8_t kChecks[8] = {0x55, 0xAA, 0x55, 0xAA, 0x55, 0xAA, 0x55, 0xAA};
    static constexpr std::uint8_t kWaves[8] = {0x81, 0x42, 0x24, 0x18, 0x18, 0x24, 0x42, 0x81};
    static constexpr std::uint8_t kSolid[8] = {0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF};

    Fill(context, GrRect{420, 180, 580, 400}, GrMakeColor(24, 72, 104));
    Fill(context, GrRect{500, 180, 580, 400}, GrMakeColor(120, 56, 24));
    context.SetBackColor(GrMakeColor(64, 128, 96));
    for (int i = 0; i < 4; ++i) {
        context.SetPattern(i < 2 ? kChecks : kWaves, i, 0, i % 2 != 0);
        Fill(context, GrRect{436, 196 + i * 34, 564, 222 + i * 34}, GrMakeColor(248, 232, 160));
    }
    context.SetRasterMode(0);
    context.SetPattern(kWaves, 0, 0, true);
    context.FillRegion(GrRect{436, 332, 564, 358});
    context.SetPattern(kSolid, 0, 0, false);
    context.FillRegion(GrRect{436, 366, 564, 392});
    context.SetRasterMode(GrRasterModeCopy);
}

void DrawGround(GrContext& context)
{
    Fill(context, GrRect{0, 0, screenWidth, screenHeight}, GrMakeColor(16, 20, 28));
    GrRegion frame = GrRect{8, 8, screenWidth - 8, screenHeight - 8};
    frame -= GrRect{10, 10, screenWidth - 10, screenHeight - 10};
    Fill(context, frame, GrMakeColor(200, 200, 208));
}

/// A field of single pixels, drawn through an origin and a clip with a hole.
void DrawPixels(GrContext& context)
{
    context.SetOrigin(left + 32, top + 180);
    context.SetClipRegion(GrRect{0, 0, 72, 220});
    context.ExcludeClipRect({24, 80, 48, 140});
    for (int y = 0; y < 220; y += 2)
        for (int x = y / 2 % 3; x < 100; x += 3) {
            context.SetForeColor(
                GrMakeColor(static_cast<std::uint8_t>(80 + x), 255, static_cast<std::uint8_t>(y)));
            context.DrawPixel(x, y);
        }
    context.ResetClipRegion();
}

}

int main(int argc, char** argv)
{
    unsigned width = 0, height = 0, depth = 0;
    if (!GrInit(width, height, depth, 0)) {
        std::cerr << argv[0] << ": no screen to draw on\n";
        return 1;
    }
    screenWidth = static_cast<int>(width);
    screenHeight = static_cast<int>(height);

    left = (screenWidth - 600) / 2;
    top = (screenHeight - 420) / 2;

    GrContext& context = *GrScreen.context;
    DrawGround(context);
    DrawPixels(context);
    context.SetOrigin(left, top);
    DrawRamps(context);
    DrawDiscs(context);
    DrawPatterns(context);

    if (argc > 1 && std::strcmp(argv[1], "--hold") == 0) {
        std::cout << "ready" << std::endl;
        std::string line;
        std::getline(std::cin, line);
        GrDone();
    }
    return 0;
}

// What a context draws, a function a topic. Any key ends.
#include <tessella.h>

#include <cstdio>

namespace {

constexpr GrColor kPaper = GrMakeColor(244, 240, 228), kInk = GrMakeColor(32, 40, 64);
constexpr GrColor kRed = GrMakeColor(208, 64, 48), kBlue = GrMakeColor(48, 96, 176);

/// A frame: one rectangle less another, filled in one go.
void DrawFrame(GrContext& context)
{
    GrRegion frame = GrRect{0, 0, 80, 60};
    frame -= GrRect{8, 8, 72, 52};
    frame += GrRect{36, 0, 44, 60};
    context.SetForeColor(kBlue);
    context.FillRegion(frame);
}

/// The same 8 by 8 pattern, opaque and transparent. All that paints goes through it, until it is all ones.
void DrawPatterns(GrContext& context)
{
    static constexpr std::uint8_t kStripes[8] = {0x11, 0x22, 0x44, 0x88, 0x11, 0x22, 0x44, 0x88};
    static constexpr std::uint8_t kSolid[8] = {0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF};
    context.SetForeColor(kInk);
    context.SetBackColor(GrMakeColor(240, 208, 96));
    context.SetPattern(kStripes, 0, 0, false);
    context.FillRegion(GrRect{0, 0, 36, 60});
    context.SetPattern(kStripes, 0, 0, true);
    context.FillRegion(GrRect{44, 0, 80, 60});
    context.SetPattern(kSolid, 0, 0, false);
}

/// Angles count 64ths of a degree, anticlockwise from 3 o'clock.
void DrawShapes(GrContext& context)
{
    context.SetForeColor(kRed);
    context.FillArc(0, 0, 59, 59, 30 * 64, 300 * 64);
    context.SetForeColor(kInk);
    context.DrawArc(0, 0, 59, 59, 0, 360 * 64);
    for (int y = 0; y < 60; y += 12)
        context.DrawLine(64, y, 80, 59 - y);
}

/// A polygon through a clip: nothing is painted outside it, whatever is drawn.
void DrawClipped(GrContext& context)
{
    static constexpr std::int16_t kTriangle[] = {40, 0, 80, 60, 0, 60};
    context.SetForeColor(GrMakeColor(48, 136, 88));
    context.SetClipRegion(GrRect{0, 0, 80, 48});
    context.ExcludeClipRect({30, 30, 50, 48});
    context.FillPolygon(kTriangle, 3);
    context.ResetClipRegion();
}

/// Inverting twice leaves things as they were: for what is dragged, or selected.
void DrawInverted(GrContext& context)
{
    context.SetForeColor(kBlue);
    context.FillRegion(GrRect{0, 0, 80, 30});
    context.SetRasterMode(0);
    context.FillRegion(GrRect{20, 10, 60, 50});
    context.FillRegion(GrRect{30, 20, 50, 40});
    context.SetRasterMode(GrRasterModeCopy);
}

/// A picture in the screen's own format, made from red, green and blue bytes, and copied twice.
void DrawPicture(GrContext& context)
{
    unsigned char stream[32 * 32 * 3];
    for (int i = 0; i < 32 * 32; ++i) {
        stream[i * 3] = static_cast<unsigned char>(i % 32 * 8);
        stream[i * 3 + 1] = static_cast<unsigned char>(i / 32 * 8);
        stream[i * 3 + 2] = 128;
    }
    GrImage image(32, 32, 0);
    image.Load(stream, 3);
    context.DrawImage({0, 0, 32, 32}, image, 0, 0);
    context.DrawImage({48, 0, 80, 16}, image, 0, 16);
}

/// The fore colour over what is there, with one alpha for all, and with one for each pixel.
void DrawBlended(GrContext& context)
{
    context.SetForeColor(kInk);
    context.FillRegion(GrRect{0, 24, 80, 36});
    context.SetForeColor(kRed);
    context.FillRegionAlpha(GrRect{0, 10, 36, 50}, 128);

    GrImage light(36, 40, GrImageHasAlpha | GrImageAlphaOnly);
    for (int i = 0; i < 36 * 40; ++i)
        light.alphaPlane[i] = static_cast<unsigned char>(i % 36 * 7);
    context.DrawImageAlpha({44, 10, 80, 50}, &light, 0, 0, {true, true, false, 0});
}

/// A bitmap has a bit a pixel, the lowest being the leftmost: here in two colours, and in one.
void DrawBits(GrContext& context)
{
    static constexpr unsigned char kSmile[8] = {0x3C, 0x42, 0xA5, 0x81, 0xA5, 0x99, 0x42, 0x3C};
    GrBitmap bitmap(8, 8);
    bitmap.Load(kSmile);
    context.SetForeColor(kInk);
    context.SetBackColor(GrMakeColor(240, 208, 96));
    for (int x = 0; x < 80; x += 10) {
        context.DrawBitmap(x, 10, bitmap);
        context.DrawBitmapTransparent(x, 30, bitmap);
    }
}

constexpr void (*kTopics[])(GrContext&) = {
    DrawFrame, DrawPatterns, DrawShapes, DrawClipped, DrawInverted, DrawPicture, DrawBlended, DrawBits};

}

int main()
{
    unsigned width, height, depth;
    if (!GrInit(width, height, depth, 0)) {
        std::fputs("There is no screen to draw on; tessella-doctor tells why.\n", stderr);
        return 1;
    }
    GrContext& context = *GrScreen.context;
    context.SetForeColor(kPaper);
    context.FillRegion(GrRect{0, 0, static_cast<int>(width), static_cast<int>(height)});
    int place = 0;
    for (auto* const draw : kTopics) {
        context.SetOrigin(20 + place % 4 * 100, 20 + place / 4 * 80);
        draw(context);
        ++place;
    }
    for (GrEvent event; !GrGetEvent(event, nullptr) || event.type != GrEventKeyDown;) {
    }
    GrDone();
}

#include "picture.h"

#include <algorithm>
#include <cstdlib>
#include <iterator>

namespace gallery {

GrColor Hue(int index)
{
    static constexpr GrColor kHues[] = {Rgb(214, 72, 64), Rgb(240, 150, 60), Rgb(248, 206, 92),
        Rgb(84, 160, 96), Rgb(44, 150, 160), Rgb(56, 98, 172), Rgb(126, 84, 156)};
    return kHues[static_cast<std::size_t>(index) % std::size(kHues)];
}

GrColor Mix(GrColor first, GrColor second, int part)
{
    part = std::clamp(part, 0, 256);
    auto const mixed = [part](int a, int b) { return a + (b - a) * part / 256; };
    return Rgb(mixed(GrRed(first), GrRed(second)), mixed(GrGreen(first), GrGreen(second)),
        mixed(GrBlue(first), GrBlue(second)));
}

std::unique_ptr<GrImage> NewImage(ImageFormat const& format, int width, int height, Picture picture)
{
    int bytes = (format.bits + 7) / 8;
    if (format.bits == 24 && GrScreen.depth == 24) bytes = static_cast<int>(GrScreen.bytesPerPixel);
    auto const size = static_cast<std::size_t>(width) * static_cast<std::size_t>(height * bytes);
    auto image = std::make_unique<GrImage>(width, height, new unsigned char[size](), nullptr, format.flags);
    image->bits = format.bits;
    image->bytes = bytes;
    auto const colorAt = [=](int x, int y) { return picture(x * 1024 / width, y * 1024 / height); };
    if (!image->isTrueColor()) {
        LoadImage(*image, colorAt);
        return image;
    }
    // Without an alpha plane, loading would take the colours for transparent.
    std::unique_ptr<GrContext> const context(image->GetContext());
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x) {
            context->SetForeColor(colorAt(x, y));
            context->DrawPixel(x, y);
        }
    return image;
}

GrColor Ramps(int x, int y)
{
    GrColor const ends[] = {Hue(0), Hue(2), Hue(3), Hue(5), Rgb(255, 255, 255)};
    return Mix(Rgb(0, 0, 0), ends[y * 5 / 1024], x / 4);
}

namespace {

constexpr int kHorizon = 640;
constexpr Point kSun = {490, 440};

/// How far a saw of teeth of some width is up at `x`.
int Saw(int x, int width, int height) { return std::abs(x % width * 2 - width) * height / width; }

GrColor SkyAt(int x, int y)
{
    GrColor const sky = y < 320 ? Mix(Rgb(36, 44, 106), Rgb(186, 84, 120), y * 256 / 320)
                                : Mix(Rgb(186, 84, 120), Rgb(255, 196, 112), (y - 320) * 256 / 320);
    int const distance = (x - kSun.x) * (x - kSun.x) + (y - kSun.y) * (y - kSun.y);
    if (distance < 90 * 90) return Rgb(255, 246, 200);
    return Mix(Rgb(255, 232, 160), sky, 40 + distance / 480);
}

}

GrColor Landscape(int x, int y)
{
    if (y >= kHorizon) {  // the lake
        GrColor const mirrored = SkyAt(x, 2 * kHorizon - y);
        bool const glitters = std::abs(x - kSun.x) < 60 + Saw(y, 22, 90) && y % 22 < 9;
        return glitters ? Mix(Rgb(255, 236, 176), mirrored, 90)
                        : Mix(mirrored, Rgb(20, 34, 70), 90 + (y - kHorizon) / 4);
    }
    int const near = kHorizon - Saw(x + 560, 760, 300) - Saw(x, 90, 26) + 130;
    if (y >= near) return Mix(Rgb(66, 48, 86), Rgb(30, 30, 58), (y - near) * 2);
    int const far = kHorizon - Saw(x + 150, 420, 230) - Saw(x + 40, 130, 40);
    if (y >= far) return Mix(Rgb(134, 84, 122), Rgb(176, 112, 124), y - far);
    return SkyAt(x, y);
}

}

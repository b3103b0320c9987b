#include "pages.h"

#include <algorithm>

namespace gallery {

namespace {

/// A part of the image, enlarged, in the lower left corner.
void DrawEnlarged(Plate const& plate, GrImage const& image)
{
    constexpr int kPixels = 12;
    int const scale = plate.height * 45 / 100 / kPixels;
    int const top = plate.height - kPixels * scale;
    std::unique_ptr<GrContext> const source(image.GetContext());
    plate.Fill(GrRect{0, top - 2, kPixels * scale + 2, plate.height}, kPaper);
    for (int y = 0; y < kPixels; ++y)
        for (int x = 0; x < kPixels; ++x) {
            GrColor const color =
                source->GetPixel(plate.width * 53 / 100 + x, plate.height * 33 / 100 + y) | 0xFF000000;
            plate.Fill(GrRect{x * scale, top + y * scale, (x + 1) * scale, top + (y + 1) * scale}, color);
        }
}

DrawPlate InFormat(ImageFormat const& format)
{
    return [format](Plate const& plate) {
        auto const image = NewImage(format, plate.width, plate.height, Landscape);
        plate.context.DrawImage(plate.All(), *image, 0, 0);
        DrawEnlarged(plate, *image);
    };
}

/// An image that fades away towards its rim.
void DrawFading(Plate const& plate)
{
    int const w = plate.width, h = plate.height;
    DrawChecks(plate, 8, kPaper, kShade);
    auto const image = NewAlphaImage(w, h, [w, h](int x, int y) {
        int const dx = (2 * x - w) * 256 / w, dy = (2 * y - h) * 256 / h;
        int const alpha = 255 - (dx * dx + dy * dy - 20000) / 170;
        return WithAlpha(Landscape(x * 1024 / w, y * 1024 / h), std::clamp(alpha, 0, 255));
    });
    plate.context.DrawImage(plate.All(), *image, 0, 0);
}

DrawPlate Dithered(ImageFormat format, Picture& picture, bool dithers)
{
    if (!dithers) format.flags |= GrImageNoDither;
    return [format, &picture](Plate const& plate) {
        auto const image = NewImage(format, plate.width, plate.height, picture);
        plate.context.DrawImage(plate.All(), *image, 0, 0);
    };
}

/// Dithered, or not, while the image is drawn.
DrawPlate DitheredOnPage(Picture& picture, bool dithers)
{
    return [&picture, dithers](Plate const& plate) {
        auto const image = NewImage({32, GrImageTrueColor}, plate.width, plate.height, picture);
        plate.context.DrawImageAlpha(plate.All(), image.get(), 0, 0, {true, dithers, true, 255});
    };
}

}

void DrawImages(Plate const& page)
{
    DrawPlates(page, 3,
        {InFormat(page.format), InFormat({32, GrImageTrueColor}),
            InFormat({32, GrImageTrueColor | GrImagePremultiplied}), InFormat({24, 0}), InFormat({16, 0}),
            InFormat({15, 0}), InFormat({8, 0}), InFormat({4, 0}), DrawFading});
}

void DrawDithering(Plate const& page)
{
    std::vector<DrawPlate> plates;
    for (int const bits : {4, 8, 15})
        for (auto* const picture : {Landscape, Ramps})
            for (bool const dithers : {false, true})
                plates.push_back(Dithered({bits, 0}, *picture, dithers));
    for (auto* const picture : {Landscape, Ramps})
        for (bool const dithers : {false, true})
            plates.push_back(DitheredOnPage(*picture, dithers));
    DrawPlates(page, 4, plates);
}

}

#include "pointers.h"

#include <array>
#include <cmath>
#include <vector>

// Shapes are told by outlines, in pixels, and drawn from the distance of each pixel to them: that gives soft
// edges, a rim of even width, and a shadow.

namespace desktop {

namespace {

struct Dot {
    float x, y;
};
/// A line with round ends.
struct Stroke {
    Dot from, to;
    float radius;
};
using Polygon = std::vector<Dot>;

struct Outline {
    Point hotSpot;
    bool isDark;  // ink with a rim of paper, not the other way round
    std::vector<Polygon> polygons;
    std::vector<Stroke> strokes;
    std::vector<Polygon> inlays;  // ink on it
    std::vector<Stroke> creases;
};

std::array<Outline, kPointerCount> const& Outlines()
{
    static std::array<Outline, kPointerCount> const outlines = {{
        {{2, 2}, false,
            {{{2, 2}, {2, 18}, {6, 14.4F}, {8.8F, 20.4F}, {11.4F, 19.2F}, {8.6F, 13.4F}, {13.8F, 13.4F}}}, {},
            {}, {}},
        {{8, 2}, false, {{{6.4F, 11}, {19, 11}, {19, 16}, {17, 20.6F}, {9, 20.6F}, {6.4F, 17}}},
            {{{8.2F, 3.6F}, {8.2F, 12}, 1.8F}, {{11.4F, 8.6F}, {11.4F, 13}, 1.7F},
                {{14.5F, 9.4F}, {14.5F, 13}, 1.6F}, {{17.3F, 10.4F}, {17.3F, 13}, 1.6F},
                {{4.2F, 12.6F}, {8, 17}, 1.7F}},
            {},
            {{{9.9F, 9.4F}, {9.9F, 13}, 0.3F}, {{13, 9.8F}, {13, 13}, 0.3F}, {{16, 10.6F}, {16, 13}, 0.3F}}},
        {{9, 11}, true, {},
            {{{9, 4}, {9, 19}, 0.7F}, {{6, 3}, {8, 3.4F}, 0.7F}, {{12, 3}, {10, 3.4F}, 0.7F},
                {{6, 20}, {8, 19.6F}, 0.7F}, {{12, 20}, {10, 19.6F}, 0.7F}},
            {}, {}},
        {{11, 11}, true, {},
            {{{11, 2}, {11, 8}, 0.7F}, {{11, 14}, {11, 20}, 0.7F}, {{2, 11}, {8, 11}, 0.7F},
                {{14, 11}, {20, 11}, 0.7F}, {{11, 11}, {11, 11}, 0.6F}},
            {}, {}},
        {{11, 11}, false,
            {{{5, 2}, {17, 2}, {17, 5}, {12.4F, 11}, {17, 17}, {17, 20}, {5, 20}, {5, 17}, {9.6F, 11},
                {5, 5}}},
            {}, {{{7.6F, 18}, {14.4F, 18}, {11, 14}}, {{8.6F, 6.4F}, {13.4F, 6.4F}, {11, 9.6F}}},
            {{{6, 3.4F}, {16, 3.4F}, 0.2F}, {{6, 18.7F}, {16, 18.7F}, 0.2F}}},
        {{11, 11}, false,
            {{{11, 1}, {15, 5.4F}, {12.3F, 5.4F}, {12.3F, 9.7F}, {16.6F, 9.7F}, {16.6F, 7}, {21, 11},
                {16.6F, 15}, {16.6F, 12.3F}, {12.3F, 12.3F}, {12.3F, 16.6F}, {15, 16.6F}, {11, 21},
                {7, 16.6F}, {9.7F, 16.6F}, {9.7F, 12.3F}, {5.4F, 12.3F}, {5.4F, 15}, {1, 11}, {5.4F, 7},
                {5.4F, 9.7F}, {9.7F, 9.7F}, {9.7F, 5.4F}, {7, 5.4F}}},
            {}, {}, {}},
    }};
    return outlines;
}

float DistanceToLine(Dot at, Dot from, Dot to)
{
    float const dx = to.x - from.x, dy = to.y - from.y, length = dx * dx + dy * dy;
    float const along =
        length > 0 ? std::clamp(((at.x - from.x) * dx + (at.y - from.y) * dy) / length, 0.0F, 1.0F) : 0;
    float const x = at.x - from.x - along * dx, y = at.y - from.y - along * dy;
    return std::sqrt(x * x + y * y);
}

/// Below 0 inside.
float DistanceTo(Polygon const& polygon, Dot at)
{
    float nearest = 1e6F;
    bool inside = false;
    for (std::size_t i = 0; i < polygon.size(); ++i) {
        Dot const a = polygon[i], b = polygon[(i + 1) % polygon.size()];
        nearest = std::min(nearest, DistanceToLine(at, a, b));
        if ((a.y > at.y) != (b.y > at.y) && at.x < a.x + (at.y - a.y) * (b.x - a.x) / (b.y - a.y))
            inside = !inside;
    }
    return inside ? -nearest : nearest;
}

float DistanceTo(std::vector<Polygon> const& polygons, std::vector<Stroke> const& strokes, Dot at)
{
    float nearest = 1e6F;
    for (auto const& polygon : polygons)
        nearest = std::min(nearest, DistanceTo(polygon, at));
    for (auto const& stroke : strokes)
        nearest = std::min(nearest, DistanceToLine(at, stroke.from, stroke.to) - stroke.radius);
    return nearest;
}

/// How much of a pixel an edge at this distance covers, of 256.
int Coverage(float distance) { return static_cast<int>(std::clamp(0.5F - distance, 0.0F, 1.0F) * 256); }

/// The colour of a pixel, with its alpha.
GrColor ColorAt(Outline const& outline, int x, int y, bool withShadow)
{
    Dot const at = {static_cast<float>(x) + 0.5F, static_cast<float>(y) + 0.5F};
    float const distance = DistanceTo(outline.polygons, outline.strokes, at);
    int const inlay = Coverage(DistanceTo(outline.inlays, outline.creases, at));
    GrColor const inner = outline.isDark ? kInk : Mix(kPaper, kInk, inlay);
    GrColor const rim = outline.isDark ? kPaper : kInk;
    int const whole = Coverage(distance - 1);
    int shade = 0;
    if (withShadow) {
        float const away = DistanceTo(outline.polygons, outline.strokes, {at.x - 2, at.y - 2.5F}) - 1;
        shade = static_cast<int>(std::clamp((2 - away) / 4, 0.0F, 1.0F) * 90);
    }
    int const alpha = std::min(255, whole + shade * (256 - whole) / 256);
    GrColor const color = Mix(rim, inner, Coverage(distance));
    return (Mix(0, color, alpha > 0 ? whole * 256 / alpha : 0) & 0xFFFFFF) |
        static_cast<GrColor>(alpha) << 24;
}

std::unique_ptr<GrImage> NewPicture(Outline const& outline)
{
    std::vector<GrColor> colors;
    for (int y = 0; y < kPointerSide; ++y)
        for (int x = 0; x < kPointerSide; ++x)
            colors.push_back(ColorAt(outline, x, y, true));
    auto image = std::make_unique<GrImage>(kPointerSide, kPointerSide, GrImageHasAlpha);
    image->Load(reinterpret_cast<std::uint8_t const*>(colors.data()), 4);
    return image;
}

/// With few colours, hard edges look better.
std::unique_ptr<GrCursor> NewMaskedCursor(Outline const& outline)
{
    auto image = std::make_unique<GrImage>(kPointerSide, kPointerSide, 0);
    auto mask = std::make_unique<GrBitmap>(kPointerSide, kPointerSide);
    std::unique_ptr<GrContext> const context(image->GetContext());
    for (int y = 0; y < kPointerSide; ++y)
        for (int x = 0; x < kPointerSide; ++x) {
            GrColor const color = ColorAt(outline, x, y, false);
            if (GrAlpha(color) < 128) continue;
            context->SetForeColor(GrGreen(color) < 128 ? kInk : kPaper);
            context->DrawPixel(x, y);
            mask->data[y * ((kPointerSide + 7) / 8) + x / 8] |= static_cast<unsigned char>(1 << x % 8);
        }
    return std::unique_ptr<GrCursor>(
        GrCursor::CreateInstance(image.release(), mask.release(), outline.hotSpot.x, outline.hotSpot.y));
}

std::unique_ptr<GrCursor> NewCursor(Outline const& outline)
{
    if (GrScreen.depth <= 8) return NewMaskedCursor(outline);
    return std::unique_ptr<GrCursor>(GrCursor::CreateInstance(
        NewPicture(outline).release(), nullptr, outline.hotSpot.x, outline.hotSpot.y));
}

std::array<std::unique_ptr<GrCursor>, kPointerCount> cursors;
std::array<std::unique_ptr<GrImage>, kPointerCount> pictures;
Pointer shown = Pointer::Count;

}

void LoadPointers()
{
    for (std::size_t i = 0; i < kPointerCount; ++i) {
        cursors[i] = NewCursor(Outlines()[i]);
        pictures[i] = NewPicture(Outlines()[i]);
    }
    ShowPointer(Pointer::Arrow);
}

void FreePointers()
{
    cursors = {};
    pictures = {};
}

void ShowPointer(Pointer shape)
{
    if (shape == shown) return;
    shown = shape;
    cursors[static_cast<std::size_t>(shape)]->Activate();
}

GrImage const& PictureOf(Pointer shape) { return *pictures[static_cast<std::size_t>(shape)]; }

}

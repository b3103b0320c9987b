#include "scenes.h"

#include <cmath>
#include <vector>

// Sums, products and roots only, which are the same on every machine.

namespace desktop {

namespace {

/// A number from 0 to 1 that seems to have nothing to do with its arguments.
float Chance(int a, int b, int c)
{
    std::uint32_t bits = static_cast<std::uint32_t>(a) * 0x9E3779B1U +
        static_cast<std::uint32_t>(b) * 0x85EBCA77U + static_cast<std::uint32_t>(c) * 0xC2B2AE3DU;
    bits = (bits ^ bits >> 15) * 0x2C1B3C6DU;
    bits = (bits ^ bits >> 12) * 0x297A2D39U;
    return static_cast<float>((bits ^ bits >> 15) >> 8) / 16777216.0F;
}

GrColor Blend(GrColor first, GrColor second, float part)
{
    return Mix(first, second, static_cast<int>(part * 256));
}

/// Lighter above 0, darker below; 1 is white, -1 black.
GrColor Lit(GrColor color, float light)
{
    return light > 0 ? Blend(color, Rgb(255, 255, 255), light) : Blend(color, Rgb(0, 0, 0), -light);
}

/// Of the triangles that cover the plane.
int RowHeight(int side) { return side * 13 / 15; }

/// Which of them it is, as a number from 0 to 1.
float TriangleAt(Point at, int side, int seed)
{
    int const rowHeight = RowHeight(side);
    int const row = at.y / rowHeight, y = at.y % rowHeight;
    int const shifted = at.x + (row % 2 != 0 ? side / 2 : 0);
    int const column = shifted / side, x = shifted % side;
    int const fromTip = std::abs(2 * x - side) * rowHeight;
    if (fromTip < y * side) return Chance(2 * column, row, seed);
    return Chance(2 * (x < side / 2 ? column : column + 1) - 1, row, seed);
}

/// A line that goes up and down between 0 and 1, about `steps` times along the way from 0 to 1, and ever
/// finer within that.
float Ridge(float x, float steps, int seed)
{
    float sum = 0, weight = 0.5F;
    for (int octave = 0; octave < 6; ++octave, steps *= 2, weight /= 2) {
        float const at = x * steps;
        int const left = static_cast<int>(at);
        float const part = at - static_cast<float>(left), smooth = part * part * (3 - 2 * part);
        float const a = Chance(left, octave, seed), b = Chance(left + 1, octave, seed);
        sum += (a + (b - a) * smooth) * weight;
    }
    return sum;
}

constexpr float kShore = 0.66F;

GrColor Sky(float x, float y)
{
    constexpr GrColor kSky[] = {
        Rgb(30, 42, 88), Rgb(94, 76, 128), Rgb(206, 112, 108), Rgb(244, 170, 112), Rgb(252, 216, 156)};
    float const at = std::clamp(y / kShore, 0.0F, 0.999F) * 4;
    int const step = static_cast<int>(at);
    GrColor const sky = Blend(kSky[step], kSky[step + 1], at - static_cast<float>(step));
    float const dx = x - 0.92F, dy = y - 0.46F, distance = std::sqrt(dx * dx + dy * dy);
    if (distance < 0.075F) return Rgb(255, 244, 206);
    return Blend(sky, Rgb(255, 226, 160), std::clamp(0.55F - distance * 1.4F, 0.0F, 1.0F));
}

/// `x` and `y` in heights of the picture.
GrColor DuskAt(float x, float y)
{
    struct Range {
        float base, height, steps;
        int seed;
        GrColor color, foot;
    };
    constexpr Range kRanges[] = {{0.74F, 0.30F, 7, 41, Rgb(46, 48, 84), Rgb(28, 34, 60)},
        {0.66F, 0.36F, 4, 25, Rgb(92, 72, 116), Rgb(128, 88, 120)},
        {0.60F, 0.42F, 3, 12, Rgb(148, 98, 126), Rgb(206, 132, 120)}};
    if (y > kShore) {
        float const depth = (y - kShore) / (1 - kShore);
        float const ripple =
            (Chance(static_cast<int>(y * 400), static_cast<int>(x * 14 + y * 60), 5) - 0.5F) * 0.03F;
        GrColor const mirrored = DuskAt(x + ripple, 2 * kShore - y - ripple * depth);
        return Blend(mirrored, Rgb(34, 42, 84), 0.25F + depth * 0.5F);
    }
    for (auto const& range : kRanges) {
        float const top = range.base - range.height * Ridge(x / 2 + 1, range.steps, range.seed);
        if (y > top) return Blend(range.color, range.foot, std::min(1.0F, (y - top) * 3));
    }
    return Sky(x, y);
}

struct Vector {
    float x, y, z;
};
Vector operator+(Vector a, Vector b) { return {a.x + b.x, a.y + b.y, a.z + b.z}; }
Vector operator-(Vector a, Vector b) { return {a.x - b.x, a.y - b.y, a.z - b.z}; }
Vector operator*(Vector a, float by) { return {a.x * by, a.y * by, a.z * by}; }
float Dot(Vector a, Vector b) { return a.x * b.x + a.y * b.y + a.z * b.z; }
Vector Unit(Vector a) { return a * (1 / std::sqrt(Dot(a, a))); }

struct Ball {
    Vector centre;
    float radius;
    GrColor color;
};
constexpr Ball kBalls[] = {{{-1.5F, 1, 5.4F}, 1, Rgb(40, 116, 124)},
    {{0.55F, 0.72F, 4.4F}, 0.72F, Rgb(214, 92, 52)}, {{1.9F, 1.15F, 6.4F}, 1.15F, Rgb(226, 178, 90)},
    {{-0.55F, 0.34F, 3.6F}, 0.34F, Rgb(240, 238, 230)}};

/// The ball that a ray meets first, and how far that is; null if it meets none.
Ball const* FirstBall(Vector from, Vector along, float& distance)
{
    Ball const* first = nullptr;
    for (auto const& ball : kBalls) {
        Vector const to = ball.centre - from;
        float const middle = Dot(to, along),
                    reach = ball.radius * ball.radius - Dot(to, to) + middle * middle;
        if (reach < 0 || middle - std::sqrt(reach) < 0.001F) continue;
        float const here = middle - std::sqrt(reach);
        if (first && here >= distance) continue;
        first = &ball;
        distance = here;
    }
    return first;
}

GrColor Trace(Vector from, Vector along, int bounces)
{
    Vector const sun = Unit({-0.6F, 0.9F, -0.5F});
    GrColor const sky = Blend(Rgb(236, 230, 214), Rgb(92, 138, 162), std::clamp(along.y * 2.2F, 0.0F, 1.0F));
    float distance = 0, ignored = 0;
    if (Ball const* const ball = FirstBall(from, along, distance)) {
        Vector const hit = from + along * distance, normal = Unit(hit - ball->centre);
        Vector const mirrored = along - normal * (2 * Dot(along, normal));
        bool const isShaded = FirstBall(hit + normal * 0.01F, sun, ignored) != nullptr;
        float const light = isShaded ? 0 : std::max(0.0F, Dot(normal, sun));
        float glint = isShaded ? 0 : std::max(0.0F, Dot(mirrored, sun));
        for (int i = 0; i < 5; ++i)
            glint *= glint;
        GrColor color = Lit(ball->color, -0.62F + 0.66F * light + 0.1F * (normal.y + 1));
        if (bounces > 0) color = Blend(color, Trace(hit + normal * 0.01F, mirrored, bounces - 1), 0.22F);
        return Lit(color, glint * 0.9F);
    }
    if (along.y >= -0.001F) return sky;
    distance = -from.y / along.y;
    Vector const hit = from + along * distance;
    bool const isDark = (static_cast<int>(hit.x + 100) + static_cast<int>(hit.z + 100)) % 2 != 0;
    GrColor color = isDark ? Rgb(70, 92, 108) : Rgb(226, 222, 210);
    if (FirstBall(hit + Vector{0, 0.01F, 0}, sun, ignored)) color = Lit(color, -0.5F);
    return Blend(color, Rgb(236, 230, 214), std::clamp(distance / 26 - 0.1F, 0.0F, 1.0F));
}

}

GrColor Wallpaper(Point at, Point size)
{
    constexpr GrColor kGround[] = {Rgb(22, 44, 72), Rgb(34, 84, 104), Rgb(74, 136, 138), Rgb(164, 190, 166)};
    float const along = static_cast<float>(at.x + 3 * at.y) * 3 / static_cast<float>(size.x + 3 * size.y);
    int const step = std::min(2, static_cast<int>(along));
    GrColor const ground = Blend(kGround[step], kGround[step + 1], along - static_cast<float>(step));
    return Lit(ground, (TriangleAt(at, size.y / 8, 3) - 0.5F) * 0.13F);
}

GrColor Dusk(Point at, Point size)
{
    auto const height = static_cast<float>(size.y);
    return DuskAt(static_cast<float>(at.x) / height, static_cast<float>(at.y) / height);
}

GrColor Mosaic(Point at, Point size)
{
    constexpr float kRows = 32;
    float const stone = static_cast<float>(size.y) / kRows;
    float const x = static_cast<float>(at.x) / stone, y = static_cast<float>(at.y) / stone;
    float nearest = 1e6F, second = 1e6F;
    Point home{};
    float homeX = 0, homeY = 0;
    for (int row = static_cast<int>(y) - 1; row <= static_cast<int>(y) + 1; ++row)
        for (int column = static_cast<int>(x) - 1; column <= static_cast<int>(x) + 1; ++column) {
            float const stoneX = static_cast<float>(column) + 0.2F + 0.6F * Chance(column, row, 1);
            float const stoneY = static_cast<float>(row) + 0.2F + 0.6F * Chance(column, row, 2);
            float const distance = std::sqrt((stoneX - x) * (stoneX - x) + (stoneY - y) * (stoneY - y));
            if (distance < nearest) {
                second = nearest;
                nearest = distance;
                home = {column, row};
                homeX = stoneX;
                homeY = stoneY;
            } else {
                second = std::min(second, distance);
            }
        }
    GrColor const dusk = DuskAt((homeX + 1) / kRows, std::max(0.0F, homeY / kRows));
    GrColor const color = Lit(dusk, 0.1F + (Chance(home.x, home.y, 3) - 0.5F) * 0.3F);
    return Blend(Rgb(52, 46, 52), color, std::clamp((second - nearest - 0.06F) * 8, 0.0F, 1.0F));
}

GrColor Spheres(Point at, Point size)
{
    auto const height = static_cast<float>(size.y);
    Vector const eye = {0, 1.5F, -1.6F};
    int red = 0, green = 0, blue = 0;
    for (int i = 0; i < 4; ++i) {  // four rays a pixel make smooth edges
        float const x = static_cast<float>(at.x) + (i % 2 != 0 ? 0.75F : 0.25F);
        float const y = static_cast<float>(at.y) + (i / 2 != 0 ? 0.75F : 0.25F);
        Vector const along = Unit({(x - static_cast<float>(size.x) / 2) / height, 0.34F - y / height, 1.25F});
        GrColor const color = Trace(eye, along, 2);
        red += GrRed(color), green += GrGreen(color), blue += GrBlue(color);
    }
    return Rgb(red / 4, green / 4, blue / 4);
}

GrColor Stones(Point at, Point size)
{
    constexpr GrColor kStones[] = {Rgb(36, 84, 104), Rgb(52, 112, 120), Rgb(96, 150, 144), Rgb(176, 196, 168),
        Rgb(230, 196, 120), Rgb(214, 92, 52)};
    int const side = size.x / 9, rowTop = at.y - at.y % RowHeight(side);
    float const chance = TriangleAt(at, side, 17);
    float const down = static_cast<float>(rowTop) / static_cast<float>(size.y);
    int const stone = std::clamp(static_cast<int>(down * 3.4F + chance * 2.6F), 0, 5);
    return Lit(kStones[stone], (chance - 0.5F) * 0.2F);
}

std::unique_ptr<GrImage> NewScene(Scene scene, Point size)
{
    std::vector<GrColor> colors;
    for (int y = 0; y < size.y; ++y)
        for (int x = 0; x < size.x; ++x)
            colors.push_back(scene({x, y}, size));
    auto image = std::make_unique<GrImage>(size.x, size.y, 0);
    image->Load(reinterpret_cast<std::uint8_t const*>(colors.data()), 4);
    return image;
}

}

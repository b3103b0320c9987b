#pragma once

#include <tessella.h>

#include <algorithm>
#include <cstdint>
#include <string_view>

namespace desktop {

struct Point {
    int x, y;
};

/// Colours are opaque, for the formats that know alpha.
constexpr GrColor Rgb(int red, int green, int blue)
{
    auto const channel = [](int value) { return static_cast<std::uint8_t>(value); };
    return GrMakeColor(channel(red), channel(green), channel(blue), 255);
}

/// What everything is made of: slate on paper, and one bright colour for what wants to be seen.
constexpr GrColor kInk = Rgb(38, 46, 60);
constexpr GrColor kSlate = Rgb(40, 78, 98);
constexpr GrColor kSlateLight = Rgb(96, 130, 146);
constexpr GrColor kMuted = Rgb(108, 114, 122);
constexpr GrColor kLine = Rgb(190, 191, 190);
constexpr GrColor kShade = Rgb(226, 225, 221);
constexpr GrColor kPaper = Rgb(252, 251, 247);
constexpr GrColor kBright = Rgb(214, 92, 52);

constexpr int kBarHeight = 28;    ///< the bar at the top of the screen
constexpr int kTitleHeight = 26;  ///< the upper edge of a frame
constexpr int kStripHeight = 30;  ///< the lower edge of what is in a frame
constexpr int kGap = 8;           ///< between things, and around them

constexpr GrRect Inset(GrRect const& rect, int by)
{
    return {rect.x1 + by, rect.y1 + by, rect.x2 - by, rect.y2 - by};
}
constexpr bool IsIn(GrRect const& rect, Point at)
{
    return at.x >= rect.x1 && at.x < rect.x2 && at.y >= rect.y1 && at.y < rect.y2;
}

/// `part` 0 is the first colour, 256 the second; so is anything below, and beyond.
constexpr GrColor Mix(GrColor first, GrColor second, int part)
{
    part = std::clamp(part, 0, 256);
    auto const mixed = [part](int a, int b) { return a + (b - a) * part / 256; };
    return Rgb(mixed(GrRed(first), GrRed(second)), mixed(GrGreen(first), GrGreen(second)),
        mixed(GrBlue(first), GrBlue(second)));
}

void Fill(GrContext& context, GrRegion const& region, GrColor color);
/// A line of one pixel along the rectangle's edges, inside.
void DrawEdge(GrContext& context, GrRect const& rect, GrColor color);
/// A box whose corners are a little round.
void FillRounded(GrContext& context, GrRect const& rect, GrColor color);
/// A solid triangle around a point, pointing to the left, the right, or down.
enum class Towards { Left, Right, Down };
void FillArrow(GrContext& context, Point centre, Towards towards, GrColor color);

enum class Face {
    Body,    ///< the built-in font
    Title,   ///< scalable and bold, for titles
    Display  ///< scalable, bold and large
};
/// Makes the faces; there must be a session.
void LoadFaces();
/// Before the session ends.
void FreeFaces();

int TextWidth(Face face, std::u16string_view text);
int TextHeight(Face face);
/// Text from `left` on, in the middle of the rows `y1` to `y2`; what it measures.
int DrawText(
    GrContext& context, Face face, int left, GrRange const& rows, std::u16string_view text, GrColor color);
/// The same in the middle of a rectangle.
void DrawTextCentred(
    GrContext& context, Face face, GrRect const& rect, std::u16string_view text, GrColor color);

}

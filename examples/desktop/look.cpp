#include "look.h"

#include <array>
#include <memory>
#include <vector>

namespace desktop {

namespace {

std::array<std::unique_ptr<GrFont>, 3> faces;
std::vector<unsigned short> units;  // a text as fonts take it; kept, so that painting needs no new memory

GrFont& FontOf(Face face) { return *faces[static_cast<std::size_t>(face)]; }

unsigned LoadUnits(std::u16string_view text)
{
    units.assign(text.begin(), text.end());
    units.push_back(0);  // there is always something to point to
    return static_cast<unsigned>(text.size());
}

}

void Fill(GrContext& context, GrRegion const& region, GrColor color)
{
    context.SetForeColor(color);
    context.FillRegion(region);
}

void DrawEdge(GrContext& context, GrRect const& rect, GrColor color)
{
    context.SetForeColor(color);
    context.FillRegion(GrRect{rect.x1, rect.y1, rect.x2, rect.y1 + 1});
    context.FillRegion(GrRect{rect.x1, rect.y2 - 1, rect.x2, rect.y2});
    context.FillRegion(GrRect{rect.x1, rect.y1 + 1, rect.x1 + 1, rect.y2 - 1});
    context.FillRegion(GrRect{rect.x2 - 1, rect.y1 + 1, rect.x2, rect.y2 - 1});
}

void FillRounded(GrContext& context, GrRect const& rect, GrColor color)
{
    context.SetForeColor(color);
    context.FillRegion(GrRect{rect.x1 + 2, rect.y1, rect.x2 - 2, rect.y1 + 1});
    context.FillRegion(GrRect{rect.x1 + 1, rect.y1 + 1, rect.x2 - 1, rect.y1 + 2});
    context.FillRegion(GrRect{rect.x1, rect.y1 + 2, rect.x2, rect.y2 - 2});
    context.FillRegion(GrRect{rect.x1 + 1, rect.y2 - 2, rect.x2 - 1, rect.y2 - 1});
    context.FillRegion(GrRect{rect.x1 + 2, rect.y2 - 1, rect.x2 - 2, rect.y2});
}

void FillArrow(GrContext& context, Point centre, Towards towards, GrColor color)
{
    constexpr int kSize = 5;
    context.SetForeColor(color);
    for (int i = 0; i < kSize; ++i) {
        int const along = towards == Towards::Right ? centre.x + 2 - i : centre.x - 2 + i;
        if (towards == Towards::Down)
            context.FillRegion(GrRect{centre.x - i, centre.y + 2 - i, centre.x + i + 1, centre.y + 3 - i});
        else
            context.FillRegion(GrRect{along, centre.y - i, along + 1, centre.y + i + 1});
    }
}

void LoadFaces()
{
    // Grey levels need some colours between ink and paper.
    bool const smooth = GrScreen.depth > 8;
    faces[0].reset(GrFont::Create("helvetica", 140, false, 400, false, false));
    faces[1].reset(GrFont::Create("helvetica", 136, false, 700, smooth, true));
    faces[2].reset(GrFont::Create("helvetica", GrScreen.width < 1024 ? 200 : 290, false, 700, smooth, true));
}

void FreeFaces() { faces = {}; }

int TextWidth(Face face, std::u16string_view text)
{
    unsigned const length = LoadUnits(text);
    return static_cast<int>(FontOf(face).GetTextWidthW(units.data(), length));
}

int TextHeight(Face face) { return static_cast<int>(FontOf(face).GetHeight()); }

int DrawText(
    GrContext& context, Face face, int left, GrRange const& rows, std::u16string_view text, GrColor color)
{
    GrFont& font = FontOf(face);
    int const width = TextWidth(face, text);
    int const top = (rows.r1 + rows.r2 - TextHeight(face)) / 2;
    context.SetForeColor(color);
    context.DrawTextW(left, top + static_cast<int>(font.GetAscent()), units.data(),
        static_cast<unsigned>(text.size()), &font, true);
    return width;
}

void DrawTextCentred(
    GrContext& context, Face face, GrRect const& rect, std::u16string_view text, GrColor color)
{
    int const left = (rect.x1 + rect.x2 - TextWidth(face, text)) / 2;
    DrawText(context, face, left, {rect.y1, rect.y2}, text, color);
}

}

#include "contents.h"
#include "scenes.h"

#include <cstdlib>

namespace desktop {

namespace {

/// Its corners at the left and the right touch the sides.
GrRegion HexagonShape(int width, int height)
{
    GrRegion shape;
    for (int y = 0; y < height; ++y) {
        int const indent = std::abs(2 * y + 1 - height) * width / 4 / height;
        shape += GrRect{indent, y, width - indent, y + 1};
    }
    return shape;
}

}

Hexagon::Hexagon(GrRect const& place)
    : Pane(*GrWindow::RootWindow(), place), picture(NewScene(Stones, {Width(), Height()}))
{
    window.SetWindowRegion(HexagonShape(Width(), Height()));
    window.SetShadowed(true);
}

void Hexagon::Paint(GrContext& context)
{
    context.DrawImage(All(), *picture, 0, 0);
    int const half = TextHeight(Face::Display) * 5 / 8, middle = Height() / 2;
    GrRect const band = {0, middle - half, Width(), middle + half};
    context.SetForeColor(kInk);
    context.FillRegionAlpha(band, 176);
    DrawTextCentred(context, Face::Display, band, u"Tessella", kPaper);
}

void Hexagon::Drag(Point at)
{
    GrRect const& screen = GrWindow::RootWindow()->bounds;
    int const left = window.bounds.x1 + at.x - grip.x, top = window.bounds.y1 + at.y - grip.y;
    window.Move(std::clamp(left, 60 - Width(), screen.x2 - 60), std::clamp(top, kBarHeight, screen.y2 - 60));
}

}

#include "contents.h"
#include "scenes.h"

namespace desktop {

namespace {

struct Entry {
    Scene* scene;
    Word title;
};
constexpr Entry kEntries[] = {{Dusk, Word::Dusk}, {Mosaic, Word::Mosaic}, {Spheres, Word::Spheres}};

}

Viewer::Viewer(GrWindow& parent, GrRect const& place) : Pane(parent, place), pictures(std::size(kEntries)) {}

GrRect Viewer::Button(int direction) const
{
    int const left = direction < 0 ? kGap - 2 : Width() - kGap + 2 - 28;
    return {left, Height() - kStripHeight + 4, left + 28, Height() - 4};
}

int Viewer::ButtonAt(Point at) const { return IsIn(Button(-1), at) ? -1 : IsIn(Button(1), at) ? 1 : 0; }

void Viewer::Paint(GrContext& context)
{
    GrRect const stage = Stage();
    auto& picture = pictures[current];
    if (!picture) picture = NewScene(*kEntries[current].scene, {stage.x2, stage.y2});
    context.DrawImage(stage, *picture, 0, 0);

    GrRect const strip = {0, stage.y2, Width(), Height()};
    Fill(context, strip, kShade);
    for (int const direction : {-1, 1}) {
        GrRect const button = Button(direction);
        bool const isLit = lit == direction;
        FillRounded(context, button, isLit ? kSlate : kPaper);
        FillArrow(context, {(button.x1 + button.x2) / 2, (button.y1 + button.y2) / 2},
            direction < 0 ? Towards::Left : Towards::Right, isLit ? kPaper : kSlate);
    }
    DrawTextCentred(context, Face::Body, strip, Say(kEntries[current].title), kInk);
}

void Viewer::Press(Point at)
{
    if (int const direction = ButtonAt(at)) Turn(direction);
}

void Viewer::Hover(Point at) { Light(ButtonAt(at)); }

void Viewer::Light(int direction)
{
    if (direction == lit) return;
    lit = direction;
    window.Invalidate(Button(-1));
    window.Invalidate(Button(1));
}

void Viewer::Turn(int direction)
{
    std::size_t const count = pictures.size();
    current = (current + count + static_cast<std::size_t>(direction)) % count;
    window.Invalidate();
}

Pointer Viewer::PointerAt(Point at) const { return ButtonAt(at) != 0 ? Pointer::Hand : Pointer::Arrow; }

}

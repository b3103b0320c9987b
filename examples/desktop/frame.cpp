#include "frame.h"

namespace desktop {

Frame::Frame(GrRect const& content, Word titleWord)
    : Pane(*GrWindow::RootWindow(),
          {content.x1 - 1, content.y1 - kTitleHeight, content.x2 + 1, content.y2 + 1}),
      title(titleWord)
{
    window.SetShadowed(true);
}

GrRect Frame::Inside() const
{
    GrRect const& bounds = window.bounds;
    return {bounds.x1 + 1, bounds.y1 + kTitleHeight, bounds.x2 - 1, bounds.y2 - 1};
}

GrRect Frame::Button() const { return {Width() - 23, 5, Width() - 7, 21}; }

void Frame::SetActive(bool nowActive)
{
    if (active == nowActive) return;
    active = nowActive;
    window.Invalidate();
}

void Frame::Paint(GrContext& context)
{
    GrColor const ground = active ? kSlate : kShade;
    DrawEdge(context, All(), active ? kSlate : kLine);
    Fill(context, GrRect{1, 1, Width() - 1, kTitleHeight}, ground);
    if (!active) Fill(context, GrRect{1, kTitleHeight - 1, Width() - 1, kTitleHeight}, kLine);
    DrawText(context, Face::Title, 10, {1, kTitleHeight}, Say(title), active ? kPaper : kMuted);

    GrRect const button = Button();
    if (buttonLit) FillRounded(context, button, kBright);
    GrColor const cross = buttonLit ? kPaper : active ? kLine : kMuted;
    context.SetForeColor(cross);
    for (int i = 0; i < 8; ++i) {
        context.FillRegion(
            GrRect{button.x1 + 4 + i, button.y1 + 4 + i, button.x1 + 5 + i, button.y1 + 5 + i});
        context.FillRegion(
            GrRect{button.x2 - 5 - i, button.y1 + 4 + i, button.x2 - 4 - i, button.y1 + 5 + i});
    }
}

void Frame::Press(Point at)
{
    buttonHeld = IsIn(Button(), at);
    dragged = !buttonHeld;
    grip = at;
}

void Frame::Drag(Point at)
{
    if (buttonHeld) SetButtonLit(IsIn(Button(), at));
    if (!dragged) return;
    // Some of the title always remains within reach.
    GrRect const& screen = GrWindow::RootWindow()->bounds;
    int const left = window.bounds.x1 + at.x - grip.x, top = window.bounds.y1 + at.y - grip.y;
    window.Move(std::clamp(left, 60 - Width(), screen.x2 - 60), std::clamp(top, kBarHeight, screen.y2 - 16));
}

void Frame::Release(Point at)
{
    if (buttonHeld && IsIn(Button(), at)) {
        SetButtonLit(false);
        window.Hide();
    }
    buttonHeld = dragged = false;
}

void Frame::Hover(Point at) { SetButtonLit(IsIn(Button(), at)); }

void Frame::SetButtonLit(bool lit)
{
    if (lit == buttonLit) return;
    buttonLit = lit;
    window.Invalidate(Button());
}

Pointer Frame::PointerAt(Point at) const
{
    if (dragged) return Pointer::Move;
    return IsIn(Button(), at) ? Pointer::Hand : Pointer::Arrow;
}

}

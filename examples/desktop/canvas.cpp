#include "contents.h"

#include <cstdlib>

namespace desktop {

namespace {

constexpr GrColor kColors[] = {kInk, kSlateLight, Rgb(40, 116, 124), Rgb(112, 160, 96), Rgb(226, 178, 90),
    kBright, Rgb(150, 70, 100), kPaper};
constexpr int kColorCount = 8;
constexpr int kSizes[] = {2, 5, 10};
constexpr int kSizeCount = 3;

void FillDisc(GrContext& context, Point centre, int diameter)
{
    // What is filled lies within the arc.
    context.FillArc(
        centre.x - diameter / 2 - 1, centre.y - diameter / 2 - 1, diameter + 1, diameter + 1, 0, 23040);
}

}

Canvas::Canvas(GrWindow& parent, GrRect const& place)
    : Pane(parent, place), drawing(std::make_unique<GrImage>(Sheet().x2, Sheet().y2, 0)),
      pen(drawing->GetContext())
{
    Fill(*pen, Sheet(), kPaper);
}

GrRect Canvas::Swatch(int i) const
{
    int const left = kGap + i * 17;
    return {left, Height() - 22, left + 13, Height() - 9};
}

GrRect Canvas::Size(int i) const
{
    int const left = Swatch(kColorCount - 1).x2 + kGap + i * 20;
    return {left, Height() - 25, left + 20, Height() - 5};
}

GrRect Canvas::ClearButton() const
{
    int const right = Width() - kGap + 2, left = right - TextWidth(Face::Body, Say(Word::Clear)) - 2 * kGap;
    return {left, Height() - kStripHeight + 4, right, Height() - 4};
}

void Canvas::Paint(GrContext& context)
{
    context.DrawImage(Sheet(), *drawing, 0, 0);
    Fill(context, GrRect{0, Sheet().y2, Width(), Height()}, kShade);
    for (int i = 0; i < kColorCount; ++i) {
        GrRect const swatch = Swatch(i);
        if (i == color) DrawEdge(context, Inset(swatch, -2), kInk);
        Fill(context, swatch, kColors[i]);
        if (i == kColorCount - 1) DrawEdge(context, swatch, kLine);
    }
    for (int i = 0; i < kSizeCount; ++i) {
        GrRect const place = Size(i);
        if (i == size) FillRounded(context, place, kPaper);
        context.SetForeColor(kInk);
        FillDisc(context, {place.x1 + 10, place.y1 + 10}, kSizes[i]);
    }
    FillRounded(context, ClearButton(), kPaper);
    DrawTextCentred(context, Face::Body, ClearButton(), Say(Word::Clear), kInk);
}

void Canvas::Press(Point at)
{
    isDrawing = IsIn(Sheet(), at);
    last = at;
    if (isDrawing) return DrawTo(at);
    for (int i = 0; i < kColorCount; ++i)
        if (IsIn(Inset(Swatch(i), -2), at)) color = i;
    for (int i = 0; i < kSizeCount; ++i)
        if (IsIn(Size(i), at)) size = i;
    if (IsIn(ClearButton(), at)) Fill(*pen, Sheet(), kPaper);
    window.Invalidate();
}

void Canvas::Drag(Point at)
{
    if (isDrawing) DrawTo(at);
}

/// The line goes into the image; what of the window it changes is due for paint.
void Canvas::DrawTo(Point at)
{
    int const steps = std::max({1, std::abs(at.x - last.x), std::abs(at.y - last.y)});
    pen->SetForeColor(kColors[color]);
    for (int i = 0; i <= steps; ++i)
        FillDisc(
            *pen, {last.x + (at.x - last.x) * i / steps, last.y + (at.y - last.y) * i / steps}, kSizes[size]);
    GrRect const line = {
        std::min(at.x, last.x), std::min(at.y, last.y), std::max(at.x, last.x), std::max(at.y, last.y)};
    window.Invalidate(Inset(line, -kSizes[size]));
    last = at;
}

Pointer Canvas::PointerAt(Point at) const
{
    if (IsIn(Sheet(), at)) return Pointer::Cross;
    return at.x < Size(kSizeCount - 1).x2 || IsIn(ClearButton(), at) ? Pointer::Hand : Pointer::Arrow;
}

}

#include "contents.h"

namespace desktop {

GrRect PointerBoard::Cell(int i) const
{
    int const width = (Width() - kGap) / kColumns, height = (Height() - kGap) / kRows;
    int const left = kGap + i % kColumns * width, top = kGap + i / kColumns * height;
    return {left, top, left + width - kGap, top + height - kGap};
}

int PointerBoard::CellAt(Point at) const
{
    for (int i = 0; i < kPointerCount; ++i)
        if (IsIn(Cell(i), at)) return i;
    return -1;
}

void PointerBoard::Paint(GrContext& context)
{
    Fill(context, All(), kPaper);
    for (int i = 0; i < kPointerCount; ++i) {
        GrRect const cell = Cell(i);
        FillRounded(context, cell, i == lit ? kSlateLight : kShade);
        GrImage const& picture = PictureOf(static_cast<Pointer>(i));
        int const left = (cell.x1 + cell.x2 - picture.width) / 2 + 2;
        int const top = (cell.y1 + cell.y2 - picture.height) / 2 + 2;
        context.DrawImage({left, top, left + picture.width, top + picture.height}, picture, 0, 0);
    }
}

void PointerBoard::Hover(Point at) { Light(CellAt(at)); }

void PointerBoard::Light(int i)
{
    if (i == lit) return;
    if (lit >= 0) window.Invalidate(Cell(lit));
    lit = i;
    if (lit >= 0) window.Invalidate(Cell(lit));
}

Pointer PointerBoard::PointerAt(Point at) const
{
    int const i = CellAt(at);
    return i < 0 ? Pointer::Arrow : static_cast<Pointer>(i);
}

}

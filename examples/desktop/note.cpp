#include "contents.h"

namespace desktop {

void Note::SetLayout(std::u16string_view name)
{
    layout = name;
    window.Invalidate(Strip());
}

void Note::Paint(GrContext& context)
{
    GrRect const strip = Strip();
    Fill(context, GrRect{0, 0, Width(), strip.y1}, kPaper);
    // A line that is too long moves to the left as far as the caret needs it.
    int const caret = TextWidth(Face::Body, std::u16string_view(lines[row]).substr(0, column));
    int const left = kGap + 4 - std::max(0, caret - (Width() - 3 * kGap));
    GrRange rows = {kGap, kGap + LineHeight()};
    for (std::size_t i = 0; i < lines.size() && rows.r1 < strip.y1; ++i) {
        DrawText(context, Face::Body, left, rows, lines[i], kInk);
        if (i == row) Fill(context, GrRect{left + caret, rows.r1, left + caret + 2, rows.r2}, kBright);
        rows = {rows.r2, rows.r2 + LineHeight()};
    }
    if (lines.size() == 1 && lines[0].empty())
        DrawText(context, Face::Body, left + 6, {kGap, kGap + LineHeight()}, Say(Word::TypeHere), kMuted);

    Fill(context, strip, kShade);
    GrRange const stripRows = {strip.y1, strip.y2};
    int x = kGap;
    if (!layout.empty()) {
        int const width = TextWidth(Face::Title, layout) + 12;
        GrRect const badge = {x, strip.y1 + 6, x + width, strip.y2 - 6};
        FillRounded(context, badge, deadKeyWaits ? kBright : kSlate);
        DrawTextCentred(context, Face::Title, badge, layout, kPaper);
        x += width + kGap;
    }
    Word const hint = deadKeyWaits ? Word::DeadKeyWaits : Word::ChordHint;
    if (deadKeyWaits || !layout.empty())
        DrawText(context, Face::Body, x, stripRows, Say(hint), deadKeyWaits ? kBright : kMuted);
}

void Note::Press(Point at)
{
    if (IsIn(Strip(), at)) return;
    row = std::min(lines.size() - 1, static_cast<std::size_t>(std::max(0, at.y - kGap) / LineHeight()));
    column = 0;
    std::u16string_view const line = Line();
    while (column < line.size() && TextWidth(Face::Body, line.substr(0, column + 1)) <= at.x - kGap)
        ++column;
    window.Invalidate();
}

void Note::Key(GrEvent const& event)
{
    if (event.type != GrEventKeyDown) return;
    if (event.charCount == 0 || event.chars[0] < ' ') Edit(event.vk);
    // A dead key gives the character 0. The next key that gives any has met it.
    if (event.charCount != 0) SetDeadKeyWaits(event.chars[0] == 0);
    bool const isCommand = (event.modifiers & GrModControl) != 0;
    for (unsigned i = 0; i < event.charCount && !isCommand; ++i)
        if (event.chars[i] >= ' ' && event.chars[i] != 0x7F) Insert(static_cast<char16_t>(event.chars[i]));
}

void Note::Edit(std::uint32_t vk)
{
    bool const atStart = column == 0, atEnd = column == Line().size();
    switch (vk) {
    case GrVkReturn:
        if (static_cast<int>(lines.size() + 1) * LineHeight() + kGap > Strip().y1) return;
        lines.insert(lines.begin() + static_cast<std::ptrdiff_t>(row) + 1, Line().substr(column));
        Line().resize(column);
        ++row;
        column = 0;
        break;
    case GrVkBackspace:
    case GrVkDelete:
        if (vk == GrVkBackspace ? atStart : atEnd) {  // two lines become one
            std::size_t const upper = vk == GrVkBackspace ? row - 1 : row;
            if (upper + 1 >= lines.size() || (vk == GrVkBackspace && row == 0)) return;
            column = lines[upper].size();
            lines[upper] += lines[upper + 1];
            lines.erase(lines.begin() + static_cast<std::ptrdiff_t>(upper) + 1);
            row = upper;
        } else {
            if (vk == GrVkBackspace) --column;
            Line().erase(column, 1);
        }
        break;
    case GrVkLeft: column -= atStart ? 0 : 1; break;
    case GrVkRight: column += atEnd ? 0 : 1; break;
    case GrVkHome: column = 0; break;
    case GrVkEnd: column = Line().size(); break;
    case GrVkUp: row -= row > 0 ? 1 : 0; break;
    case GrVkDown: row += row + 1 < lines.size() ? 1 : 0; break;
    default: return;
    }
    column = std::min(column, Line().size());
    window.Invalidate({0, 0, Width(), Strip().y1});
}

void Note::Insert(char16_t character)
{
    Line().insert(column++, 1, character);
    int const top = kGap + static_cast<int>(row) * LineHeight();
    window.Invalidate({0, top, Width(), top + LineHeight()});
}

void Note::SetDeadKeyWaits(bool waits)
{
    if (waits == deadKeyWaits) return;
    deadKeyWaits = waits;
    window.Invalidate(Strip());
}

Pointer Note::PointerAt(Point at) const { return IsIn(Strip(), at) ? Pointer::Arrow : Pointer::Beam; }

}

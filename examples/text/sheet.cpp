#include "sheet.h"

namespace specimen {

namespace {

unsigned short const* UnitsOf(std::u16string_view text)
{
    return reinterpret_cast<unsigned short const*>(text.data());
}

/// Korean has blanks between its words; what comes before it has none.
bool IsEastAsian(char16_t c) { return (c >= 0x2E80 && c < 0xAC00) || c >= 0xF900; }

/// Whether a line may end before the character at `i`.
bool MayBreak(std::u16string_view text, std::size_t i)
{
    constexpr std::u16string_view kNeverFirst = u"、。，";
    if (text[i - 1] == ' ') return true;
    return IsEastAsian(text[i - 1]) && IsEastAsian(text[i]) && kNeverFirst.find(text[i]) == kNeverFirst.npos;
}

std::u16string_view WithoutBlank(std::u16string_view line)
{
    return line.ends_with(u' ') ? line.substr(0, line.size() - 1) : line;
}

}

std::unique_ptr<GrFont> NewFont(Style const& style)
{
    return std::unique_ptr<GrFont>(GrFont::Create(style.face, style.size, false, 400, style.smooth, false));
}

std::unique_ptr<GrFont> NewLabelFont() { return NewFont({{}, "helvetica", 140, false, true}); }

void Sheet::Fill(GrRect const& rect, GrColor color) const
{
    context.SetForeColor(color);
    context.FillRegion(rect);
}

void Sheet::Frame(GrRect const& rect, GrColor color) const
{
    GrRegion frame = GrRect{rect.x1 - 1, rect.y1 - 1, rect.x2 + 1, rect.y2 + 1};
    frame -= rect;
    context.SetForeColor(color);
    context.FillRegion(frame);
}

void Sheet::FillStriped(GrRect const& rect) const
{
    static constexpr std::uint8_t kStripes[8] = {0x0F, 0x1E, 0x3C, 0x78, 0xF0, 0xE1, 0xC3, 0x87};
    static constexpr std::uint8_t kSolid[8] = {0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF};
    context.SetBackColor(kPaper);
    context.SetPattern(kStripes, 0, 0, false);
    Fill(rect, kStripe);
    context.SetPattern(kSolid, 0, 0, false);
}

void Sheet::Write(
    int x, int baseline, std::u16string_view text, GrFont& font, GrColor color, bool transparent) const
{
    context.SetForeColor(color);
    context.SetBackColor(kMarker);
    context.DrawTextW(x, baseline, UnitsOf(text), static_cast<unsigned>(text.size()), &font, transparent);
}

int WidthOf(std::u16string_view text, GrFont& font)
{
    return static_cast<int>(font.GetTextWidthW(UnitsOf(text), static_cast<unsigned>(text.size())));
}

std::vector<std::u16string_view> BreakLines(std::u16string_view text, GrFont& font, int width)
{
    std::vector<std::u16string_view> lines;
    while (!text.empty()) {
        std::size_t end = 0;
        for (std::size_t i = 1; i <= text.size(); ++i) {
            if (i < text.size() && !MayBreak(text, i)) continue;
            if (end != 0 && WidthOf(WithoutBlank(text.substr(0, i)), font) > width) break;
            end = i;
        }
        lines.push_back(WithoutBlank(text.substr(0, end)));
        text.remove_prefix(end);
    }
    return lines;
}

std::u16string Hex(unsigned number, int digits)
{
    std::u16string text;
    for (int i = digits; i-- > 0;)
        text += u"0123456789ABCDEF"[number >> 4 * i & 15];
    return text;
}

std::u16string Decimal(unsigned number)
{
    std::string const digits = std::to_string(number);
    return {digits.begin(), digits.end()};
}

}

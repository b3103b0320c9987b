#include "pages.h"

namespace specimen {

void DrawBlock(Sheet const& sheet, Style const& style, unsigned block)
{
    constexpr int kSide = 16, kLabelWidth = 72, kLabelHeight = 22, kGap = 8;
    auto const label = NewLabelFont();
    auto const font = NewFont(style);
    int const height = static_cast<int>(font->GetHeight()), ascent = static_cast<int>(font->GetAscent());
    int const cellWidth = (sheet.width - kLabelWidth - kGap) / kSide;
    int const cellHeight = (sheet.height - kLabelHeight - kGap) / kSide;
    int const labelAscent = static_cast<int>(label->GetAscent());
    int const labelTop = (cellHeight - static_cast<int>(label->GetHeight())) / 2;
    sheet.FillStriped({0, 0, sheet.width, sheet.height});
    for (int i = 0; i < kSide; ++i) {
        auto const digit = Hex(static_cast<unsigned>(i), 1), row = u"U+" + Hex(block, 2) + digit + u"_";
        sheet.Write(kLabelWidth + i * cellWidth + (cellWidth - WidthOf(digit, *label)) / 2, labelAscent + 2,
            digit, *label, kFaint);
        sheet.Write(kLabelWidth - kGap - WidthOf(row, *label),
            kLabelHeight + i * cellHeight + labelTop + labelAscent, row, *label, kFaint);
    }
    for (int i = 0; i < kSide * kSide; ++i) {
        char16_t const character = static_cast<char16_t>(block << 8 | static_cast<unsigned>(i));
        std::u16string_view const text(&character, 1);
        int const width = WidthOf(text, *font);
        int const left = kLabelWidth + i % kSide * cellWidth + (cellWidth - width) / 2;
        int const top = kLabelHeight + i / kSide * cellHeight + (cellHeight - height) / 2;
        sheet.Frame({left, top, left + width, top + height}, kBox);
        sheet.Write(left, top + ascent, text, *font, kInk, style.transparent);
    }
}

}

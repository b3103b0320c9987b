#include "languages.h"
#include "pages.h"

namespace specimen {

namespace {

constexpr int kMargin = 6;
constexpr int kLeading = 2;  // between two lines, for their boxes

void DrawParagraph(Sheet const& sheet, GrRect const& plate, Language const& language, Style const& style)
{
    auto const label = NewLabelFont();
    auto const font = NewFont(style);
    sheet.FillStriped(plate);
    int const left = plate.x1 + kMargin;
    int baseline = plate.y1 + static_cast<int>(label->GetAscent()) + kLeading;
    sheet.Write(left, baseline, language.name, *label);
    sheet.Write(left + WidthOf(language.name, *label) + kMargin, baseline, language.code, *label, kFaint);

    int top = plate.y1 + static_cast<int>(label->GetHeight()) + 2 * kLeading + 1;
    for (auto const line : BreakLines(language.paragraph, *font, plate.x2 - kMargin - left)) {
        int const bottom = top + static_cast<int>(font->GetHeight());
        if (bottom > plate.y2) break;  // the screen is too small
        sheet.Frame({left, top, left + WidthOf(line, *font), bottom}, kBox);
        baseline = top + static_cast<int>(font->GetAscent());
        sheet.Write(left, baseline, line, *font, kInk, style.transparent);
        top = bottom + kLeading;
    }
}

}

void DrawLanguages(Sheet const& sheet, Style const& style)
{
    constexpr int kColumns = 3;
    bool const coversAll = std::string_view(style.face) == "helvetica" && style.size == 140;
    std::vector<Language> covered;
    for (auto const& language : Languages())
        if (coversAll || language.isAlphabetic) covered.push_back(language);
    int const rows = (static_cast<int>(covered.size()) + kColumns - 1) / kColumns;
    int const width = (sheet.width - kMargin) / kColumns, height = (sheet.height - kMargin) / rows;
    for (int i = 0; i < static_cast<int>(covered.size()); ++i) {
        int const x = kMargin + i % kColumns * width, y = kMargin + i / kColumns * height;
        DrawParagraph(sheet, {x, y, x + width - kMargin, y + height - kMargin},
            covered[static_cast<std::size_t>(i)], style);
    }
}

}

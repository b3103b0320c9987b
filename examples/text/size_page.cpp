#include "pages.h"

#include <algorithm>

namespace specimen {

namespace {

constexpr int kLeft = 16, kLabelWidth = 200;

/// Lines below each other, with a label before each.
class Lines {
public:
    explicit Lines(Sheet const& its) : sheet(its) {}

    void Add(std::u16string_view what, std::u16string_view text, GrFont& font, bool transparent = true)
    {
        int const baseline = top + static_cast<int>(std::max(font.GetAscent(), label->GetAscent()));
        sheet.Write(kLeft, baseline, what, *label, kFaint);
        sheet.Write(kLeft + kLabelWidth, baseline, text, font, kInk, transparent);
        top += static_cast<int>(std::max(font.GetHeight(), label->GetHeight())) + 3;
    }
    void Gap() { top += 8; }

private:
    Sheet const& sheet;
    std::unique_ptr<GrFont> label = NewLabelFont();
    int top = 8;
};

/// The scalable face, `pixels` high.
std::unique_ptr<GrFont> NewScalable(unsigned pixels, unsigned weight, bool smooth)
{
    unsigned const size = (pixels * 1000 + 48) / 96;  // a 1000th of an inch, of which 96 pixels make one
    return std::unique_ptr<GrFont>(
        GrFont::Create(weight == 700 ? "scalable bold" : "scalable", size, false, weight, smooth, false));
}

}

void DrawSizes(Sheet const& sheet)
{
    constexpr std::u16string_view kText = u"The quick brown fox jumps. Быстрая лиса. 0123";
    sheet.FillStriped({0, 0, sheet.width, sheet.height});
    Lines lines(sheet);
    for (bool const smooth : {true, false}) {
        for (unsigned const pixels : {9, 11, 13, 15, 18, 24, 36})
            lines.Add((smooth ? u"smooth, " : u"black and white, ") + Decimal(pixels) + u" pixels", kText,
                *NewScalable(pixels, 400, smooth));
        lines.Gap();
    }
    for (unsigned const pixels : {11, 15, 24})
        lines.Add(u"bold, " + Decimal(pixels) + u" pixels", kText, *NewScalable(pixels, 700, true));
    lines.Gap();

    auto const builtIn = NewLabelFont(), smooth = NewScalable(15, 400, true);
    for (GrFont* const font : {builtIn.get(), smooth.get()})
        static_cast<GrFontBase*>(font)->embolden = true;
    lines.Add(u"built-in, struck twice", kText, *builtIn);
    lines.Add(u"the same, opaque", kText, *builtIn, false);
    lines.Add(u"smooth, struck twice", kText, *smooth);
}

}

#include "pages.h"

#include <string_view>

namespace gallery {

namespace {

constexpr std::u16string_view kWords[] = {u"Text", u"Ωδή", u"文字", u"Жук", u"한글"};
constexpr std::u16string_view kAlphabets[] = {u"Text", u"Жук", u"Ωδή"};

/// A size of fonts is in 1000ths of an inch, of which 96 pixels make one.
constexpr unsigned SizeOf(unsigned pixels) { return (pixels * 1000 + 48) / 96; }

std::unique_ptr<GrFont> NewFont(char const* face, unsigned size, bool smooth)
{
    return std::unique_ptr<GrFont>(GrFont::Create(face, size, false, 400, smooth, false));
}

/// Covers the plate with words.
void WriteWords(
    Plate const& plate, std::span<std::u16string_view const> words, GrFont& font, bool transparent)
{
    int const height = static_cast<int>(font.GetHeight()), ascent = static_cast<int>(font.GetAscent());
    std::size_t next = 0;
    for (int top = 2; top < plate.height; top += height + 1)
        for (int x = 3; x < plate.width;) {
            auto const word = words[next++ % words.size()];
            auto const* const units = reinterpret_cast<unsigned short const*>(word.data());
            auto const length = static_cast<unsigned>(word.size());
            plate.context.DrawTextW(x, top + ascent, units, length, &font, transparent);
            x += static_cast<int>(font.GetTextWidthW(units, length)) + height / 3;
        }
}

void DrawLandscape(Plate const& plate)
{
    auto const image = NewImage(plate.format, plate.width, plate.height, Landscape);
    plate.context.DrawImage(plate.All(), *image, 0, 0);
}

}

void DrawTexts(Plate const& page)
{
    auto const size = SizeOf(static_cast<unsigned>(std::max(14, page.height / 20)));
    auto const builtIn = NewFont("helvetica", 140, false);
    auto const smooth = NewFont("scalable", size, true), mono = NewFont("scalable", size, false);
    auto const bold = NewFont("scalable bold", 2 * size, true);
    DrawPlates(page, 3,
        {[&](Plate const& plate) {
             DrawLandscape(plate);
             plate.context.SetForeColor(kInk);
             plate.context.SetBackColor(kPaper);
             WriteWords(plate, kWords, *builtIn, false);
         },
            [&](Plate const& plate) {
                plate.Fill(plate.All(), kShade);
                plate.context.SetForeColor(Hue(0));
                plate.context.SetBackColor(kInk);
                plate.context.SetPattern(kPatterns[0], 0, 0, false);
                WriteWords(plate, kWords, *builtIn, true);
            },
            [&](Plate const& plate) {
                DrawChecks(plate, 9, kPaper, kInk);
                plate.context.SetRasterMode(0);
                WriteWords(plate, kWords, *builtIn, true);
            },
            [&](Plate const& plate) {
                DrawLandscape(plate);
                plate.context.SetForeColor(kPaper);
                WriteWords(plate, kAlphabets, *smooth, true);
            },
            [&](Plate const& plate) {
                plate.context.SetForeColor(Hue(4));
                plate.context.SetBackColor(Mix(Hue(1), kPaper, 150));
                WriteWords(plate, kAlphabets, *bold, false);
            },
            [&](Plate const& plate) {
                static_cast<GrFontBase&>(*mono).embolden = true;
                plate.context.SetForeColor(Hue(2));
                plate.context.SetBackColor(kInk);
                WriteWords(plate, kAlphabets, *mono, false);
            }});
}

}

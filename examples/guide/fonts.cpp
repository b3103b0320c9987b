// Text: the built-in font, scalable faces, and what is measured. Any key ends.
#include <tessella.h>

#include <cstdio>
#include <memory>
#include <string_view>

namespace {

constexpr GrColor kPaper = GrMakeColor(244, 240, 228), kInk = GrMakeColor(32, 40, 64);

unsigned short const* Units(std::u16string_view text)
{
    return reinterpret_cast<unsigned short const*>(text.data());
}

/// One line, with its top at `y`; gives where the next one goes.
int DrawLine(GrContext& context, int y, GrFont& font, std::u16string_view text)
{
    auto const length = static_cast<unsigned>(text.size());
    context.DrawTextW(20, y + static_cast<int>(font.GetAscent()), Units(text), length, &font, true);
    return y + static_cast<int>(font.GetHeight()) + 4;
}

/// The box that a text is measured to have, and the text in the middle of it.
void DrawCentred(GrContext& context, GrRect const& box, GrFont& font, std::u16string_view text)
{
    auto const length = static_cast<unsigned>(text.size());
    int const width = static_cast<int>(font.GetTextWidthW(Units(text), length));
    int const x = (box.x1 + box.x2 - width) / 2;
    int const y = (box.y1 + box.y2 - static_cast<int>(font.GetHeight())) / 2;
    context.SetForeColor(GrMakeColor(240, 208, 96));
    context.FillRegion(GrRect{x, y, x + width, y + static_cast<int>(font.GetHeight())});
    context.SetForeColor(kInk);
    context.DrawTextW(x, y + static_cast<int>(font.GetAscent()), Units(text), length, &font, true);
}

void DrawPage(GrContext& context)
{
    std::unique_ptr<GrFont> const builtIn(GrFont::Create("helvetica", 140, false, 400, false, false));
    std::unique_ptr<GrFont> const large(GrFont::Create("helvetica", 300, false, 400, true, true));
    std::unique_ptr<GrFont> const bold(GrFont::Create("helvetica", 200, false, 700, true, true));
    context.SetForeColor(kInk);
    int y = DrawLine(context, 20, *builtIn, u"The built-in font: Ελληνικά, Русский, 日本語, 한국어");
    y = DrawLine(context, y, *large, u"Scalable, smooth: AVA");
    y = DrawLine(context, y, *bold, u"Bold, a little smaller");
    DrawCentred(context, {20, y, 380, y + 60}, *bold, u"In the middle");
}

}

int main()
{
    unsigned width, height, depth;
    if (!GrInit(width, height, depth, 0)) {
        std::fputs("There is no screen to draw on; tessella-doctor tells why.\n", stderr);
        return 1;
    }
    GrScreen.context->SetForeColor(kPaper);
    GrScreen.context->FillRegion(GrRect{0, 0, static_cast<int>(width), static_cast<int>(height)});
    DrawPage(*GrScreen.context);
    for (GrEvent event; !GrGetEvent(event, nullptr) || event.type != GrEventKeyDown;) {
    }
    GrDone();
}

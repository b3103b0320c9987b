// A type specimen: what the library's fonts look like. The arrow keys to the right and to the left turn its
// pages. On the last ones, which show a block of 256 characters, those upward and downward show another one,
// page up and page down one that is 16 blocks away, and digits the one whose number they are, such as 4 E.
// Escape ends.
#include "pages.h"

#include <iostream>
#include <iterator>

namespace {

using namespace specimen;

constexpr Style kBuiltIn = {u"Built-in font", "helvetica", 140, false, true};
constexpr Style kBuiltInOpaque = {u"Built-in font, opaque", "helvetica", 140, false, false};
// As high as the built-in one.
constexpr Style kSmooth = {u"Scalable face, smooth", "helvetica", 160, true, true};
constexpr Style kSmoothOpaque = {u"Scalable face, smooth and opaque", "helvetica", 160, true, false};
constexpr Style kMono = {u"Scalable face, black and white", "helvetica", 160, false, true};
constexpr Style kMonoOpaque = {u"Scalable face, black and white, opaque", "helvetica", 160, false, false};

struct Page {
    enum class Topic { Languages, Sizes, Block } topic;
    Style const& style;
};
constexpr Page kPages[] = {{Page::Topic::Languages, kBuiltIn}, {Page::Topic::Languages, kBuiltInOpaque},
    {Page::Topic::Languages, kSmooth}, {Page::Topic::Languages, kSmoothOpaque},
    {Page::Topic::Languages, kMono}, {Page::Topic::Languages, kMonoOpaque}, {Page::Topic::Sizes, kSmooth},
    {Page::Topic::Block, kBuiltIn}, {Page::Topic::Block, kSmooth}, {Page::Topic::Block, kMono}};

int screenWidth, screenHeight;
std::size_t page = 0;
unsigned block = 0;

void Paint(GrEvent const& event)
{
    constexpr int kTitleHeight = 22, kTitleBaseline = 16, kIndent = 8;
    constexpr GrColor kGround = GrMakeColor(52, 62, 82), kTitle = GrMakeColor(255, 255, 255);
    GrContext& context = *event.window->GetContext();
    context.SetClipRegion(event.rect);
    Sheet const title{context, screenWidth, kTitleHeight};
    title.Fill({0, 0, screenWidth, screenHeight}, kGround);
    auto const font = NewLabelFont();
    auto const& [topic, style] = kPages[page];
    auto const number = Decimal(static_cast<unsigned>(page) + 1) + u" / " + Decimal(std::size(kPages));
    title.Write(kIndent, kTitleBaseline, topic == Page::Topic::Sizes ? u"Sizes and weights" : style.title,
        *font, kTitle);
    title.Write(screenWidth - kIndent - WidthOf(number, *font), kTitleBaseline, number, *font, kTitle);

    context.SetOrigin(0, kTitleHeight);
    Sheet const sheet{context, screenWidth, screenHeight - kTitleHeight};
    switch (topic) {
    case Page::Topic::Languages: DrawLanguages(sheet, style); break;
    case Page::Topic::Sizes: DrawSizes(sheet); break;
    case Page::Topic::Block: DrawBlock(sheet, style, block); break;
    }
    event.window->FreeContext(&context);
}

/// The value of a hexadecimal digit; -1 if the key types none.
int DigitOf(GrEvent const& event)
{
    char32_t const typed = event.charCount == 1 ? event.chars[0] : 0;
    if (typed >= '0' && typed <= '9') return static_cast<int>(typed - '0');
    char32_t const letter = typed | 0x20;
    return letter >= 'a' && letter <= 'f' ? static_cast<int>(letter - 'a') + 10 : -1;
}

void OnKey(GrEvent const& event)
{
    constexpr unsigned kBlocks = 256, kRow = 16;
    switch (event.vk) {
    case GrVkRight: page = (page + 1) % std::size(kPages); break;
    case GrVkLeft: page = (page + std::size(kPages) - 1) % std::size(kPages); break;
    case GrVkDown: block = (block + 1) % kBlocks; break;
    case GrVkUp: block = (block + kBlocks - 1) % kBlocks; break;
    case GrVkPageDown: block = (block + kRow) % kBlocks; break;
    case GrVkPageUp: block = (block + kBlocks - kRow) % kBlocks; break;
    default:
        if (DigitOf(event) < 0) return;
        block = (block * 16 + static_cast<unsigned>(DigitOf(event))) % kBlocks;
    }
    GrWindow::RootWindow()->Invalidate();
}

}

int main(int, char** argv)
{
    unsigned width = 0, height = 0, depth = 0;
    if (!GrInit(width, height, depth, 0)) {
        std::cerr << argv[0] << ": no screen to draw on\n";
        return 1;
    }
    screenWidth = static_cast<int>(width);
    screenHeight = static_cast<int>(height);
    for (GrEvent event;;) {
        if (!GrGetEvent(event, nullptr)) continue;
        if (event.type == GrEventPaint) Paint(event);
        if (event.type == GrEventKeyDown) OnKey(event);
        if (event.type == GrEventKeyUp && event.vk == GrVkEscape) break;
    }
    GrDone();
}

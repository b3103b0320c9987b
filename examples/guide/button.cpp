// A window with text and a button that counts how often it is clicked. Escape ends.
#include <tessella.h>

#include <cstdio>
#include <memory>
#include <string>

namespace {

constexpr GrColor kGround = GrMakeColor(40, 72, 104), kPaper = GrMakeColor(240, 236, 224);
constexpr GrColor kFace = GrMakeColor(208, 200, 180), kInk = GrMakeColor(24, 24, 32);

GrWindow* button = nullptr;
GrFont* font = nullptr;
unsigned clicks = 0;
bool held = false;

void Fill(GrContext& context, GrRegion const& region, GrColor color)
{
    context.SetForeColor(color);
    context.FillRegion(region);
}

/// `x`, `y` is the top left corner of the text.
void Write(GrContext& context, int x, int y, std::string const& text)
{
    context.SetForeColor(kInk);
    context.DrawText(x, y + static_cast<int>(font->GetAscent()),
        reinterpret_cast<unsigned char const*>(text.data()), static_cast<unsigned>(text.size()), font, true);
}

/// The library tells about each window here, and wants somebody to listen before the first one is made.
void OnWindowEvent(GrEvent const&) {}

/// A window has no pixels of its own: it is asked to paint whenever some of it has come to light.
void Paint(GrEvent const& event)
{
    GrWindow& window = *event.window;
    GrContext& context = *window.GetContext();
    if (!window.parent) {
        Fill(context, event.rect, kGround);
    } else if (&window == button) {
        GrRect const all = {0, 0, 120, 32};
        Fill(context, all, kInk);
        Fill(context, GrRect{1, 1, 119, 31}, held ? kPaper : kFace);
        Write(context, 34, 9, "Click me");
    } else {
        Fill(context, event.rect, kPaper);
        Write(context, 20, 20, "Hello. This is a window.");
        Write(context, 20, 44, "The button was clicked " + std::to_string(clicks) + " times.");
    }
    window.FreeContext(&context);
}

/// The pointer: a white triangle. Pixels that the mask leaves out are not shown.
std::unique_ptr<GrCursor> MakePointer()
{
    constexpr int kSide = 12;
    auto image = std::make_unique<GrImage>(kSide, kSide, 0);
    auto mask = std::make_unique<GrBitmap>(kSide, kSide);
    std::unique_ptr<GrContext> const context(image->GetContext());
    for (int y = 0; y < kSide; ++y) {
        Fill(*context, GrRect{1, y, y, y + 1}, GrMakeColor(255, 255, 255));
        unsigned const row = (2u << y) - 1;
        mask->data[y * 2] = static_cast<unsigned char>(row);
        mask->data[y * 2 + 1] = static_cast<unsigned char>(row >> 8);
    }
    // The cursor owns both from here on. Its hot spot is the tip.
    return std::unique_ptr<GrCursor>(GrCursor::CreateInstance(image.release(), mask.release(), 0, 0));
}

/// Until the user presses Escape.
void HandleEvents(GrWindow& panel)
{
    for (GrEvent event;;) {
        if (!GrGetEvent(event, nullptr)) continue;
        if (event.type == GrEventPaint) {
            Paint(event);
        } else if (event.type == GrEventKeyDown && event.vk == GrVkEscape) {
            return;
        } else if (event.type == GrEventLeftDown && event.window == button) {
            held = true;
            button->Invalidate();
        } else if (event.type == GrEventLeftUp && held) {
            held = false;
            clicks += event.window == button;
            button->Invalidate();
            panel.Invalidate();
        }
    }
}

}

int main()
{
    unsigned width, height, depth;
    if (!GrInit(width, height, depth, 0)) {
        std::fputs("There is no screen to draw on; tessella-doctor tells why.\n", stderr);
        return 1;
    }
    {
        std::unique_ptr<GrFont> const created(GrFont::Create("helvetica", 140, false, 400, false, false));
        font = created.get();
        GrWindow::SetCallback(OnWindowEvent);
        // Places are the screen's, also that of the button in the panel.
        int const x = static_cast<int>(width) / 2 - 130, y = static_cast<int>(height) / 2 - 70;
        GrWindow panel(GrWindow::RootWindow(), x, y, 260, 140, nullptr);
        GrWindow inner(&panel, x + 70, y + 84, 120, 32, nullptr);
        button = &inner;
        panel.Show();
        inner.Show();
        auto const pointer = MakePointer();
        pointer->Activate();
        HandleEvents(panel);
    }
    GrDone();
}

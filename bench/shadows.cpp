#include <bench/rows.h>
#include <bench/shapes.h>

#include <benchmark/benchmark.h>
#include <console/virtual_console.h>
#include <tessella.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <vector>

// A window with a shadow is dragged over ten others, from the packet at the mouse device until all is painted
// anew. Beside it the shadow alone, painted by the library as often as it moves: the ratio is its share of
// the whole. Handlers fill the event's rectangle once.

namespace {

constexpr char kShadowPasses[] = "shadow passes alone";
constexpr int kStep = 5;  // not accelerated
constexpr int kReach = 60;
constexpr GrColor kColor = 0x909090;  // the same as a pixel of the screen
constexpr std::uint32_t kUntouched = 0xA5A5A5A5;

console::VirtualConsole* screen;

int PixelsIn(GrRegion const& region)
{
    int count = 0;
    for (int y = 0; y < static_cast<int>(GrScreen.height); ++y)
        if (auto const* const band = region.FindBand(y))
            for (int i = 0; i < band->item_count; ++i)
                count += band->items[i].r2 - band->items[i].r1;
    return count;
}

void Paint(GrEvent const& event)
{
    if (event.type != GrEventPaint) return;
    GrContext* const context = event.window->GetContext();
    context->SetForeColor(kColor);
    context->FillRegion(event.rect);
    event.window->FreeContext(context);
}

class Desktop {
public:
    Desktop()
    {
        RectSource places(10, GrWindow::RootWindow()->bounds, 400);
        for (int i = 0; i < 10; ++i)
            Add(places.Next());
        Add({300, 200, 700, 500}).SetShadowed(true);
        Settle();
    }

    /// One packet, until nothing is due any more.
    void Drag()
    {
        int const dx = NextStep();
        screen->MoveMouse(dx, 0);
        GrEvent event;
        do {
            while (!GrGetEvent(event, nullptr)) {
            }
        } while (event.type != GrEventMouseMove);
        MoveTop(dx);
        Settle();
    }

    void PaintShadow()
    {
        GrWindow& top = *windows.back();
        top.DoMove(NextStep(), 0);
        GrRegion area = *top.shadow;  // nothing lies on it
        top.DrawShadow(area);
    }

    /// A step like those of `Drag`; how many pixels were due, and how many were stored to paint them.
    void Count(int& due, int& stored)
    {
        MoveTop(NextStep());
        GrRegion area = GrWindow::RootWindow()->bounds;
        if (GrWindow::GetPaintEvent(nullptr, area)) due += PixelsIn(area);
        std::size_t const pixels = std::size_t{GrScreen.width} * GrScreen.height;
        std::memset(GrScreen.fbMemory, kUntouched & 0xFF, pixels * 4);
        for (GrEvent event; GrWindow::GetPaintEvent(&event); Paint(event)) {
            for (std::size_t i = 0; i < pixels; ++i) {  // what the library has painted
                std::uint32_t pixel;
                std::memcpy(&pixel, GrScreen.fbMemory + i * 4, 4);
                if (pixel != kUntouched && pixel != kColor) ++stored;
            }
            // Counted now, a shadow isn't counted with the next window.
            std::memset(GrScreen.fbMemory, kUntouched & 0xFF, pixels * 4);
            GrContext* const context = event.window->GetContext();
            GrRegion filled;
            context->GetClipRegion(filled);
            event.window->FreeContext(context);
            filled &= event.rect;
            filled.Offset(event.window->bounds.x1, event.window->bounds.y1);
            stored += PixelsIn(filled);
        }
        Settle();
    }

private:
    GrWindow& Add(GrRect const& place)
    {
        windows.push_back(std::make_unique<GrWindow>(
            GrWindow::RootWindow(), place.x1, place.y1, place.x2 - place.x1, place.y2 - place.y1, nullptr));
        windows.back()->Show();
        return *windows.back();
    }
    /// To and fro.
    int NextStep()
    {
        if (travelled == kReach || travelled == -kReach) step = -step;
        travelled += step;
        return step;
    }
    void MoveTop(int dx)
    {
        GrWindow& top = *windows.back();
        top.Move(top.bounds.x1 + dx, top.bounds.y1);
    }
    void Settle()
    {
        timeval noWait{0, 0};
        for (GrEvent event; GrGetEvent(event, &noWait);)
            Paint(event);
    }

    std::vector<std::unique_ptr<GrWindow>> windows;
    int step = kStep, travelled = 0;
};

}

void AddRows()
{
    static console::VirtualConsole console({*console::ParseMode("1024x768x32"), {}, {}});
    screen = &console;
    console.AttachProcess();
    unsigned width, height, depth;
    ExpectSame(GrInit(width, height, depth, 0), "a session");
    std::atexit(GrDone);  // before the console goes
    GrWindow::SetCallback(Paint);
    std::string const row = "400x300 with a shadow dragged over 10 windows: share of shadows";
    int due = 0, stored = 0;
    for (Desktop desktop; due < 10'000'000;)
        desktop.Count(due, stored);
    ExpectSame(stored >= due && stored <= 2 * due, row);
    AddContender(row, kOurs, [](benchmark::State& state) {
        for (Desktop desktop; auto _ : state)
            desktop.Drag();
    });
    AddContender(row, kShadowPasses, [](benchmark::State& state) {
        for (Desktop desktop; auto _ : state)
            desktop.PaintShadow();
    });
}

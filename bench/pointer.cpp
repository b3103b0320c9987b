#include <bench/rows.h>
#include <bench/shapes.h>

#include <benchmark/benchmark.h>
#include <console/virtual_console.h>
#include <tessella.h>

#include <cstdlib>
#include <memory>
#include <vector>

// From a packet at the mouse device to the moved window and its surroundings painted anew, through the
// device's thread, the pump, the tree and the handlers. Beside it the fills alone, with contexts made before,
// and the clips alone: the tree's operations and the making of contexts. The ratios are their shares of the
// whole; what remains goes into the device, the threads and the pump.

namespace {

constexpr char kFills[] = "fills alone";
constexpr char kClips[] = "clips alone";
constexpr int kStep = 5;  // not accelerated

console::VirtualConsole* screen;

struct Fill {
    std::shared_ptr<GrContext> context;
    GrRect rect;
};

/// Windows all over the screen, of which the topmost follows the pointer.
class Desktop {
public:
    explicit Desktop(int count)
    {
        RectSource places(static_cast<std::uint32_t>(count), GrWindow::RootWindow()->bounds, 300);
        for (int i = 0; i < count; ++i) {
            GrRect const place = i == count - 1 ? GrRect{350, 250, 650, 450} : places.Next();
            windows.push_back(std::make_unique<GrWindow>(GrWindow::RootWindow(), place.x1, place.y1,
                place.x2 - place.x1, place.y2 - place.y1, nullptr));
            windows.back()->Show();
        }
        Settle();
    }

    /// One packet, until nothing is due any more.
    void Drag()
    {
        step = -step;
        screen->MoveMouse(step, 0);
        GrEvent event;
        do {
            while (!GrGetEvent(event, nullptr)) {
            }
            if (event.type == GrEventPaint) Paint(event);
        } while (event.type != GrEventMouseMove);
        MoveTop();
        Settle();
    }

    /// What the tree has to do with it, without input and pixels.
    void Clip()
    {
        step = -step;
        MoveTop();
        for (GrEvent event; GrWindow::GetPaintEvent(&event);)
            event.window->FreeContext(event.window->GetContext());
    }

    std::vector<Fill>* record = nullptr;

private:
    void MoveTop()
    {
        GrWindow& top = *windows.back();
        top.Move(top.bounds.x1 + step, top.bounds.y1);
    }
    void Settle()
    {
        timeval noWait{0, 0};
        for (GrEvent event; GrGetEvent(event, &noWait);)
            if (event.type == GrEventPaint) Paint(event);
    }
    void Paint(GrEvent const& event)
    {
        GrContext* const context = event.window->GetContext();
        context->SetForeColor(0x8090A0);
        context->FillRegion(event.rect);
        if (record)
            record->push_back({std::shared_ptr<GrContext>(context), event.rect});
        else
            event.window->FreeContext(context);
    }

    std::vector<std::unique_ptr<GrWindow>> windows;
    int step = kStep;
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
    GrWindow::SetCallback([](GrEvent const&) {});
    for (int const count : {10, 50, 200, 800}) {
        std::string const row = "packet to repaint, " + std::to_string(count) + " windows: share of ";
        for (char const* const part : {"fills", "clips"})
            AddContender(row + part, kOurs, [count](benchmark::State& state) {
                Desktop desktop(count);
                for (auto _ : state)
                    desktop.Drag();
            });
        AddContender(row + "fills", kFills, [count](benchmark::State& state) {
            Desktop desktop(count);
            std::vector<Fill> moves[2];
            for (auto& fills : moves) {
                desktop.record = &fills;
                desktop.Drag();
            }
            for (std::size_t i = 0; auto _ : state)
                for (auto const& [context, rect] : moves[i++ % 2])
                    context->FillRegion(rect);
        });
        AddContender(row + "clips", kClips, [count](benchmark::State& state) {
            Desktop desktop(count);
            for (auto _ : state)
                desktop.Clip();
        });
    }
}

#include <common/bundle_api.h>
#include <support/on_console.h>
#include <support/seed.h>
#include <support/window_judge.h>
#include <tessella.h>
#include <tessella/session_state.h>
#include <tessella/window_state.h>

#include <gtest/gtest.h>

#include <chrono>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <map>
#include <memory>
#include <random>
#include <sstream>
#include <thread>

// Windows on the virtual console, beside the judge's: the same random operations on both, and now and then
// everything must be the same: flags, what is valid, which paint comes next, and the pixels of the screen.

namespace {

constexpr int kWidth = 44, kHeight = 36;
timeval noWait{0, 0};

std::string events;  // what the callback got

std::string Text(std::uint32_t type, int window, GrRect const& rect)
{
    std::ostringstream text;
    text << type << " of " << window << ": " << rect.x1 << ' ' << rect.y1 << ' ' << rect.x2 << ' ' << rect.y2;
    return text.str() + '\n';
}

int Number(GrWindow const* window)
{
    return static_cast<int>(reinterpret_cast<std::intptr_t>(window->userData));
}

class Soak;
Soak* painter = nullptr;  // who wants paint through the callback
void PaintNow(GrEvent const& event);

void OnEvent(GrEvent const& event)
{
    if (event.type == GrEventPaint) return PaintNow(event);
    bool const hasRect = event.type == GrEventWindowCreated || event.type == GrEventWindowChanged;
    events += Text(event.type, Number(event.window), hasRect ? event.rect : GrRect{});
}

class Soak {
public:
    Soak(console::VirtualConsole& virtualConsole, unsigned randomSeed)
        : screen(virtualConsole), random(randomSeed)
    {
        GrWindow::SetCallback(OnEvent);
    }

    void Run(int steps)
    {
        for (int step = 0; step < steps && !testing::Test::HasFailure(); ++step) {
            SCOPED_TRACE(testing::Message() << "step " << step);
            int const dice = Pick(100);
            if (dice < 70)
                Operate();
            else if (dice < 80)
                MoveMouse();
            else if (dice < 98)
                TakePaint();
            else if (dice < 99)
                Disturb();
            else
                Check();
        }
        while (!windows.empty())
            Destroy(windows.begin()->first);
        Check();
    }

    /// Paints as an application does, what the judge says is next.
    void PaintAsTold(GrEvent const& event)
    {
        if (told.empty()) std::ranges::copy(judge.NextPaint(), std::back_inserter(told));
        ASSERT_FALSE(told.empty());
        auto const paint = told.front();
        told.pop_front();
        GrWindow& window = *event.window;
        EXPECT_EQ(
            Text(event.type, Number(&window), event.rect), Text(GrEventPaint, paint.window, paint.rect));
        EXPECT_EQ(window.context != nullptr, paint.offScreen);
        GrContext* const context = window.GetContext();
        if (!judge.countPaints && window.parent) {  // its own shape, and nothing over its shadow
            GrRegion shape = window.region;
            shape.Offset(-window.bounds.x1, -window.bounds.y1);
            context->SetClipRegion(shape);
        }
        context->SetForeColor(paint.color);
        context->FillRegion(event.rect);
        window.FreeContext(context);
    }

private:
    int Pick(int count) { return static_cast<int>(random() % static_cast<unsigned>(count)); }
    GrRect PickRect(int size)
    {
        int const x = Pick(kWidth + 10) - 8, y = Pick(kHeight + 10) - 8;
        return {x, y, x + Pick(size), y + Pick(size)};
    }
    int PickWindow() { return std::next(windows.begin(), Pick(static_cast<int>(windows.size())))->first; }
    GrWindow& Real(int i) { return i == 0 ? *GrWindow::RootWindow() : *windows.at(i); }

    void Expect(std::uint32_t type, int i, GrRect const& rect = {}) { wanted += Text(type, i, rect); }

    void Operate()
    {
        if (windows.size() < 3 || (windows.size() < 12 && Pick(12) == 0)) return Create();
        int const i = PickWindow();
        GrWindow& window = Real(i);
        switch (Pick(12)) {
        case 0:
            if (Pick(6) == 0 && judge[i].children.empty()) Destroy(i);
            break;
        case 1:
            if (judge[i].visible) {
                judge.Hide(i);
                Expect(GrEventWindowHidden, i);
            }
            window.Hide();
            break;
        case 2:
        case 3:
            if (!judge[i].visible) {
                judge.Show(i);
                Expect(GrEventWindowShown, i);
            }
            window.Show();
            break;
        case 4: return Move(i);
        case 5: return Reshape(i);
        case 6: judge.Restack(i, true), window.Raise(); break;
        case 7: judge.Restack(i, false), window.Lower(); break;
        case 8: return ChangeParent(i);
        case 9: {
            GrRect const rect = PickRect(20);
            judge.Invalidate(i, &rect), window.Invalidate(rect);
            break;
        }
        case 10: {
            // The shape and the shadow of a lower one have rows between them.
            bool const shadowed = judge[i].bounds.y2 - judge[i].bounds.y1 >= 5 && Pick(3) != 0;
            judge.SetShadowed(i, shadowed), window.SetShadowed(shadowed);
            break;
        }
        default:
            bool const force = Pick(4) == 0;
            if (Pick(2) == 0)
                judge.Invalidate(i, nullptr), window.Invalidate();
            else
                judge.FullInvalidate(i, force), window.FullInvalidate(force);
        }
    }

    void Create()
    {
        int const parent = windows.empty() || Pick(2) == 0 ? 0 : PickWindow();
        GrRect bounds = PickRect(30);
        int const i = static_cast<int>(judge.windows.size());
        auto const area = (bounds.x2 - bounds.x1) * (bounds.y2 - bounds.y1);
        judge.windows.push_back(
            {parent, {}, bounds, std::vector<bool>(static_cast<std::size_t>(area), true)});
        judge.Link(i, parent);
        Expect(GrEventWindowCreated, i, bounds);
        Expect(GrEventWindowChanged, i, bounds);
        bool const negative = bounds.x1 == bounds.x2;
        windows[i] = std::make_unique<GrWindow>(&Real(parent), bounds.x1, bounds.y1,
            negative ? -5 : bounds.x2 - bounds.x1, bounds.y2 - bounds.y1,
            reinterpret_cast<void*>(static_cast<std::intptr_t>(i)));
    }

    void Destroy(int i)
    {
        while (!judge[i].children.empty())
            Destroy(judge[i].children.front());
        Expect(GrEventWindowDestroyed, i);
        if (judge[i].visible) judge.FullInvalidate(i, false);
        judge.Unlink(i);
        windows.erase(i);
    }

    void Move(int i)
    {
        int const dx = Pick(5) - 2, dy = Pick(5) - 2;
        if (dx != 0 || dy != 0) judge.Move(i, dx, dy);
        Real(i).Move(judge[i].bounds.x1, judge[i].bounds.y1);
        bool const isEmpty = !Real(i).region;
        if (dx != 0 || dy != 0) Expect(GrEventWindowChanged, i, isEmpty ? GrRect{} : judge[i].bounds);
    }

    /// Rows without gaps between them, of one or two ranges each.
    void Reshape(int i)
    {
        int const left = Pick(7) - 3, top = Pick(7) - 3;
        GrRegion region;
        for (int rows = (judge[i].shadowed ? 5 : 1) + Pick(12), y = top; y < top + rows; ++y) {
            int const a = left + Pick(6), b = a + 1 + Pick(12), c = b + 1 + Pick(4);
            region += GrRect{a, y, b, y + 1};
            if (Pick(2) == 0) region += GrRect{c, y, c + 1 + Pick(8), y + 1};
        }
        GrRect const corner = judge[i].bounds;
        GrRect bounds{};
        region.GetOuterRect(bounds);
        std::vector<bool> shape;
        for (int y = bounds.y1; y < bounds.y2; ++y)
            for (int x = bounds.x1; x < bounds.x2; ++x)
                shape.push_back(region.Contains(x, y));
        GrRect const moved{
            bounds.x1 + corner.x1, bounds.y1 + corner.y1, bounds.x2 + corner.x1, bounds.y2 + corner.y1};
        judge.Reshape(i, moved, shape);
        Expect(GrEventWindowChanged, i, moved);
        Real(i).SetWindowRegion(region);
    }

    void ChangeParent(int i)
    {
        int const parent = Pick(2) == 0 ? 0 : PickWindow();
        for (int ancestor = parent; ancestor >= 0; ancestor = judge[ancestor].parent)
            if (ancestor == i) return;
        judge.FullInvalidate(i, false), Real(i).FullInvalidate(false);
        judge.Unlink(i), judge.Link(i, parent), Real(i).SetParent(&Real(parent));
        judge.FullInvalidate(i, true), Real(i).FullInvalidate(true);
    }

    /// Both halves of one packet; acceleration and edges as on the device.
    void MoveMouse()
    {
        int const dx = Pick(31) - 15, dy = Pick(31) - 15;
        if (!screen.MoveMouse(dx, dy, Pick(20) == 0 ? 1 : 0, Pick(10) == 0 ? 1 : 0)) return;
        auto const accelerated = [](int delta) { return delta < -5 || delta > 5 ? 2 * delta : delta; };
        pointerX = std::clamp(pointerX + accelerated(dx), 0, kWidth);
        pointerY = std::clamp(pointerY + accelerated(dy), 0, kHeight);
    }

    /// What comes from outside of the tree: another console, another mode, another language.
    void Disturb()
    {
        switch (Pick(3)) {
        case 0:
#ifndef __SANITIZE_THREAD__  // keeps signals back
            screen.SwitchTo(2);
            while (screenVisible)
                std::this_thread::yield();
            EXPECT_FALSE(GrWindow::GetPaintEvent(nullptr));
            screen.SwitchTo(1);
            while (!screenVisible)
                std::this_thread::yield();
            EXPECT_TRUE(GrHasEvent());
            judge.FullInvalidate(0, true);
#endif
            break;
        case 1: {
            // The pointer goes back to the middle. This is read when all motion before it has taken effect.
            while (!screen.MoveMouse(0, 0, 0, 0))
                std::this_thread::yield();
            while (!screen.IsMouseRead())
                std::this_thread::yield();
            Sizes sizes;
            EXPECT_TRUE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 0));
            judge.valid.assign(judge.valid.size(), false);
            pointerX = kWidth / 2, pointerY = kHeight / 2;
            break;
        }
        default:
            char const* const languages[] = {"en", "de", "ja", "xx"};
            BundleApi::SetLanguage(languages[Pick(4)]);
        }
    }

    /// Takes one paint event, through the pump, and paints as an application does.
    bool TakePaint()
    {
        if (!GrWindow::GetPaintEvent(nullptr)) {
            EXPECT_EQ(std::count(judge.valid.begin(), judge.valid.end(), false), 0);
            return false;
        }
        GrEvent event;
        painter = this;
        EXPECT_TRUE(GrHasEvent() && GrGetEvent(event, &noWait));
        PaintAsTold(event);
        painter = nullptr;
        EXPECT_TRUE(told.empty());
        return true;
    }

    void Check()
    {
        EXPECT_EQ(events, wanted);
        events.clear(), wanted.clear();
        CheckValidAndFlags();
        if (Pick(2) == 0) {
            painter = this;
            GrWindow::RootWindow()->Repaint({});  // all that is due, whatever is asked for
            painter = nullptr;
            EXPECT_FALSE(GrWindow::GetPaintEvent(nullptr));
        }
        while (TakePaint() && !testing::Test::HasFailure()) {
        }
        CheckValidAndFlags();
        CheckScreen(judge.screen);
        CheckMouse();
        if (Pick(3) == 0) CheckAnew();
    }

    /// Painted anew, nothing stale remains: the screen is what the tree says.
    void CheckAnew()
    {
        judge.countPaints = false;
        judge.FullInvalidate(0, true), GrWindow::RootWindow()->FullInvalidate(true);
        while (TakePaint() && !testing::Test::HasFailure()) {
        }
        judge.screen = judge.Picture();
        CheckScreen(judge.screen);
        judge.countPaints = true;
    }

    void CheckScreen(std::vector<std::uint32_t> const& wantedScreen)
    {
        for (std::size_t i = 0; i < wantedScreen.size(); ++i) {
            std::uint32_t pixel = 0;
            std::memcpy(&pixel, GrScreen.fbMemory + i * 4, 4);
            ASSERT_EQ(pixel, wantedScreen[i]) << "pixel " << i % kWidth << ", " << i / kWidth;
        }
    }

    void CheckValidAndFlags()
    {
        for (int y = 0; y < kHeight; ++y)
            for (int x = 0; x < kWidth; ++x)
                ASSERT_EQ(ValidRegion.Contains(x, y), judge.valid[static_cast<std::size_t>(y * kWidth + x)])
                    << x << ", " << y;
        for (auto const& [i, window] : windows)
            ASSERT_EQ(window->flags,
                (judge[i].visible ? 1u : 0u) | (judge[i].invalidated ? 4u : 0u) |
                    (judge[i].shadowed ? 8u : 0u))
                << i;
    }

    void AwaitPointer()
    {
        int x = -1, y = -1;
        unsigned buttons = 0;
        auto const limit = std::chrono::steady_clock::now() + std::chrono::seconds(20);
        while ((x != pointerX || y != pointerY) && std::chrono::steady_clock::now() < limit) {
            std::this_thread::yield();
            GrGetCursorPos(x, y, buttons);
        }
        ASSERT_EQ(std::pair(x, y), std::pair(pointerX, pointerY)) << "where the pointer stands";
    }

    /// Nothing is due for paint, so all events are the mouse's.
    void CheckMouse()
    {
        AwaitPointer();
        GrEvent event;
        while (GrGetEvent(event, &noWait)) {
            bool const inside = event.x < kWidth && event.y < kHeight;
            ASSERT_EQ(Number(event.window), inside ? judge.At(event.x, event.y, false) : 0);
            ASSERT_LE(event.type, GrEventWheelDown);
        }
    }

    console::VirtualConsole& screen;
    std::mt19937 random;
    WindowJudge judge{kWidth, kHeight};
    std::map<int, std::unique_ptr<GrWindow>> windows;
    std::deque<WindowJudge::Paint> told;  // what the judge has said already
    std::string wanted;
    int pointerX = kWidth / 2, pointerY = kHeight / 2;
};

void PaintNow(GrEvent const& event) { painter->PaintAsTold(event); }

TEST(Windows, RandomTreesAreAsTheJudgeSays)
{
    char const* const steps = std::getenv("TESSELLA_SOAK");
    unsigned const seed = steps ? NewSeed() : 20261121;
    auto const outcome = OnConsole("44x36x32", nullptr, [&](console::VirtualConsole& screen) {
        SCOPED_TRACE(testing::Message() << "seed " << seed);
        Sizes sizes;
        ASSERT_TRUE(Init(sizes));
        Soak(screen, seed).Run(steps ? std::atoi(steps) : 40'000);
        GrDone();
    });
    EXPECT_EQ(outcome.err, "") << "assertions that failed";
}

}

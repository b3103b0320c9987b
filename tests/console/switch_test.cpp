#include <support/on_console.h>
#include <tessella.h>
#include <tessella/console_l.h>
#include <tessella/keyboard_device.h>
#include <tessella/screen_guard.h>
#include <tessella/session_state.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <functional>
#include <future>
#include <memory>
#include <mutex>
#include <random>
#include <thread>

// Switches between consoles: the program is on 1, and what others show is a colour.

namespace {

using console::Request;
using console::VirtualConsole;
using std::chrono::milliseconds;

timeval noWait{0, 0}, aMoment{0, 5};

void Sleep(int time) { std::this_thread::sleep_for(milliseconds(time)); }

void Await(char const* what, std::function<bool()> const& holds)
{
    for (int i = 0; i < 20'000; ++i, Sleep(1))
        if (holds()) return;
    std::fprintf(stderr, "never: %s\n", what);
    std::abort();
}

/// Runs `body` beside the application's thread, which alone takes signals.
template <typename Body>
std::thread Beside(Body body)
{
    return std::thread([body] {
        sigset_t all{};
        sigfillset(&all);
        pthread_sigmask(SIG_SETMASK, &all, nullptr);
        body();
    });
}

/// Leaves or returns, and waits for the program to have noticed.
void SwitchTo(VirtualConsole& screen, unsigned console)
{
    unsigned const answers = screen.Count(Request::ReleaseDisplay);
    screen.SwitchTo(console);
    Await("an answer", [&] { return screen.Count(Request::ReleaseDisplay) != answers; });
    Await("a switch", [&] { return screen.Tty().activeConsole == static_cast<int>(console); });
}

/// Patterns that tell each pixel's place, in strokes so small that a switch finds one under way.
void Paint(GrEvent const& event)
{
    if (event.type != GrEventPaint) return;
    GrWindow& window = *event.window;
    GrContext* const context = window.GetContext();
    for (int y = event.rect.y1; y < event.rect.y2; ++y)
        for (int x = event.rect.x1 & ~7; x < event.rect.x2; x += 8) {
            context->SetForeColor(GrMakeColor(
                static_cast<std::uint8_t>(x * 3), static_cast<std::uint8_t>(y * 5), window.parent ? 255 : 0));
            context->FillRegion(GrRect{x, y, x + 8, y + 1});
        }
    window.FreeContext(context);
}

void PaintAll()
{
    GrEvent event;
    while (GrWindow::GetPaintEvent(&event))
        Paint(event);
}

struct Desk {
    explicit Desk(VirtualConsole& console) : screen(console)
    {
        Sizes sizes;
        EXPECT_TRUE(Init(sizes));
        GrWindow::SetCallback(Paint);
        window = std::make_unique<GrWindow>(GrWindow::RootWindow(), 20, 10, 50, 30, nullptr);
        window->Show();
        auto shape = std::make_unique<GrImage>(16, 16, 0);
        std::fill_n(shape->pixels, 16 * 16 * shape->bytes, std::uint8_t{0xFF});
        auto mask = std::make_unique<GrBitmap>(16, 16);
        std::fill_n(mask->data, 32, std::uint8_t{0xFF});
        cursor.reset(GrCursor::CreateInstance(shape.release(), mask.release(), 0, 0));
        cursor->Activate();
        GrEvent event;
        while (GrGetEvent(event, &noWait))
            Paint(event);
    }
    ~Desk()
    {
        window.reset();
        cursor.reset();
        GrDone();
    }

    VirtualConsole& screen;
    std::unique_ptr<GrWindow> window;
    std::unique_ptr<GrCursor> cursor;
};

TEST(Switch, TheReturnPaintsAllAndForgetsHeldKeys)
{
    auto const outcome = OnConsole("160x120x16", nullptr, [](VirtualConsole& screen) {
        Desk desk(screen);
        auto const before = screen.Screen();
        screen.TypeKeys(std::array<unsigned char, 3>{42, 29, 58});  // shift, control and caps lock
        GrEvent event;
        while (event.vk != GrVkCapsLock)
            GrGetEvent(event, nullptr);
        EXPECT_EQ(sessionKeyboard->GetModifiers(), GrModShift | GrModControl | GrModCapsLock);
        for (unsigned const other : {2u, 9u}) {
            SwitchTo(screen, other);
            EXPECT_FALSE(screenVisible);
            auto const theirs = screen.Screen();
            EXPECT_NE(theirs.bytes, before.bytes);
            GrWindow::RootWindow()->Invalidate();
            GrWindow::RootWindow()->Repaint(GrRegion());
            EXPECT_FALSE(GrHasEvent() || GrGetEvent(event, &noWait));
            EXPECT_EQ(screen.Screen().bytes, theirs.bytes) << "nobody draws on it";
            EXPECT_FALSE(std::async([] { return screenMutex.try_lock(); }).get()) << "kept";

            SwitchTo(screen, 1);
            EXPECT_TRUE(screenVisible && desk.window->IsInvalidated());
            EXPECT_EQ(sessionKeyboard->GetModifiers(), GrModCapsLock);
            desk.window->Invalidate();
            EXPECT_TRUE(GrHasEvent());
            PaintAll();
            EXPECT_FALSE(desk.window->IsInvalidated());
            EXPECT_EQ(screen.Screen().bytes, before.bytes);
            EXPECT_TRUE(std::async([] {
                std::unique_lock const lock(screenMutex, std::try_to_lock);
                return lock.owns_lock();
            }).get());
        }
        auto user = Beside([&] {
            Sleep(20);
            SwitchTo(screen, 3);
            SwitchTo(screen, 1);
        });
        while (!GrGetEvent(event, nullptr)) {  // the return wakes it
        }
        EXPECT_EQ(event.type, GrEventPaint);
        user.join();

        while (GrGetEvent(event, &aMoment))
            Paint(event);
        screen.SetFault(Request::ReleaseDisplay, EINVAL);
        raise(SIGUSR2);
        raise(SIGUSR2);
        Await("both", [] { return !!screenVisible; });
        EXPECT_TRUE(GrHasEvent()) << "the flags move on";
    });
    EXPECT_EQ(outcome.out, "\a\a");
}

TEST(Switch, LeavingWaitsForDrawingOnAnotherThreadAndDropsWhatIsAskedMeanwhile)
{
    auto const outcome = OnConsole("160x120x16", nullptr, [](VirtualConsole& screen) {
        Desk desk(screen);
        auto const before = screen.Screen();
        std::atomic<bool> done{false};
        static std::atomic<int> asked{0};
        auto worker = Beside([&] {
            {
                GrScreenGuard const guard(GrRect{0, 0, 160, 120});
                for (int i = 1; i <= 3; ++i) {
                    signal(SIGUSR2, [](int number) {
                        ++asked;
                        GrConsoleSignal(number);
                    });
                    screen.SwitchTo(2);
                    Await("a request", [&] { return asked == i; });
                    Sleep(20);
                    EXPECT_TRUE(screenVisible && screen.Tty().activeConsole == 1);
                    GrConsoleSignal(SIGUSR2);
                    struct sigaction installed {};
                    sigaction(SIGUSR2, nullptr, &installed);
                    EXPECT_EQ(installed.sa_handler, GrConsoleSignal) << "busy, but installed again";
                }
            }
            Await("release", [&] { return screen.Tty().activeConsole == 2; });
            Sleep(20);
            EXPECT_FALSE(screenVisible) << "a repeated request is no return";
            SwitchTo(screen, 1);
            done = true;
        });
        for (GrEvent event; !done;)
            if (GrGetEvent(event, &aMoment)) Paint(event);
        worker.join();
        PaintAll();
        EXPECT_EQ(screen.Screen().bytes, before.bytes);
    });
    EXPECT_EQ(outcome.out, "") << "no answer is refused";
}

TEST(Switch, OneSignalMayTellOfTheReturnAndOfTheNextRequest)
{
    OnConsole("160x120x16", nullptr, [](VirtualConsole& screen) {
        Desk desk(screen);
        sigset_t signals{};
        sigaddset(&signals, SIGUSR2);
        for (bool const starting : {true, false}) {
            if (starting) SwitchTo(screen, 2);
            pthread_sigmask(SIG_BLOCK, &signals, nullptr);
            screen.SwitchTo(1);
            screen.SwitchTo(2);
            pthread_sigmask(SIG_UNBLOCK, &signals, nullptr);
            EXPECT_EQ(screen.Tty().activeConsole, 2);
            EXPECT_FALSE(screenVisible || GrHasEvent());
        }
        SwitchTo(screen, 1);
        EXPECT_TRUE(screenVisible && GrHasEvent());
    });
}

TEST(Switch, AStormDuringDrawingAndMotion)
{
    char const* const wish = std::getenv("TESSELLA_STORM");
    int const count = wish ? std::atoi(wish) / 1000 : 100;
    auto const outcome = OnConsole("160x120x32", nullptr, [&](VirtualConsole& screen) {
        Desk desk(screen);
        std::atomic<bool> over{false};
        std::mutex motion;
        auto mouse = Beside([&] {
            for (int i = 0; !over; ++i, std::this_thread::yield()) {
                std::scoped_lock const lock(motion);
                screen.MoveMouse(i / 50 % 2 * 2 - 1, i / 30 % 2 * 2 - 1);
            }
        });
        auto user = Beside([&] {
            std::mt19937 random(11);
            for (int i = 0; i < count; ++i) {
#ifdef __SANITIZE_THREAD__  // hands no signal to a thread that waits for a mutex, as the frozen one does
                std::scoped_lock const noMotion(motion);
                Await("rest", [&] { return screen.IsMouseRead(); });
                Sleep(10);
#endif
                SwitchTo(screen, 2 + random() % 3);
                if (random() % 2) std::this_thread::sleep_for(std::chrono::microseconds(random() % 2000));
                SwitchTo(screen, 1);
                if (random() % 2) std::this_thread::sleep_for(std::chrono::microseconds(random() % 4000));
            }
            over = true;
        });
        for (GrEvent event; !over;) {
            if (!GrGetEvent(event, &aMoment)) continue;
            Paint(event);
            if (event.type == GrEventMouseMove) desk.window->Move(event.x - 90, event.y - 50);
        }
        user.join();
        mouse.join();
        auto const settle = [&] {
            Await("room", [&] { return screen.MoveMouse(0, 0, 1); });  // behind all motion
            for (GrEvent event; event.type != GrEventWheelUp;)
                if (GrGetEvent(event, &aMoment)) Paint(event);
            PaintAll();
            return screen.Screen().bytes;
        };
        // Once more from the start, then from under the cursor.
        for (int const step : {-40, 40}) {
            auto const picture = settle();
            GrWindow::RootWindow()->FullInvalidate(true);
            EXPECT_EQ(settle() == picture, true);
            screen.MoveMouse(step, 0);
        }
    });
    EXPECT_EQ(outcome.out, "");
}

}

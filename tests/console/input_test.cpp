#include <support/on_console.h>
#include <tessella.h>
#include <tessella/mouse.h>
#include <tessella/screen_guard.h>

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <chrono>
#include <cstdlib>
#include <functional>
#include <sstream>
#include <thread>

// The mouse and the pump on the virtual console: packets go in at the device, events come out of the loop.

namespace {

using std::chrono::milliseconds;

timeval noWait{0, 0};

bool WaitUntil(std::function<bool()> const& holds)
{
    for (int i = 0; i < 20'000; ++i, std::this_thread::sleep_for(milliseconds(1)))
        if (holds()) return true;
    return false;
}

/// Starts a session with nothing due and the first move, to where the pointer stands, taken.
void Start()
{
    Sizes sizes;
    ASSERT_TRUE(Init(sizes));
    GrEvent event;
    while (GrGetEvent(event, &noWait)) {
    }
}

/// Waits for so many mouse events; "kind@x,y" each.
std::string Take(int count)
{
    std::ostringstream text;
    GrEvent event;
    timeval aWhile{20, 0};
    for (int falses = 0; count > 0 && falses < 100;) {
        if (GrGetEvent(event, &aWhile)) {
            text << event.type << '@' << event.x << ',' << event.y << ' ';
            --count;
        } else {
            ++falses;  // each packet's wake-up may show itself once
        }
    }
    return text.str();
}

TEST(Mouse, DecodesEveryPacket)
{
    for (int byte = 0; byte < 256; ++byte) {
        auto const any = static_cast<unsigned char>(byte);
        std::array<unsigned char, 4> const packet{any, any, any, any};
        MousePacket const wheel = DecodeMousePacket(packet);
        EXPECT_EQ(wheel.buttons, 7u - ((byte & 1) * 4u + (byte >> 1 & 1)));
        EXPECT_EQ(wheel.dx, byte < 128 ? byte : byte - 256);
        EXPECT_EQ(wheel.dy, -wheel.dx) << "128 downward is possible";
        EXPECT_EQ(wheel.wheel, (byte & 15) == 1 ? -1 : (byte & 15) == 15 ? 1 : 0);
        EXPECT_EQ(DecodeMousePacket(std::span(packet).first(3)).wheel, 0);
    }
}

TEST(Mouse, PacketsBecomeEvents)
{
    OnConsole("1024x768x16", nullptr, [](console::VirtualConsole& screen) {
        Sizes sizes;
        ASSERT_TRUE(Init(sizes));
        EXPECT_EQ(screen.Mouse().protocol, console::MouseProtocol::Wheel);
        EXPECT_EQ(hideCount, 0u) << "the pointer is in use";
        GrEvent event;
        ASSERT_TRUE(GrGetEvent(event, &noWait));
        EXPECT_EQ(event.type, GrEventPaint);
        EXPECT_EQ(event.rect, (GrRect{0, 0, 1024, 768}));
        EXPECT_EQ(event.window, GrWindow::RootWindow());
        EXPECT_EQ(Take(1), "1@512,384 ") << "the first move tells the middle";

        int x, y;
        unsigned buttons;
        GrGetCursorPos(x, y, buttons);
        EXPECT_EQ(buttons, 0u) << "before the first click";
        struct Case {
            int dx, dy, wheel;
            unsigned buttons;
            int count;
            char const* text;
        };
        for (auto const& c : {
                 Case{5, -5, 0, 0, 1, "1@517,379 "},
                 Case{6, -6, 0, 0, 1, "1@529,367 "},
                 Case{0, 0, 1, 0, 1, "128@529,367 "},
                 Case{0, 0, -1, 0, 1, "256@529,367 "},
                 Case{3, 0, 0, 1, 2, "1@532,367 2@532,367 "},
                 Case{0, 0, 0, 2, 2, "4@532,367 8@532,367 "},     // two buttons in one packet
                 Case{0, 0, 1, 4, 2, "16@532,367 128@532,367 "},  // the middle one is not known
                 Case{127, 127, 0, 0, 1, "1@786,621 "},
                 Case{127, 127, 0, 0, 1, "1@1024,768 "},  // one past the edges
                 Case{-1, 0, 0, 0, 1, "1@1023,768 "},
             }) {
            SCOPED_TRACE(c.text);
            ASSERT_TRUE(screen.MoveMouse(c.dx, c.dy, c.wheel, c.buttons));
            EXPECT_EQ(Take(c.count), c.text);
        }
        GrGetCursorPos(x, y, buttons);
        EXPECT_EQ(buttons, 7u);

        // Where the pointer has gone meanwhile comes after the click, in one event.
        screen.MoveMouse(-4, 0, 0, 1), screen.MoveMouse(-4, 0, 0, 1), screen.MoveMouse(-3, -2, 0, 1);
        ASSERT_TRUE(WaitUntil([&] { return GrGetCursorPos(x, y, buttons), x == 1012; }));
        EXPECT_EQ(buttons, 3u);
        EXPECT_EQ(Take(3), "1@1019,768 2@1019,768 1@1012,766 ");
        EXPECT_FALSE(GrHasEvent());
        GrDone();
    });
}

TEST(Mouse, QueueKeeps127ChangesAndLosesTheRest)
{
    OnConsole("320x200x8", nullptr, [](console::VirtualConsole& screen) {
        Start();
        std::size_t waiting = 0;
        int x, y, sentX = 160;
        unsigned buttons;
        // What is queued and what is lost follows from what was sent and taken before.
        for (int const burst : {100, 20, 300, 128, 127, 1}) {
            for (int i = 0; i < burst; ++i)
                ASSERT_TRUE(WaitUntil([&] { return screen.MoveMouse(0, 0, i % 2 == 0 ? 1 : -1); }));
            int const step = sentX == 160 ? 1 : -1;
            ASSERT_TRUE(WaitUntil([&] { return screen.MoveMouse(step, 0); }));
            sentX += step;
            ASSERT_TRUE(WaitUntil([&] { return GrGetCursorPos(x, y, buttons), x == sentX; }));
            waiting = std::min<std::size_t>(waiting + static_cast<std::size_t>(burst), 127);
            std::size_t const served = burst == 128 ? 40 : waiting / 2;
            GrEvent event;
            for (std::size_t i = 0; i < served;) {
                ASSERT_TRUE(GrGetEvent(event, &noWait));
                i += event.type != GrEventMouseMove;
            }
            waiting -= served;
        }
        GrEvent event;
        std::size_t left = 0;
        while (GrGetEvent(event, &noWait))
            left += event.type != GrEventMouseMove;
        EXPECT_EQ(left, waiting);
        GrDone();
    });
}

TEST(Mouse, WithoutADeviceThereIsNoPointer)
{
    auto const outcome = OnConsole("320x200x8", nullptr, [](console::VirtualConsole& screen) {
        screen.SetFault(console::Request::OpenMouse, ENODEV);
        Start();
        EXPECT_EQ(screen.CountOpens("/dev/mice") + screen.CountOpens("/dev/input/mice"), 2u);
        EXPECT_EQ(hideCount, 1u);
        GrMouseReport(3, 9, 9, 1);
        EXPECT_FALSE(GrHasEvent());
        GrDone();
    });
    EXPECT_EQ(outcome.err, "");
    OnConsole("320x200x8", nullptr, [](console::VirtualConsole& screen) {
        screen.SetPathFault("/dev/mice", ENOENT);
        Start();
        screen.MoveMouse(1, 0);
        EXPECT_EQ(Take(1), "1@161,100 ");
        GrDone();
        EXPECT_FALSE(GrWindow::RootWindow() == nullptr);
    });
}

/// How many milliseconds a call takes that finds nothing.
long Waited(timeval timeout)
{
    GrEvent event;
    auto const begin = std::chrono::steady_clock::now();
    EXPECT_FALSE(GrGetEvent(event, &timeout));
    return std::chrono::duration_cast<milliseconds>(std::chrono::steady_clock::now() - begin).count();
}

TEST(Pump, WaitsAreCountedInMillisecondsAndEndedByWakeUps)
{
    OnConsole("320x200x8", nullptr, [](console::VirtualConsole& screen) {
        Start();
        EXPECT_GE(Waited({0, 120}), 120) << "milliseconds";
        EXPECT_LT(Waited({0, 9'000}), 5'000) << "whole thousands do not count";
        EXPECT_GE(Waited({1, 2'100}), 1'100);

        screen.MoveMouse(1, 0);
        int x, y;
        unsigned buttons;
        ASSERT_TRUE(WaitUntil([&] { return GrGetCursorPos(x, y, buttons), x == 161; }));
        std::this_thread::sleep_for(milliseconds(20));  // the wake-up is posted behind the move
        GrEvent event;
        EXPECT_TRUE(GrGetEvent(event, nullptr));
        EXPECT_FALSE(GrGetEvent(event, nullptr)) << "the wake-up of input that has been taken";
        EXPECT_GE(Waited({0, 50}), 50);
        GrUnfreeze();
        EXPECT_FALSE(GrGetEvent(event, nullptr)) << "unfrozen before it waits";
        EXPECT_GE(Waited({0, 50}), 50);
        GrDone();
    });
}

TEST(Pump, OtherThreadsBorrowTheLibraryWhileItSleeps)
{
    OnConsole("320x200x8", nullptr, [](console::VirtualConsole&) {
        Start();
        GrWindow::SetCallback([](GrEvent const&) {});
        for (bool const unfreeze : {true, false}) {
            std::unique_ptr<GrWindow> window;
            std::thread worker([&] {
                GrGrabInput();
                GrGrabInput();
                window = std::make_unique<GrWindow>(GrWindow::RootWindow(), 9, 9, 20, 20, nullptr);
                window->Show();
                GrUngrabInput(false);
                GrUngrabInput(unfreeze);
            });
            GrEvent event;
            timeval timeout{unfreeze ? 60 : 0, unfreeze ? 0 : 300};
            auto const begin = std::chrono::steady_clock::now();
            EXPECT_FALSE(GrGetEvent(event, &timeout)) << "a call that waits does not turn to paint";
            EXPECT_EQ(std::chrono::steady_clock::now() - begin < milliseconds(300), unfreeze);
            worker.join();
            ASSERT_TRUE(GrGetEvent(event, &noWait));
            EXPECT_EQ(event.window, window.get());
            GrGrabInput();
            GrUngrabInput(false);
            window.reset();
            EXPECT_TRUE(GrGetEvent(event, &noWait));
        }
        GrDone();
    });
}

/// Sends button changes at full speed, each one pixel from the one before, and then turns the wheel until it
/// is told to end: a change that finds the queue full wakes nobody.
class Storm {
public:
    Storm(console::VirtualConsole& screen, int count)
        : thread([this, &screen, count] { Send(screen, count); })
    {}
    ~Storm() { thread.join(); }

    int Sent() const { return sent; }
    bool HasEnded() const { return ended; }
    void End() { ended = true; }

private:
    void Send(console::VirtualConsole& screen, int count)
    {
        for (int i = 0; i < count; ++i) {
            while (!screen.MoveMouse(i / 500 % 2 == 0 ? 1 : -1, 0, 0, i % 2 == 0 ? 1 : 0))
                std::this_thread::yield();
            ++sent;
        }
        for (; !ended; std::this_thread::sleep_for(milliseconds(1)))
            screen.MoveMouse(0, 0, 1, 0);
    }

    std::atomic<int> sent{0};
    std::atomic<bool> ended{false};
    std::thread thread;
};

/// Where the pointer is at a change, and whether the button is pressed there.
std::pair<int, bool> PlaceOf(int change)
{
    return {512 + (change / 500 % 2 == 0 ? change % 500 + 1 : 499 - change % 500), change % 2 == 0};
}

TEST(Pump, AStormOfPacketsLosesOnlyWhatTheQueueCannotHold)
{
    char const* const wish = std::getenv("TESSELLA_STORM");
    int const count = wish ? std::atoi(wish) : 30'000;
    for (bool const busy : {false, true})
        OnConsole("1024x768x16", nullptr, [&](console::VirtualConsole& screen) {
            Start();
            Storm storm(screen, count);
            int served = 0, moves = 0, next = 0, most = 0;
            for (GrEvent event; !storm.HasEnded();) {
                if (busy && served % 1000 == 0) std::this_thread::sleep_for(milliseconds(3));
                if (!GrGetEvent(event, nullptr)) continue;
                if (event.type == GrEventMouseMove) ++moves;
                if (event.type == GrEventWheelUp) storm.End();
                if (event.type != GrEventLeftDown && event.type != GrEventLeftUp) continue;
                while (next < count && PlaceOf(next) != std::pair(event.x, event.type == GrEventLeftDown))
                    ++next;
                ASSERT_LT(next++, count) << "an event that nobody sent, or not in this order";
                ++served;
                most = std::max(most, storm.Sent() - served);
            }
            EXPECT_LE(moves, count + 1) << "moves are folded";
            EXPECT_TRUE(most >= 100 || served == count) << "lost with room in the queue";
            GrDone();
        });
}

TEST(Mouse, AModeChangesUnderAMovingMouse)
{
    OnConsole("64x48x32", nullptr, [](console::VirtualConsole& screen) {
        Start();
        std::atomic<bool> stop{false};
        std::thread mover([&] {
            for (int i = 0; !stop; ++i)
                screen.MoveMouse(i % 7 - 3, i % 5 - 2);
        });
        for (int i = 0; i < 300; ++i) {
            screen.ChangeMode(*console::ParseMode(i % 2 == 0 ? "32x16x8" : "64x48x32"));
            Sizes sizes;
            ASSERT_TRUE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 0));
            GrEvent event;
            ASSERT_TRUE(GrGetEvent(event, &noWait));
            EXPECT_EQ(event.rect, (GrRect{0, 0, i % 2 == 0 ? 32 : 64, i % 2 == 0 ? 16 : 48}));
        }
        stop = true;
        mover.join();
        GrDone();
    });
}

}

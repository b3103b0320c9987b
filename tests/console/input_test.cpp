#include <support/on_console.h>
#include <tessella.h>
#include <tessella/event_wait_l.h>
#include <tessella/mouse.h>
#include <tessella/screen_guard.h>
#include <tessella/session_state.h>

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <bit>
#include <chrono>
#include <climits>
#include <cstdlib>
#include <deque>
#include <filesystem>
#include <fstream>
#include <functional>
#include <sstream>
#include <thread>

#include <fcntl.h>
#include <unistd.h>

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
        int const value = byte < 128 ? byte : byte - 256;
        auto const decode = [](auto... bytes) {
            return DecodeMousePacket(std::array<unsigned char, sizeof...(bytes)>{bytes...});
        };
        unsigned char const rest = 0x38;
        EXPECT_EQ(decode(any, rest, rest, rest).buttons, 7u - ((byte & 1) * 4u + (byte >> 1 & 1)));
        EXPECT_EQ(decode(rest, any, rest, rest).dx, value);
        EXPECT_EQ(decode(rest, rest, any, rest).dy, -value) << "128 downward is possible";
        EXPECT_EQ(decode(rest, rest, rest, any).wheel, (byte & 15) == 1 ? -1 : (byte & 15) == 15 ? 1 : 0);
        EXPECT_EQ(decode(any, any, any).wheel, 0);
    }
}

/// How many signals the process' other threads keep out, at least.
int SignalsBlockedElsewhere()
{
    int least = 64;
    for (auto const& task : std::filesystem::directory_iterator("/proc/self/task")) {
        std::ifstream status(task.path() / "status");
        std::uint64_t mask = 0;
        for (std::string word; status >> word;)
            if (word == "SigBlk:") status >> std::hex >> mask;
        if (task.path().filename() != std::to_string(getpid())) least = std::min(least, std::popcount(mask));
    }
    return least;
}

TEST(Mouse, PacketsBecomeEvents)
{
    OnConsole("1024x768x16", nullptr, [](console::VirtualConsole& screen) {
        Sizes sizes;
        ASSERT_TRUE(Init(sizes));
        EXPECT_EQ(screen.Mouse().protocol, console::MouseProtocol::Wheel);
        EXPECT_EQ(hideCount, 0u) << "the pointer is in use";
        EXPECT_GE(SignalsBlockedElsewhere(), 60) << "all that can be";
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

TEST(Mouse, QueueKeepsTheOldest127Changes)
{
    OnConsole("1024x768x8", nullptr, [](console::VirtualConsole& screen) {
        Start();
        std::deque<int>
            queued;  // where each change happened; what is lost follows from what was sent and taken
        int sentX = 512, x = 0, y = 384;
        unsigned buttons;
        for (int const burst : {100, 20, 300, 128, 127, 1}) {
            for (int i = 0; i < burst; ++i) {
                int const step = i < burst / 2 ? 1 : -1;
                ASSERT_TRUE(WaitUntil([&] { return screen.MoveMouse(step, 0, i % 2 == 0 ? 1 : -1); }));
                sentX += step;
                if (queued.size() < 127) queued.push_back(sentX);
            }
            int const row = y + 5;
            ASSERT_TRUE(WaitUntil([&] { return screen.MoveMouse(0, 5); }));
            ASSERT_TRUE(WaitUntil([&] { return GrGetCursorPos(x, y, buttons), y == row; }));
            EXPECT_EQ(x, sentX) << "the position is never lost";
            EXPECT_TRUE(GrHasEvent());
            GrEvent event;
            for (std::size_t const keep = burst == 128 ? 87 : queued.size() / 2; queued.size() > keep;) {
                ASSERT_TRUE(GrGetEvent(event, &noWait));
                if (event.type == GrEventMouseMove) continue;
                ASSERT_EQ(event.x, queued.front());
                queued.pop_front();
            }
        }
        EXPECT_EQ(queued.size(), 32u);
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
        GrEvent event;
        EXPECT_FALSE(GrHasEvent() || GrGetEvent(event, &noWait));
        std::uint32_t kind, time;
        int x, y;
        EXPECT_FALSE(GrMousePop(&kind, &x, &y, &time)) << "as long as the pointer is not in use";
        GrDone();
    });
    EXPECT_EQ(outcome.err, "");
    OnConsole("320x200x8", nullptr, [](console::VirtualConsole& screen) {
        screen.SetPathFault("/dev/mice", ENOENT);
        Start();
        screen.MoveMouse(1, 0);
        EXPECT_EQ(Take(1), "1@161,100 ");
        GrDone();
        EXPECT_EQ(fcntl(mouseFd, F_GETFD), -1) << "the device is closed";
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
        GrUnfreeze();
        GrUnfreeze();
        EXPECT_FALSE(GrGetEvent(event, nullptr));
        EXPECT_FALSE(GrGetEvent(event, nullptr)) << "each is counted";

        screenVisible = false;
        GrWindow::RootWindow()->FullInvalidate(true);
        EXPECT_FALSE(GrHasEvent()) << "nothing is painted while somebody else has the console";
        std::thread waker([] {
            std::this_thread::sleep_for(milliseconds(30));
            screenVisible = true;
            GrPostInputWake();
        });
        EXPECT_GE(Waited({0, 150}), 150) << "a call that waits does not turn to paint";
        waker.join();
        EXPECT_TRUE(GrHasEvent());
        ASSERT_TRUE(GrGetEvent(event, nullptr));
        std::thread unfreezer([] {
            std::this_thread::sleep_for(milliseconds(30));
            GrUnfreeze();
        });
        EXPECT_GE(Waited({LONG_MAX, 0}), 20) << "for ever";
        unfreezer.join();
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
            std::atomic<bool> mayWake{unfreeze};
            std::thread worker([&] {
                GrGrabInput();
                GrGrabInput();
                window = std::make_unique<GrWindow>(GrWindow::RootWindow(), 9, 9, 20, 20, nullptr);
                window->Show();
                GrUngrabInput(false);
                GrUngrabInput(unfreeze);
                if (unfreeze) return;
                std::this_thread::sleep_for(milliseconds(50));
                mayWake = true;
                GrUnfreeze();
            });
            GrEvent event;
            EXPECT_FALSE(GrGetEvent(event, nullptr));
            EXPECT_TRUE(mayWake) << "woken by giving the library back";
            worker.join();
            ASSERT_TRUE(GrGetEvent(event, &noWait));
            EXPECT_EQ(event.window, window.get());
            window.reset();
            EXPECT_TRUE(GrGetEvent(event, &noWait));
        }
        GrDone();
    });
}

/// Sends button changes, each one pixel from the one before, and then turns the wheel until it is told to
/// end: a change that finds the queue full wakes nobody.
class Storm {
public:
    /// Sends as fast as the device takes packets, but never has more than `lead` of them unserved.
    Storm(console::VirtualConsole& screen, int count, int lead)
        : thread([this, &screen, count, lead] { Send(screen, count, lead); })
    {}
    ~Storm()
    {
        ended = true;
        thread.join();
    }

    std::atomic<int> served{0};
    std::atomic<bool> ended{false};

private:
    void Send(console::VirtualConsole& screen, int count, int lead)
    {
        for (int i = 0; i < count && !ended; ++i)
            while (!ended &&
                (i - served >= lead ||
                    !screen.MoveMouse(i / 500 % 2 == 0 ? 1 : -1, 0, 0, i % 2 == 0 ? 1 : 0)))
                std::this_thread::yield();
        for (; !ended; std::this_thread::sleep_for(milliseconds(1)))
            screen.MoveMouse(0, 0, 1, 0);
    }

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
            Storm storm(screen, count, busy ? count : 127);
            for (int next = 0; !storm.ended;) {
                GrEvent event;
                if (busy && storm.served % 1000 == 0) std::this_thread::sleep_for(milliseconds(3));
                event.modifiers = 9;
                if (!GrGetEvent(event, nullptr)) continue;
                EXPECT_EQ(event.modifiers, 0u);
                if (event.type == GrEventWheelUp) storm.ended = true;
                if (event.type != GrEventLeftDown && event.type != GrEventLeftUp) continue;
                while (next < count && PlaceOf(next) != std::pair(event.x, event.type == GrEventLeftDown))
                    ++next;
                ASSERT_LT(next++, count) << "an event that nobody sent, or not in this order";
                ++storm.served;
            }
            if (!busy) {
                EXPECT_EQ(storm.served, count) << "lost with room in the queue";
            }
            GrDone();
        });
}

TEST(Mouse, AModeChangesUnderAMovingMouseAndItsCursor)
{
    OnConsole("64x48x32", nullptr, [](console::VirtualConsole& screen) {
        Start();
        static GrRect changed;
        GrWindow::SetCallback([](GrEvent const& event) { changed = event.rect; });
        std::atomic<bool> stop{false};
        std::thread mover([&] {
            for (int i = 0; !stop; ++i)
                screen.MoveMouse(i % 7 - 3, i % 5 - 2);
        });
        for (int i = 0; i < 300; ++i) {
            screen.ChangeMode(*console::ParseMode(i % 2 == 0 ? "32x16x8" : "64x48x32"));
            Sizes sizes;
            EXPECT_TRUE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 0));
            GrEvent event;
            EXPECT_TRUE(GrGetEvent(event, &noWait));
            EXPECT_EQ(changed, event.rect);
            EXPECT_EQ(event.rect, (GrRect{0, 0, i % 2 == 0 ? 32 : 64, i % 2 == 0 ? 16 : 48}));
            std::unique_ptr<GrCursor> const cursor(
                GrCursor::CreateInstance(new GrImage(9, 9, GrImageHasAlpha), nullptr, 4, 4));
            cursor->Activate();
            GrScreen.context->FillRegion(event.rect);
        }
        stop = true;
        mover.join();
        Sizes sizes;
        EXPECT_TRUE(WaitUntil([&] {  // packets are still on their way
            EXPECT_TRUE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 0));
            int x, y;
            unsigned buttons;
            GrGetCursorPos(x, y, buttons);
            return x == 32 && y == 24;
        })) << "the middle";
        GrDone();
    });
}

}

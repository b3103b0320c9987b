#include <support/on_console.h>
#include <tessella.h>
#include <tessella/cursor_state.h>
#include <tessella/keyboard_device.h>
#include <tessella/mouse_emulation.h>
#include <tessella/screen_guard.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <random>
#include <thread>

// The pointer moved by keys, with and without a mouse. Each byte of the keyboard is taken by itself, and what
// comes of it compared with a model of an English keyboard.

namespace {

using Log = std::vector<std::array<int, 3>>;  // kind, x, y of events; -1 and the state for notices

constexpr int kWidth = 640, kHeight = 400;
timeval noWait{0, 0};

struct Model {
    bool hasMouse, active = false;
    int dx = 0, dy = 0, x = kWidth / 2, y = kHeight / 2, strokes = 0, longest = 0, buttons = 7;
    std::pair<int, int> told = hasMouse ? std::pair(x, y) : std::pair(0, 0);

    Log Type(int key, bool pressed, unsigned modifiers)
    {
        Log log;
        int const before = buttons;
        if (pressed &&
            (key == 68 || (key == 50 && modifiers & 8) || (key == 69 && (modifiers & 0x33) == 0x11)))
            log.push_back({-1, active = !active, 0});
        else if (active)
            Apply(key == 76 && (modifiers & 0x41) == 0x40 ? 0 : key, pressed);
        else
            log.push_back({pressed ? 512 : 513, 0, 0});
        if (!hasMouse && !active) return log;
        if (std::exchange(told, {x, y}) != std::pair(x, y)) log.push_back({1, x, y});
        for (auto const& [bit, kind] : {std::pair{4, 2}, {1, 8}})
            if ((before ^ buttons) & bit) log.push_back({buttons & bit ? kind * 2 : kind, x, y});
        return log;
    }

    void Apply(int key, bool pressed)
    {
        static std::map<int, std::pair<int, int>> const kWays = {{105, {-1, 0}}, {75, {-1, 0}}, {106, {1, 0}},
            {77, {1, 0}}, {103, {0, -1}}, {72, {0, -1}}, {108, {0, 1}}, {80, {0, 1}}, {71, {-1, -1}},
            {73, {1, -1}}, {79, {-1, 1}}, {81, {1, 1}}};
        static std::map<int, int> const kButtons = {{57, 4}, {28, 4}, {96, 4}, {76, 4}, {127, 1}};
        static int const kPixels[] = {0, 5, 5, 5, 5, 5, 5, 12, 12, 14, 14, 16, 16, 18, 18, 20};
        auto const [wayX, wayY] = kWays.contains(key) ? kWays.at(key) : std::pair(0, 0);
        int const button = kButtons.contains(key) ? kButtons.at(key) : 0;
        if (wayX) dx = pressed * wayX;
        if (wayY) dy = pressed * wayY;
        strokes = dx || dy ? strokes + (pressed && (wayX || wayY)) : 0;
        longest = std::max(longest, strokes);
        buttons = pressed ? buttons & ~button : buttons | button;
        x = std::clamp(x + dx * kPixels[std::min(strokes, 15)], 0, kWidth);
        y = std::clamp(y + dy * kPixels[std::min(strokes, 15)], 0, kHeight);
    }
};

void Note(void* log, bool active) { static_cast<Log*>(log)->push_back({-1, active, 0}); }

void Take(console::VirtualConsole& screen, unsigned char byte, Log& seen)
{
    ASSERT_TRUE(screen.TypeKeys(std::array{byte}));
    while (!sessionKeyboard->HasKey())
        std::this_thread::yield();
    for (GrEvent event; GrGetEvent(event, &noWait); event = {}) {
        EXPECT_TRUE(event.vk == 0 || event.type >= GrEventKeyDown) << "left by a key for the pointer";
        seen.push_back({static_cast<int>(event.type), event.x, event.y});
    }
}

TEST(Emulation, MovesThePointerWhileItIsOnAndKeepsTheKeys)
{
    for (bool const hasMouse : {false, true})
        OnConsole("640x400x8", nullptr, [&](console::VirtualConsole& screen) {
            Log seen;
            GrSetMouseEmulationNotify(Note, &seen);  // there is no keyboard yet
            if (!hasMouse) screen.SetFault(console::Request::OpenMouse, ENODEV);
            Sizes sizes;
            ASSERT_TRUE(Init(sizes));
            for (GrEvent event; GrGetEvent(event, &noWait);) {
            }
            GrSetMouseEmulationNotify(Note, &seen);
            EXPECT_EQ(std::exchange(seen, {}), (Log{{-1, 0, 0}}));
            Model model{hasMouse};
            std::mt19937 random(3);
            int const keys[] = {105, 106, 103, 108, 71, 72, 73, 75, 76, 76, 77, 79, 80, 81, 105, 106, 103,
                108, 57, 28, 96, 127, 50, 69, 29, 42, 54, 56, 100, 30, 82, 87};
            for (int i = 0; i < 5000 && !testing::Test::HasFailure(); ++i, seen.clear()) {
                int const key = random() % 60 == 0 ? 68 : keys[random() % std::size(keys)];
                bool const pressed = random() % 3 != 0;
                Log const expected = model.Type(key, pressed, sessionKeyboard->GetModifiers());
                Take(screen, static_cast<unsigned char>(pressed ? key : key | 128), seen);
                EXPECT_EQ(seen, expected) << "byte " << i << " of key " << key;
                EXPECT_EQ(hideCount == 0 && cursorVisible, hasMouse || model.active);
            }
            EXPECT_GT(model.longest, 15);
            GrSetMouseEmulationNotify(nullptr, nullptr);
            GrEvent const otherLayouts{.type = GrEventKeyDown, .vk = 'M', .modifiers = GrModControl};
            EXPECT_TRUE(GrMouseEmulationFilter(sessionKeyboard, otherLayouts));
            EXPECT_EQ(sessionKeyboard->emulationActive, !model.active);
            EXPECT_EQ(seen, Log{}) << "nobody is told any more";
            GrDone();
        });
}

}

#include <tessella/mouse_emulation.h>

#include <tessella/event.h>
#include <tessella/keyboard.h>
#include <tessella/keyboard_device.h>
#include <tessella/mouse.h>

#include <algorithm>

std::uint32_t emulatedButtons = 7;

namespace {

constexpr std::uint32_t kLeftButton = 4, kRightButton = 1;

struct Direction {
    int dx = 0, dy = 0;  // dy grows downward

    bool operator==(Direction const&) const = default;
};

// The application's thread. Like the buttons they outlast the emulation.
Direction heading;
std::uint32_t strokes = 0;  // presses of directions, repeats included, since the pointer stood still

/// Where a key leads; nowhere for those that have no direction. The pad works with and without num lock.
Direction DirectionOf(std::uint32_t vk)
{
    switch (vk) {
    case GrVkLeft:
    case GrVkPadLeft:
    case GrVkPad0 + 4: return {-1, 0};
    case GrVkRight:
    case GrVkPadRight:
    case GrVkPad0 + 6: return {1, 0};
    case GrVkUp:
    case GrVkPadUp:
    case GrVkPad0 + 8: return {0, -1};
    case GrVkDown:
    case GrVkPadDown:
    case GrVkPad0 + 2: return {0, 1};
    case GrVkPadHome:
    case GrVkPad0 + 7: return {-1, -1};
    case GrVkPadPageUp:
    case GrVkPad0 + 9: return {1, -1};
    case GrVkPadEnd:
    case GrVkPad0 + 1: return {-1, 1};
    case GrVkPadPageDown:
    case GrVkPad0 + 3: return {1, 1};
    default: return {};
    }
}

/// The button that a key stands for, 0 if none. The pad's centre is one without num lock only.
std::uint32_t ButtonOf(std::uint32_t vk)
{
    switch (vk) {
    case ' ':
    case GrVkReturn:
    case GrVkPadEnter:
    case GrVkPadCentre: return kLeftButton;
    case GrVkMenu: return kRightButton;
    default: return 0;
    }
}

/// Num lock with the left shift and alt keys, control-M, or F10 with whatever is held.
bool IsToggle(GrEvent const& key)
{
    constexpr std::uint32_t kShiftsAndAlts = GrModShift | GrModRightShift | GrModAlt | GrModRightAlt;
    if (key.type != GrEventKeyDown) return false;
    switch (key.vk) {
    case GrVkNumLock: return (key.modifiers & kShiftsAndAlts) == (GrModShift | GrModAlt);
    case 'M':
    case 'm': return (key.modifiers & GrModControl) != 0;  // layouts differ in the letter's case
    case GrVkF10: return true;
    default: return false;
    }
}

void Toggle(GrKeyboard& keyboard)
{
    keyboard.emulationActive = !keyboard.emulationActive;
    mouseRefreshPending = true;
    if (keyboard.emulationNotify) keyboard.emulationNotify(keyboard.emulationUser, keyboard.emulationActive);
}

/// The last key of an axis decides: keys are not counted.
void Steer(Direction const& key, bool pressed)
{
    if (key.dx != 0) heading.dx = pressed ? key.dx : 0;
    if (key.dy != 0) heading.dy = pressed ? key.dy : 0;
    if (pressed && key != Direction{}) ++strokes;
    if (heading == Direction{}) strokes = 0;
}

/// Longer the longer a direction is held; above 5, the mouse's acceleration doubles it.
int StepSize() { return strokes <= 5 ? 5 : static_cast<int>(std::min((strokes - 5) / 2 + 5, 10u)); }

}

bool GrMouseEmulationFilter(GrKeyboard* keyboard, GrEvent const& event)
{
    if (IsToggle(event)) {
        Toggle(*keyboard);
        return true;
    }
    if (!keyboard->emulationActive) return false;
    bool const pressed = event.type == GrEventKeyDown;
    std::uint32_t const before = emulatedButtons;
    Steer(DirectionOf(event.vk), pressed);
    std::uint32_t const button = ButtonOf(event.vk);
    emulatedButtons = pressed ? emulatedButtons & ~button : emulatedButtons | button;
    // No timer runs: the pointer moves with each key event while a direction is held, whatever the key.
    if (emulatedButtons != before || strokes != 0)
        GrMouseReport(emulatedButtons, StepSize() * heading.dx, StepSize() * heading.dy, 0);
    return true;
}

void GrSetMouseEmulationNotify(void (*callback)(void* user, bool active), void* user)
{
    if (!sessionKeyboard) return;
    sessionKeyboard->emulationNotify = callback;
    sessionKeyboard->emulationUser = user;
    if (callback) callback(user, sessionKeyboard->emulationActive);
}

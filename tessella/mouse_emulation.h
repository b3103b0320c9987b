#pragma once

#include <cstdint>

class GrKeyboard;
struct GrEvent;

/// The buttons as the keys hold them, in the form of the mouse's: 4 left, 2 middle, 1 right, set while up.
/// The application's thread. They outlast the emulation: a button that is down when it ends stays down.
extern std::uint32_t emulatedButtons;

/// Sees each key event before the application does. True if it is none of the application's business: it has
/// turned the emulation on or off, or, as all keys do while it is on, gone to the pointer. Then there may be
/// an event of the mouse.
bool GrMouseEmulationFilter(GrKeyboard* keyboard, GrEvent const& event);

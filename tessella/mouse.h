#pragma once

#include <cstdint>

/// Button states have a bit set while the button is up: 4 left, 2 middle, 1 right. All are up at the start.
extern std::uint32_t mouseButtons;     ///< as last reported by the device
extern std::uint32_t emulatedButtons;  ///< as last reported by the keyboard

extern int mouseFd;  ///< the mouse device; -1 before it is opened

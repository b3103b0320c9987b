#pragma once

#include <console/virtual_console.h>

#include <chrono>

namespace console {

/// Waits until a program that opens the mouse is through with what it has to say to it. What the mouse
/// reported before would be lost on the program, or take the place of an answer.
class MouseHandshake {
public:
    /// To be asked again and again.
    bool IsOver(VirtualConsole& console);

private:
    using Clock = std::chrono::steady_clock;

    Clock::time_point spokenTo = Clock::now();
};

}

#pragma once

#include <optional>

#include <termios.h>

namespace care {

/// What a program may change of a Linux console and leave behind. What could not be learned is empty, and
/// nothing is done about it.
struct ConsoleState {
    std::optional<int> keyboardMode;
    std::optional<int> locks;  ///< caps, num and scroll lock, and what they are after a reset
    std::optional<termios> terminal;
    std::optional<int> displayMode;
    std::optional<int> activeConsole;  ///< from 1
};

/// Opens the console that programs of the library take: the one in the foreground, else the controlling
/// terminal. -1, with errno, if neither is a console.
int OpenConsole();

/// Opens a console by its path. -1, with errno, if it isn't one.
int OpenConsole(char const* path);

ConsoleState ReadConsole(int tty);

/// What a console is like when the system has just started, and no console to switch to.
ConsoleState FreshConsole();

/// Puts a console into a state. Whoever had a say in console switches loses it, lights follow the locks
/// again. False if something was refused; everything else is done all the same.
bool RestoreConsole(int tty, ConsoleState const& state);

}

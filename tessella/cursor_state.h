#pragma once

#include <atomic>

/// The pointer is to be seen on the screen. Changed by whoever hides or shows it: the application's thread.
extern std::atomic<bool> cursorVisible;

/// Take the pointer's picture onto the screen and off it.
void GrShowCursor();
void GrHideCursor();

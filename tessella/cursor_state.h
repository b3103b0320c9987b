#pragma once

#include <atomic>

class GrCursor;

/// The cursor that follows the pointer; null if none does. Changed under `screenMutex`, and by a change of
/// mode.
extern std::atomic<GrCursor*> currentCursor;

/// The pointer is to be seen: the current cursor, if there is one, is drawn on the screen.
extern std::atomic<bool> cursorVisible;

/// Take the current cursor onto the screen and off it.
void GrShowCursor();
void GrHideCursor();

#include <tessella/cursor_state.h>

constinit std::atomic<bool> cursorVisible{false};

void GrShowCursor() { cursorVisible = true; }

void GrHideCursor() { cursorVisible = false; }

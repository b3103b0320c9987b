#include <tessella/cursor_state.h>

#include <tessella/cursor.h>
#include <tessella/screen_guard.h>

#include <mutex>

constinit std::atomic<GrCursor*> currentCursor{nullptr};
constinit std::atomic<bool> cursorVisible{false};

void GrShowCursor()
{
    if (GrCursor* const cursor = currentCursor) {
        std::scoped_lock const lock(screenMutex);
        cursor->Show();
    }
    cursorVisible = true;
}

void GrHideCursor()
{
    cursorVisible = false;
    if (GrCursor* const cursor = currentCursor) {
        std::scoped_lock const lock(screenMutex);
        cursor->RestoreRect(cursor->shownRect);
        cursor->shownRect = {};
    }
}

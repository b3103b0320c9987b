#include <tessella/session.h>

#include <tessella/console_l.h>
#include <tessella/crash_l.h>
#include <tessella/event_wait_l.h>
#include <tessella/font_factory.h>
#include <tessella/font_substitution.h>
#include <tessella/framebuffer_l.h>
#include <tessella/keyboard_l.h>
#include <tessella/mouse.h>
#include <tessella/session_state.h>
#include <tessella/vga_l.h>
#include <tessella/whole_screen.h>
#include <tessella/window.h>

#include <csignal>
#include <cstdio>

// What a failed start leaves open is left on purpose: `GrDone` has nothing to do then.
bool GrInit(unsigned& width, unsigned& height, unsigned& depth, unsigned mode)
{
    if (initialized) return false;
    sessionThread = pthread_self();
    if (!OpenFramebuffer()) return false;
    RequestVgaPorts();
    ConsoleSignalBlock const block;
    GrKeyboardCreate();
    if (!GrSetVideoMode(width, height, depth, mode)) return false;
    LoadFontTable();
    screenVisible = true;
    GrMouseStart();
    GrWindow::InitWindows();
    signal(SIGUSR1, [](int) {});  // harmless from now on, whoever sends it
    InstallCrashHandler();
    grabMutex.lock();
    initialized = true;
    ClearScreen();
    return true;
}

void GrDone()
{
    if (!initialized) return;
    ClearScreen();
    GrMouseStop();
    GrKeyboardDestroy();
    GrWindow::ShutdownWindows();
    DeleteScreenContext();
    ReleaseFontTable();
    CloseFramebuffer();
    grabMutex.unlock();
    initialized = false;
}

bool GrChangeMode(unsigned& width, unsigned& height, unsigned& depth, unsigned)
{
    return GrSetVideoMode(width, height, depth, 0);
}

bool GrIsDdcSupport() { return false; }

bool GrIsRefreshRateValid(unsigned, unsigned, unsigned) { return false; }

void GrBeep()
{
    putchar('\a');
    fflush(stdout);
}

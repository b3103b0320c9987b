#include <tessella/event.h>

#include <tessella/event_wait_l.h>
#include <tessella/keyboard_device.h>
#include <tessella/mouse.h>
#include <tessella/window.h>

namespace {

/// One key. Bytes that mean nothing in the layout are dropped, and leave the record as it was.
bool TakeKeyEvent(GrEvent& event)
{
    if (!sessionKeyboard || !sessionKeyboard->HasKey()) return false;
    GrEvent key = event;
    key.vk = 0;
    sessionKeyboard->GetKey(key);
    if (key.vk == 0) return false;
    event = key;
    return true;
}

/// The kind, place and time of the next mouse event. The window and the modifiers are those of the moment at
/// which the application takes it, not of that at which it happened.
bool TakeMouseEvent(GrEvent& event)
{
    if (!GrMouseHasEvent() || !GrMousePop(&event.type, &event.x, &event.y, &event.time)) return false;
    event.window = GrWindow::WindowAtXY(event.x, event.y, false);
    if (!event.window) event.window = GrWindow::RootWindow();
    event.modifiers = sessionKeyboard ? sessionKeyboard->GetModifiers() : 0;
    return true;
}

bool MayWait(timeval const* timeout) { return !timeout || timeout->tv_sec != 0 || timeout->tv_usec != 0; }

}

bool GrGetEvent(GrEvent& event, timeval* timeout)
{
    if (GrWindow::GetPaintEvent(&event)) return true;
    do {
        if (TakeKeyEvent(event) || TakeMouseEvent(event)) return true;
    } while (MayWait(timeout) && WaitForInput(timeout));
    return false;
}

bool GrHasEvent()
{
    return GrWindow::GetPaintEvent(nullptr) || GrMouseHasEvent() ||
        (sessionKeyboard && sessionKeyboard->HasKey());
}

void GrGrabInput() { grabMutex.lock(); }

void GrUngrabInput(bool unfreeze)
{
    if (unfreeze) GrUnfreeze();
    grabMutex.unlock();
}

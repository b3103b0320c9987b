#include <tessella/event.h>

#include <tessella/event_wait_l.h>
#include <tessella/keyboard_device.h>
#include <tessella/mouse.h>
#include <tessella/mouse_emulation.h>
#include <tessella/window.h>

namespace {

enum class Key { None, ForPointer, ForApplication };

/// At most one key. Those that mean nothing in the layout are dropped; only one for the application changes
/// the record.
Key TakeKeyEvent(GrEvent& event)
{
    if (!sessionKeyboard || !sessionKeyboard->HasKey()) return Key::None;
    GrEvent key = event;
    key.type = 0;
    sessionKeyboard->GetKey(key);
    if (key.type == 0) return Key::None;
    if (GrMouseEmulationFilter(sessionKeyboard, key)) return Key::ForPointer;
    if (key.vk == 0) return Key::None;
    event = key;
    return Key::ForApplication;
}

/// The kind, place and time of the next mouse event. The window and the modifiers are those of the moment at
/// which the application takes it, not of that at which it happened.
bool TakeMouseEvent(GrEvent& event, bool expected)
{
    bool const due = GrMouseHasEvent();  // it also puts the pointer into use, or out of it
    if ((!due && !expected) || !GrMousePop(&event.type, &event.x, &event.y, &event.time)) return false;
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
        Key const key = TakeKeyEvent(event);
        if (key == Key::ForApplication || TakeMouseEvent(event, key == Key::ForPointer)) return true;
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

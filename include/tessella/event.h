#pragma once

#include <tessella/export.h>
#include <tessella/types.h>

#include <cstdint>

#include <sys/time.h>

class GrWindow;

/// Kinds of events. Those up to `GrEventKeyUp`, and `GrEventPaint`, come from `GrGetEvent`; paint goes to
/// the window callback, too, from `GrWindow::Repaint` and for shadows (`GrWindow::SetShadowed`). The others
/// go to the window callback only, on the thread of the operation.
enum : std::uint32_t {
    GrEventMouseMove = 1,          ///< the pointer has moved
    GrEventLeftDown = 2,           ///< the left button was pressed
    GrEventLeftUp = 4,             ///< the left button was released
    GrEventRightDown = 8,          ///< the right button was pressed
    GrEventRightUp = 16,           ///< the right button was released
    GrEventMiddleDown = 32,        ///< the middle button was pressed; no mouse device reports it
    GrEventMiddleUp = 64,          ///< the middle button was released; no mouse device reports it
    GrEventWheelUp = 128,          ///< the wheel was turned one step away from the user
    GrEventWheelDown = 256,        ///< the wheel was turned one step towards the user
    GrEventKeyDown = 512,          ///< a key was pressed, or repeats itself
    GrEventKeyUp = 513,            ///< a key was released
    GrEventWindowCreated = 514,    ///< a window has been constructed
    GrEventWindowDestroyed = 515,  ///< a window is about to go
    GrEventWindowChanged = 516,    ///< a window has got its place, another place or another shape
    GrEventWindowShown = 517,      ///< a window has been shown
    GrEventWindowHidden = 518,     ///< a window has been hidden
    GrEventPaint = 519,            ///< a part of a window is to be painted
    GrEventLayoutChanged = 520     ///< another key layout is in force
};

/// Flags of `GrEvent::modifiers`.
enum : std::uint32_t {
    GrModShift = 0x01,       ///< a shift key is down
    GrModRightShift = 0x02,  ///< the right shift key is down
    GrModCapsLock = 0x04,    ///< caps lock is on
    GrModControl = 0x08,     ///< a control key is down
    GrModAlt = 0x10,         ///< an alt key is down
    GrModRightAlt = 0x20,    ///< the right alt key is down
    GrModNumLock = 0x40,     ///< num lock is on
    GrModScrollLock = 0x80,  ///< scroll lock is on
    GrModInsert = 0x800      ///< insert mode is toggled on
};

/// What happened. Each kind sets the fields that name it here, and leaves the others as they were.
struct GrEvent {
    std::uint32_t type = 0;  ///< `GrEventMouseMove` and the others; every kind

    /// All but `GrEventLayoutChanged`: the window concerned. Null for keys, the root for what lies outside
    /// all windows.
    GrWindow* window = nullptr;

    /// `GrEventPaint`: what is to be painted, in coordinates of `window`; may be empty. `Created` and
    /// `Changed`: the window's outer rectangle, in screen coordinates.
    GrRect rect{};

    std::int32_t x = 0;    ///< mouse: where the pointer is, in screen coordinates; may be one past the edge
    std::int32_t y = 0;    ///< mouse: the same
    std::uint32_t vk = 0;  ///< keys: the virtual key
    std::uint32_t charCount = 0;           ///< keys: how many of `chars` count; 0 to 2
    std::uint32_t chars[2]{};              ///< keys: the characters, UTF-16 units
    std::uint8_t repeat = 0;               ///< keys: 1 if the key was down already
    std::uint32_t modifiers = 0;           ///< keys and mouse: `GrModShift` and the others
    std::uint32_t time = 0;                ///< keys and mouse: always 0
    char16_t const* layoutName = nullptr;  ///< `GrEventLayoutChanged`: the layout's name, not owned
};

/// Takes the next event, in this order: paint, keys, mouse. Paint is looked for once, when the call begins.
/// Keys may move the pointer instead of coming as keys (`GrSetMouseEmulationNotify`).
/// If there is no event it waits, letting other threads have the library meanwhile (`GrGrabInput`).
///
/// `timeout` limits the wait: null means no limit, and {0, 0} not to wait at all. Attention: `tv_usec` counts
/// milliseconds, and only its value modulo 1000 is used. Input that gives no event begins the wait anew. A
/// time that is negative is over at once.
///
/// False if `event` holds no event: time ran out, `GrUnfreeze` was called, or input came whose events had
/// been taken before. So false does not mean that time ran out; the loop of the application calls again.
/// Fields that the event's kind does not name keep what they held; after false, `event` may have changed.
///
/// On the application's thread, during a session.
GR_API bool GrGetEvent(GrEvent& event, timeval* timeout);

/// True if paint, a mouse event or input of the keyboard is waiting. Takes nothing away. On the application's
/// thread, or between `GrGrabInput` and `GrUngrabInput`.
GR_API bool GrHasEvent();

/// Where the pointer is now, in screen coordinates, and the buttons: 4 left, 2 middle, 1 right, each set
/// while the button is *up*. The buttons are those of the latest change of a button or turn of the wheel, and
/// 0 before the first. Any thread, during a session.
GR_API void GrGetCursorPos(int& x, int& y, unsigned& buttons);

/// Borrows the whole library for the calling thread, and waits until the application's thread sleeps in
/// `GrGetEvent`. May be nested, and is harmless on the application's thread. A thread that ends must have
/// given the library back.
GR_API void GrGrabInput();

/// Gives the library back. With `unfreeze` the application's `GrGetEvent` returns false, so that its next
/// call finds what this thread has caused to be painted; without, the application sleeps on until the next
/// input.
GR_API void GrUngrabInput(bool unfreeze);

/// Makes the waiting `GrGetEvent` return false, or the next one that would wait. Any thread, during a
/// session.
GR_API void GrUnfreeze();

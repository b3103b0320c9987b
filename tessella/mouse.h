#pragma once

#include <atomic>
#include <cstdint>
#include <mutex>
#include <span>

/// The pointer: where it is, which buttons are down, and the changes that the application has not taken yet.
/// Its device thread and the application's thread meet here.

/// Guards the pointer and its queue. Before `screenMutex` in the order of locking. Usable at all times: the
/// first mode is set, and the pointer put to its middle, before the mouse is started.
extern std::mutex mouseMutex;

/// The buttons as last reported, by whichever thread reports: a bit is set while the button is up, 4 left,
/// 2 middle, 1 right. All are up at the start.
extern std::atomic<std::uint32_t> mouseButtons;

/// Where the pointer is, in screen coordinates, one past the edge at most. Changed under the mutex; read
/// anywhere, where a value that is about to change does no harm.
extern std::atomic<int> mouseX, mouseY;

extern int mouseFd;      ///< the mouse device; -1 before it is opened; fixed before the thread starts
extern bool mouseWheel;  ///< the device reports its wheel; fixed before the thread starts

/// Whether the pointer is in use must be looked at again.
extern std::atomic<bool> mouseRefreshPending;

/// A packet of the device: what has changed since the one before.
struct MousePacket {
    std::uint32_t buttons;  ///< in the form above; the middle one is not read
    int dx, dy;             ///< dy grows downward
    int wheel;              ///< 1 away from the user, -1 towards, 0 at rest
};

/// Reads a packet of 3 bytes, or 4 of a device with a wheel.
MousePacket DecodeMousePacket(std::span<unsigned char const> bytes);

/// Start and end of the mouse's part in a session. The end waits for the mouse's thread, which then gives up
/// what it waits for: whoever ends the session may hold any lock.
void GrMouseStart();
void GrMouseStop();

/// Puts the pointer into use if there is something to move it, or out of use, if that must be looked at.
void GrMouseRefresh();

/// Takes in a movement (dy grows downward), the buttons' state and the wheel's step: 1, -1 or 0. The mouse's
/// thread, and the application's when the keyboard moves the pointer.
void GrMouseReport(std::uint32_t buttons, int dx, int dy, int wheel);

/// True if the pointer is in use and has moved, or changes of buttons or wheel are queued.
bool GrMouseHasEvent();

/// Takes the next event; false if there is none. A change is preceded by a move to where it happened.
bool GrMousePop(std::uint32_t* kind, int* x, int* y, std::uint32_t* time);

/// Puts the pointer into the middle of a new mode. The application's thread, within the guard of the screen.
void GrMouseRecentre();

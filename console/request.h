#pragma once

#include <array>
#include <cstddef>
#include <optional>

#include <linux/fb.h>
#include <linux/kd.h>
#include <linux/vt.h>

namespace console {

enum class Device : unsigned char { Framebuffer, Tty, Mouse };

/// The calls that the virtual console answers, each of which can be counted and made to fail.
enum class Request : unsigned char {
    OpenFramebuffer,
    OpenTty,
    OpenMouse,
    MapMemory,
    PortAccess,
    GetFixedInfo,
    GetVariableInfo,
    PutColourMap,
    GetColourMap,
    GetKeyboardMode,
    SetKeyboardMode,
    GetConsoleMode,
    SetConsoleMode,
    GetLeds,
    SetLeds,
    GetVtMode,
    SetVtMode,
    GetVtState,
    ReleaseDisplay,
    ActivateConsole,
    AwaitConsole,
};

struct RequestInfo {
    Request request;
    char const* name;  ///< as it is named to `--fault`
    Device device;
    unsigned long number;  ///< of the ioctl; 0 for other calls
};

/// In the order of `Request`.
inline constexpr std::array kRequests = {
    RequestInfo{Request::OpenFramebuffer, "OPEN_FB", Device::Framebuffer, 0},
    RequestInfo{Request::OpenTty, "OPEN_TTY", Device::Tty, 0},
    RequestInfo{Request::OpenMouse, "OPEN_MOUSE", Device::Mouse, 0},
    RequestInfo{Request::MapMemory, "MMAP", Device::Framebuffer, 0},
    RequestInfo{Request::PortAccess, "IOPERM", Device::Framebuffer, 0},
    RequestInfo{Request::GetFixedInfo, "FBIOGET_FSCREENINFO", Device::Framebuffer, FBIOGET_FSCREENINFO},
    RequestInfo{Request::GetVariableInfo, "FBIOGET_VSCREENINFO", Device::Framebuffer, FBIOGET_VSCREENINFO},
    RequestInfo{Request::PutColourMap, "FBIOPUTCMAP", Device::Framebuffer, FBIOPUTCMAP},
    RequestInfo{Request::GetColourMap, "FBIOGETCMAP", Device::Framebuffer, FBIOGETCMAP},
    RequestInfo{Request::GetKeyboardMode, "KDGKBMODE", Device::Tty, KDGKBMODE},
    RequestInfo{Request::SetKeyboardMode, "KDSKBMODE", Device::Tty, KDSKBMODE},
    RequestInfo{Request::GetConsoleMode, "KDGETMODE", Device::Tty, KDGETMODE},
    RequestInfo{Request::SetConsoleMode, "KDSETMODE", Device::Tty, KDSETMODE},
    RequestInfo{Request::GetLeds, "KDGKBLED", Device::Tty, KDGKBLED},
    RequestInfo{Request::SetLeds, "KDSKBLED", Device::Tty, KDSKBLED},
    RequestInfo{Request::GetVtMode, "VT_GETMODE", Device::Tty, VT_GETMODE},
    RequestInfo{Request::SetVtMode, "VT_SETMODE", Device::Tty, VT_SETMODE},
    RequestInfo{Request::GetVtState, "VT_GETSTATE", Device::Tty, VT_GETSTATE},
    RequestInfo{Request::ReleaseDisplay, "VT_RELDISP", Device::Tty, VT_RELDISP},
    RequestInfo{Request::ActivateConsole, "VT_ACTIVATE", Device::Tty, VT_ACTIVATE},
    RequestInfo{Request::AwaitConsole, "VT_WAITACTIVE", Device::Tty, VT_WAITACTIVE},
};

struct DevicePath {
    char const* path;
    Device device;
};

inline constexpr std::array kDevicePaths = {
    DevicePath{"/dev/fb0", Device::Framebuffer},
    DevicePath{"/dev/fb/0", Device::Framebuffer},
    DevicePath{"/devfs/fb/0", Device::Framebuffer},
    DevicePath{"/dev/tty0", Device::Tty},
    DevicePath{"/dev/tty", Device::Tty},
    DevicePath{"/dev/mice", Device::Mouse},
    DevicePath{"/dev/input/mice", Device::Mouse},
};

/// Faults are kept in one row of slots: the requests, then the opening of each single path.
inline constexpr std::size_t kFaultSlots = kRequests.size() + kDevicePaths.size();

constexpr std::size_t SlotOf(Request request) { return static_cast<std::size_t>(request); }
constexpr std::size_t SlotOfPath(std::size_t pathIndex) { return kRequests.size() + pathIndex; }
constexpr Request OpenRequestOf(Device device) { return static_cast<Request>(device); }

static_assert(OpenRequestOf(Device::Tty) == Request::OpenTty);
static_assert(OpenRequestOf(Device::Mouse) == Request::OpenMouse);

/// The ioctl that has this number, null if the console doesn't know it.
RequestInfo const* FindIoctl(unsigned long number);

/// The index of a path among `kDevicePaths`; nothing for every other path and for a null pointer.
std::optional<std::size_t> FindDevicePath(char const* path);

}

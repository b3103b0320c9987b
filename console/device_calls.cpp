#include <console/device_calls.h>

#include <console/framebuffer_model.h>
#include <console/mouse_model.h>
#include <console/tty_model.h>

#include <cerrno>
#include <ctime>

#include <fcntl.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace console {

namespace {

constexpr unsigned long kFirstVgaPort = 0x3C0;
constexpr unsigned long kLastVgaPort = 0x3DF;

std::atomic<State*> attached{nullptr};

State* Attached() { return attached.load(std::memory_order_acquire); }

/// Counts a call and gives the error that it shall fail with, 0 if none. The caller holds the state.
int Enter(State& state, std::size_t slot)
{
    ++state.requests[slot];
    return state.faults[slot];
}

int Result(int error)
{
    if (error == 0) return 0;
    errno = error;
    return -1;
}

bool Is(int fd, FileIdentity const& expected)
{
    FileIdentity identity;
    return Identify(fd, identity) && identity == expected;
}

/// Opens past every function of this name that a program or a sanitizer has.
int OpenFile(char const* path, int flags)
{
    return static_cast<int>(syscall(SYS_openat, AT_FDCWD, path, flags, 0));
}

/// A socket cannot be opened again, so every open gets the same one.
int OpenMouse(State& state, int flags)
{
    if (!Is(state.mouseProgramFd, state.mouse) || !Is(state.mouseDeviceFd, state.mouseDevice))
        return Result(ENODEV);
    int const fd = fcntl(state.mouseProgramFd, (flags & O_CLOEXEC) != 0 ? F_DUPFD_CLOEXEC : F_DUPFD, 0);
    if (fd == -1) return -1;
    fcntl(fd, F_SETFL, flags & O_NONBLOCK);
    StateLock const lock(state);
    MouseModel(state).OnOpen(fd);
    state.mouseOpens.fetch_add(1, std::memory_order_release);
    return fd;
}

int OpenNode(State& state, Device device, int flags)
{
    // A device's length cannot be cut and a console opened as tty0 never becomes the controlling terminal.
    flags = (flags & ~(O_TRUNC | O_CREAT)) | O_NOCTTY;
    switch (device) {
    case Device::Framebuffer: return OpenFile(state.framebufferPath.data(), flags);
    case Device::Tty: return OpenFile(state.ttyPath.data(), flags);
    default: return OpenMouse(state, flags);
    }
}

int Answer(State& state, RequestInfo const& info, void* argument)
{
    StateLock const lock(state);
    int const fault = Enter(state, SlotOf(info.request));
    if (fault != 0) return fault;
    if (info.device == Device::Tty) return TtyModel(state).Answer(info.request, argument);
    return FramebufferModel(state).Answer(info.request, argument);
}

/// Waits until a console is shown, or a signal's handler has run.
int AwaitConsole(State& state, void* console)
{
    constexpr timespec glance{0, 2'000'000};
    for (;;) {
        if (nanosleep(&glance, nullptr) == -1) return EINTR;
        StateLock const lock(state);
        int const error = TtyModel(state).Answer(Request::AwaitConsole, console);
        if (error != EAGAIN) return error;
    }
}

}

void Attach(State* state) { attached.store(state, std::memory_order_release); }

std::optional<int> OpenDevice(char const* path, int flags)
{
    State* const state = Attached();
    if (state == nullptr) return std::nullopt;
    auto const index = FindDevicePath(path);
    if (!index) return std::nullopt;
    Device const device = kDevicePaths[*index].device;
    int fault = 0;
    {
        StateLock const lock(*state);
        int const deviceFault = Enter(*state, SlotOf(OpenRequestOf(device)));
        int const pathFault = Enter(*state, SlotOfPath(*index));
        fault = pathFault != 0 ? pathFault : deviceFault;
    }
    return fault != 0 ? Result(fault) : OpenNode(*state, device, flags);
}

std::optional<int> ControlDevice(int fd, unsigned long number, void* argument)
{
    State* const state = Attached();
    if (state == nullptr) return std::nullopt;
    auto const* const info = FindIoctl(number);
    if (info == nullptr) return std::nullopt;
    if (!Is(fd, info->device == Device::Tty ? state->tty : state->framebuffer)) return std::nullopt;
    int const error = Answer(*state, *info, argument);
    bool const mustWait = error == EAGAIN && info->request == Request::AwaitConsole;
    return Result(mustWait ? AwaitConsole(*state, argument) : error);
}

std::optional<ssize_t> WriteDevice(int fd, void const* data, std::size_t length)
{
    State* const state = Attached();
    if (state == nullptr || state->mouseOpens.load(std::memory_order_acquire) == 0) return std::nullopt;
    if (data == nullptr || !Is(fd, state->mouse) || !Is(state->mouseDeviceFd, state->mouseDevice))
        return std::nullopt;
    StateLock const lock(*state);
    MouseModel(*state).OnWrite(fd, {static_cast<unsigned char const*>(data), length});
    return static_cast<ssize_t>(length);
}

std::optional<int> MapDevice(int fd)
{
    State* const state = Attached();
    if (state == nullptr || fd < 0 || !Is(fd, state->framebuffer)) return std::nullopt;
    StateLock const lock(*state);
    int const fault = Enter(*state, SlotOf(Request::MapMemory));
    if (fault == 0) return std::nullopt;
    return Result(fault);
}

std::optional<int> AllowPorts(unsigned long from, unsigned long count)
{
    State* const state = Attached();
    if (state == nullptr || from < kFirstVgaPort || from > kLastVgaPort || count > kLastVgaPort + 1 - from)
        return std::nullopt;
    StateLock const lock(*state);
    return Result(Enter(*state, SlotOf(Request::PortAccess)));
}

}

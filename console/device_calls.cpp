#include <console/device_calls.h>

#include <console/framebuffer_model.h>
#include <console/mouse_model.h>
#include <console/tty_model.h>
#include <console/vga_trap.h>

#include <bit>
#include <cerrno>
#include <ctime>

#include <fcntl.h>
#include <sys/mman.h>
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

/// The planes for this process, mapped once for each console that it is attached to.
void* MapPlanes(State const& state)
{
    static void* planes = MAP_FAILED;
    static FileIdentity owner;
    if (planes != MAP_FAILED && owner == state.framebuffer) return planes;
    int const fd = OpenFile(state.framebufferPath.data(), O_RDWR | O_CLOEXEC);
    // By the kernel's own entry, as this is called from within the function of that name.
    long const mapped = syscall(
        SYS_mmap, nullptr, kVgaPlanesLength, PROT_READ | PROT_WRITE, MAP_SHARED, fd, kVgaPlanesOffset);
    syscall(SYS_close, fd);
    planes = std::bit_cast<void*>(mapped);
    owner = state.framebuffer;
    return planes;
}

/// From now on the graphics controller answers for its ports, and for the window unless that is null.
void PlugVga(State& state, unsigned char* window)
{
    static constinit VgaModel model;
    TrapVga(nullptr, nullptr);
    void* const planes = MapPlanes(state);
    if (planes == MAP_FAILED) return;
    model = VgaModel(state.vga, static_cast<std::uint32_t*>(planes));
    TrapVga(window, &model);
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

void Attach(State* state)
{
    TrapVga(nullptr, nullptr);
    attached.store(state, std::memory_order_release);
}

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

void OnMapped(int fd, void* memory, std::size_t length)
{
    State* const state = Attached();
    if (state == nullptr || fd < 0 || !Is(fd, state->framebuffer)) return;
    TrapVga(nullptr, nullptr);
    StateLock const lock(*state);
    if (state->mode.depth != 4 || length != VgaModel::kWindow) return;
    if (mprotect(memory, length, PROT_NONE) == 0) PlugVga(*state, static_cast<unsigned char*>(memory));
}

std::optional<int> AllowPorts(unsigned long from, unsigned long count)
{
    State* const state = Attached();
    if (state == nullptr || from < kFirstVgaPort || from > kLastVgaPort || count > kLastVgaPort + 1 - from)
        return std::nullopt;
    StateLock const lock(*state);
    int const fault = Enter(*state, SlotOf(Request::PortAccess));
    state->vga.portsAllowed = fault == 0;
    if (fault == 0 && state->mode.depth == 4 && !IsVgaTrapped()) PlugVga(*state, nullptr);
    return Result(fault);
}

}

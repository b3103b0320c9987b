#include <console/virtual_console.h>

#include <console/device_calls.h>
#include <console/framebuffer_model.h>
#include <console/mouse_model.h>
#include <console/tty_model.h>

#include <cstdio>
#include <cstdlib>
#include <new>

#include <fcntl.h>
#include <poll.h>
#include <sys/mman.h>
#include <sys/socket.h>
#include <unistd.h>

namespace console {

namespace {

/// What the adapter's converter begins with: the text colours, red and blue exchanged in the index.
constexpr ColourMap TextColours()
{
    ColourMap map;
    for (unsigned i = 0; i < 16; ++i) {
        unsigned const bright = i & 8 ? 0x5555 : 0;
        map.red[i] = static_cast<std::uint16_t>((i & 4 ? 0xAAAA : 0) + bright);
        map.green[i] = static_cast<std::uint16_t>((i & 2 ? 0xAAAA : 0) + bright);
        map.blue[i] = static_cast<std::uint16_t>((i & 1 ? 0xAAAA : 0) + bright);
    }
    map.green[6] = 0x5555;  // brown
    return map;
}

FileIdentity IdentityOf(int fd)
{
    FileIdentity identity;
    Checked(Identify(fd, identity) ? 0 : -1, "looking at a device");
    return identity;
}

}

VirtualConsole::VirtualConsole(Setup const& setup)
{
    MakeState(setup);
    MakeFramebuffer();
    MakeTty();
    MakeMouse();
}

VirtualConsole::~VirtualConsole()
{
    if (attached) Attach(nullptr);
}

// What the child needs is inherited by it, so it isn't closed on exec: the state, the framebuffer and both
// ends of the mouse.

void VirtualConsole::MakeState(Setup const& setup)
{
    stateFd = OwnedFd(memfd_create("tessella-console-state", 0), "making the console's state");
    Checked(ftruncate(stateFd.Get(), sizeof(State)), "making the console's state");
    stateMemory =
        OwnedMapping(stateFd.Get(), sizeof(State), OwnedMapping::Access::Write, "making the console's state");
    state = new (stateMemory.Get()) State;
    InitMutex(*state);
    SetMode(setup.mode, setup.format);
    for (auto const& fault : setup.faults)
        state->faults[fault.slot] = fault.error;
}

void VirtualConsole::MakeFramebuffer()
{
    // Video memory has one length for all modes and cannot be cut; pages that nobody touches cost nothing.
    framebuffer = OwnedFd(memfd_create("tessella-console-fb", MFD_ALLOW_SEALING), "making video memory");
    int const fd = framebuffer.Get();
    constexpr std::size_t kLength = kVgaPlanesOffset + kVgaPlanesLength;
    Checked(ftruncate(fd, kLength), "making video memory");
    Checked(fcntl(fd, F_ADD_SEALS, F_SEAL_SHRINK | F_SEAL_GROW), "making video memory");
    pixels = OwnedMapping(fd, kLength, OwnedMapping::Access::Read, "making video memory");
    state->framebufferFd = fd;
    std::snprintf(state->framebufferPath.data(), state->framebufferPath.size(), "/proc/self/fd/%d", fd);
    state->framebuffer = IdentityOf(fd);
}

void VirtualConsole::MakeTty()
{
    ttyMaster = OwnedFd(posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC), "making a pseudo-terminal");
    int const fd = ttyMaster.Get();
    Checked(grantpt(fd), "making a pseudo-terminal");
    Checked(unlockpt(fd), "making a pseudo-terminal");
    Checked(fcntl(fd, F_SETFL, O_NONBLOCK), "making a pseudo-terminal");
    Checked(ptsname_r(fd, state->ttyPath.data(), state->ttyPath.size()) == 0 ? 0 : -1, "naming the tty");
    // Held open so that the tty keeps its settings when a program closes it, as a console does.
    ttySlave = OwnedFd(open(state->ttyPath.data(), O_RDWR | O_NOCTTY | O_CLOEXEC), "opening the tty");
    state->tty = IdentityOf(ttySlave.Get());
}

void VirtualConsole::MakeMouse()
{
    int ends[2];
    Checked(socketpair(AF_UNIX, SOCK_STREAM, 0, ends), "making the mouse");
    mouseProgram = OwnedFd(ends[0], "making the mouse");
    mouseDevice = OwnedFd(ends[1], "making the mouse");
    state->mouseProgramFd = ends[0];
    state->mouseDeviceFd = ends[1];
    state->mouse = IdentityOf(ends[0]);
    state->mouseDevice = IdentityOf(ends[1]);
}

void VirtualConsole::AttachProcess()
{
    Attach(state);
    attached = true;
}

void VirtualConsole::SetFault(Request request, int error)
{
    StateLock const lock(*state);
    state->faults[SlotOf(request)] = error;
}

void VirtualConsole::SetPathFault(char const* path, int error)
{
    StateLock const lock(*state);
    state->faults[SlotOfPath(FindDevicePath(path).value())] = error;
}

unsigned VirtualConsole::Count(Request request)
{
    StateLock const lock(*state);
    return state->requests[SlotOf(request)];
}

unsigned VirtualConsole::CountOpens(char const* path)
{
    StateLock const lock(*state);
    return state->requests[SlotOfPath(FindDevicePath(path).value())];
}

void VirtualConsole::ChangeMode(DisplayMode const& mode, std::optional<PixelFormat> const& format)
{
    StateLock const lock(*state);
    SetMode(mode, format);
}

void VirtualConsole::SetMode(DisplayMode const& mode, std::optional<PixelFormat> const& format)
{
    state->mode = mode;
    state->format = format.value_or(FormatOf(mode.depth));
    if (mode.depth == 4) state->colourMap = TextColours();
}

DisplayMode VirtualConsole::Mode()
{
    StateLock const lock(*state);
    return state->mode;
}

TtyState VirtualConsole::Tty()
{
    StateLock const lock(*state);
    return state->ttyState;
}

MouseState VirtualConsole::Mouse()
{
    StateLock const lock(*state);
    return state->mouseState;
}

ColourMap VirtualConsole::Colours()
{
    StateLock const lock(*state);
    return state->colourMap;
}

termios VirtualConsole::Terminal() const
{
    termios settings{};
    Checked(tcgetattr(ttySlave.Get(), &settings), "reading the terminal's settings");
    return settings;
}

Picture VirtualConsole::Screen()
{
    auto const [mode, colours, bytes] = Memory();
    return TakePicture(mode, colours, bytes);
}

ScreenMemory VirtualConsole::Memory()
{
    ScreenMemory memory;
    {
        StateLock const lock(*state);
        memory.mode = state->mode;
        memory.colours = state->colourMap;
    }
    auto const* const start = static_cast<unsigned char const*>(pixels.Get());
    auto const& mode = memory.mode;
    if (mode.depth == 4)
        memory.bytes = {start + kVgaPlanesOffset, std::size_t{mode.width} / 8 * mode.height * 4};
    else
        memory.bytes = {start, std::size_t{mode.pitch} * mode.height};
    return memory;
}

bool VirtualConsole::TypeKeys(std::span<unsigned char const> bytes)
{
    return ::write(ttyMaster.Get(), bytes.data(), bytes.size()) == static_cast<ssize_t>(bytes.size());
}

bool VirtualConsole::MoveMouse(int dx, int dy, int wheel, unsigned buttons)
{
    StateLock const lock(*state);
    return MouseModel(*state).Move(dx, dy, wheel, buttons);
}

bool VirtualConsole::IsMouseRead() const
{
    pollfd reports{mouseProgram.Get(), POLLIN, 0};
    return state->mouseOpens.load(std::memory_order_acquire) != 0 && poll(&reports, 1, 0) == 0;
}

bool VirtualConsole::AreKeysRead()
{
    // Bytes are on their way for a moment. Only a poll that finds none waits for them.
    pollfd keys{ttySlave.Get(), POLLIN, 0};
    return Tty().keyboardMode == K_MEDIUMRAW && (Terminal().c_lflag & ICANON) == 0 && poll(&keys, 1, 0) == 0;
}

bool VirtualConsole::SwitchTo(unsigned console)
{
    StateLock const lock(*state);
    return TtyModel(*state).Activate(console) == 0;
}

}

#pragma once

#include <console/fault.h>
#include <console/owned.h>
#include <console/picture.h>
#include <console/state.h>

#include <optional>
#include <span>
#include <vector>

#include <termios.h>

namespace console {

/// How a console is to be.
struct Setup {
    DisplayMode mode;
    std::optional<PixelFormat> format;  ///< what the program is told instead of the mode's own format
    std::vector<Fault> faults;
};

/// What the adapter makes a picture of. The memory holds all of the mode's rows and nothing behind them; it
/// changes while the program draws.
struct ScreenMemory {
    DisplayMode mode;
    ColourMap colours;
    std::span<unsigned char const> bytes;
};

/// A console with its devices: a framebuffer (a memory file), a tty (a pseudo-terminal) and a mouse (a socket
/// pair). The tool makes one for the program that it starts. A test program makes one for itself:
///
///     VirtualConsole console({.mode = *ParseMode("640x480x16"), .format = {}, .faults = {}});
///     console.AttachProcess();                                    // from here on, open("/dev/fb0") is ours
///     console.SetFault(Request::PutColourMap, EINVAL);
///     ...
///     EXPECT_EQ(console.Tty().consoleMode, KD_GRAPHICS);
///     EXPECT_EQ(console.Count(Request::MapMemory), 1u);
///
/// It links `tessella_console_models` and, for `AttachProcess` to have an effect,
/// `tessella_console_interpose`. All members may be called on any thread and while the program runs.
class VirtualConsole {
public:
    /// Throws `std::system_error` if the system refuses memory, descriptors or a pseudo-terminal.
    explicit VirtualConsole(Setup const& setup);
    /// Detaches the process if it is attached to this console. Device calls must not be under way.
    ~VirtualConsole();
    VirtualConsole(VirtualConsole const&) = delete;
    VirtualConsole& operator=(VirtualConsole const&) = delete;

    /// Sends this process' device calls to this console until it goes.
    void AttachProcess();

    /// The descriptor that tells a child process of this console; see `kStateVariable`.
    int StateFd() const { return stateFd.Get(); }
    /// The other end of the tty: what a program writes is read here, and what is written here are its key
    /// bytes.
    int KeyboardFd() const { return ttyMaster.Get(); }

    /// From now on the call fails with `error`; with 0 it works again.
    void SetFault(Request request, int error);
    /// The same for opening a single device path, one of `kDevicePaths`.
    void SetPathFault(char const* path, int error);
    /// How often a call came, failed ones included.
    unsigned Count(Request request);
    unsigned CountOpens(char const* path);

    /// Changes what the driver says of the mode, as if the console's mode had been set anew. The memory and
    /// what is in it stay, and so do mappings of it. The mode must be one that `ParseMode` and `IsPitchValid`
    /// accept.
    void ChangeMode(DisplayMode const& mode, std::optional<PixelFormat> const& format = {});

    DisplayMode Mode();
    TtyState Tty();
    MouseState Mouse();
    ColourMap Colours();
    /// The terminal's settings as they are now.
    termios Terminal() const;
    /// What the screen shows.
    Picture Screen();
    /// The same, as it lies in this console's memory.
    ScreenMemory Memory();

    /// Key bytes, as the keyboard gives them in medium raw mode: a code, with bit 7 set at its release.
    bool TypeKeys(std::span<unsigned char const> bytes);
    /// See `MouseModel::Move`.
    bool MoveMouse(int dx, int dy, int wheel = 0, unsigned buttons = 0);
    /// True if a program has opened the mouse and read all that came from it, answers included.
    bool IsMouseRead() const;
    /// True if the keyboard gives codes in medium raw mode, the tty hands them on as they come, and all that
    /// have reached it are read.
    bool AreKeysRead();
    /// The user asks for another console; the program has its say. Console 1 is the program's. False if there
    /// is no console of that number.
    bool SwitchTo(unsigned console);

private:
    void MakeState(Setup const& setup);
    void MakeFramebuffer();
    void MakeTty();
    void MakeMouse();
    void SetMode(DisplayMode const& mode, std::optional<PixelFormat> const& format);

    OwnedFd stateFd, framebuffer, ttyMaster, ttySlave, mouseProgram, mouseDevice;
    OwnedMapping stateMemory, pixels;
    State* state = nullptr;  // in its memory
    bool attached = false;
};

}

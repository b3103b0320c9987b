#include <care/console_state_l.h>

#include <cerrno>
#include <fstream>
#include <utility>

#include <fcntl.h>
#include <linux/kd.h>
#include <linux/vt.h>
#include <sys/ioctl.h>
#include <unistd.h>

namespace care {

namespace {

constexpr int kFollowLocks = 0xFF;  // any number that is no combination of lights

constexpr cc_t Control(char letter) { return static_cast<cc_t>(letter & 0x1F); }

constexpr std::pair<int, cc_t> kFreshLetters[] = {{VINTR, Control('C')}, {VQUIT, Control('\\')},
    {VERASE, 0x7F}, {VKILL, Control('U')}, {VEOF, Control('D')}, {VSTART, Control('Q')},
    {VSTOP, Control('S')}, {VSUSP, Control('Z')}, {VREPRINT, Control('R')}, {VDISCARD, Control('O')},
    {VWERASE, Control('W')}, {VLNEXT, Control('V')}};

/// The kernel's choice for new consoles.
int FreshKeyboardMode()
{
    std::ifstream choice("/sys/module/vt/parameters/default_utf8");
    int isUtf8 = 1;
    choice >> isUtf8;
    return choice && isUtf8 == 0 ? K_XLATE : K_UNICODE;
}

}

int OpenConsole(char const* path)
{
    int const tty = open(path, O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC);
    if (int mode = 0; tty == -1 || ioctl(tty, KDGKBMODE, &mode) == 0) return tty;
    int const reason = errno;
    close(tty);
    errno = reason;
    return -1;
}

int OpenConsole()
{
    int const foreground = OpenConsole("/dev/tty0");
    if (foreground != -1) return foreground;
    int const reason = errno;
    int const controlling = OpenConsole("/dev/tty");
    if (controlling == -1) errno = reason;
    return controlling;
}

ConsoleState ReadConsole(int tty)
{
    ConsoleState state;
    if (int mode = 0; ioctl(tty, KDGKBMODE, &mode) == 0) state.keyboardMode = mode;
    if (unsigned char locks = 0; ioctl(tty, KDGKBLED, &locks) == 0) state.locks = locks;
    if (termios settings{}; tcgetattr(tty, &settings) == 0) state.terminal = settings;
    if (int mode = 0; ioctl(tty, KDGETMODE, &mode) == 0) state.displayMode = mode;
    if (vt_stat consoles{}; ioctl(tty, VT_GETSTATE, &consoles) == 0) state.activeConsole = consoles.v_active;
    return state;
}

ConsoleState FreshConsole()
{
    // The kernel's own settings of a new terminal.
    termios settings{};
    settings.c_iflag = ICRNL | IXON | IUTF8;
    settings.c_oflag = OPOST | ONLCR;
    settings.c_cflag = CS8 | CREAD | HUPCL;
    settings.c_lflag = ISIG | ICANON | ECHO | ECHOE | ECHOK | ECHOCTL | ECHOKE | IEXTEN;
    for (auto const& [index, letter] : kFreshLetters)
        settings.c_cc[index] = letter;
    settings.c_cc[VMIN] = 1;
    cfsetspeed(&settings, B38400);

    ConsoleState state;
    state.keyboardMode = FreshKeyboardMode();
    state.locks = 0;
    state.terminal = settings;
    state.displayMode = KD_TEXT;
    return state;
}

bool RestoreConsole(int tty, ConsoleState const& state)
{
    bool whole = true;
    auto const request = [&](unsigned long code, std::optional<int> number) {
        if (number && ioctl(tty, code, static_cast<long>(*number)) != 0) whole = false;
    };
    request(KDSKBMODE, state.keyboardMode);
    request(KDSKBLED, state.locks);
    ioctl(tty, KDSETLED, kFollowLocks);
    // What was typed at the program is not for the shell.
    if (state.terminal && tcsetattr(tty, TCSAFLUSH, &*state.terminal) != 0) whole = false;
    // The kernel draws the console's text again; before a switch, which it would otherwise refuse.
    request(KDSETMODE, state.displayMode);
    vt_mode automatic{};
    automatic.mode = VT_AUTO;
    if (ioctl(tty, VT_SETMODE, &automatic) != 0) whole = false;
    request(VT_ACTIVATE, state.activeConsole);
    return whole;
}

}

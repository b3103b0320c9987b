#include <care/finding.h>

#include <care/console_state_l.h>

#include <cerrno>
#include <cstring>
#include <utility>

#include <linux/kd.h>
#include <linux/vt.h>
#include <sys/ioctl.h>
#include <unistd.h>

namespace care {

namespace {

constexpr char kPart[] = "console";

/// Others may be using the console; they are asked nothing, and nothing is taken from them.
void CheckOwner(Findings& findings, ConsoleState const& state, int tty)
{
    vt_mode switching{};
    bool const isAsked = ioctl(tty, VT_GETMODE, &switching) == 0 && switching.mode == VT_PROCESS;
    if (state.displayMode != KD_GRAPHICS && !isAsked) return;
    findings.push_back({kPart, Severity::Unusable,
        "another program draws on this console, or has been killed there",
        "Switch to a console with a shell (Ctrl-Alt-F2) and start there. If no such program runs any more: "
        "tessella-run --restore."});
}

/// Sends back what is there already: nothing changes, and the answer tells whether it could.
void CheckRights(Findings& findings, ConsoleState const& state, int tty)
{
    if (state.keyboardMode && ioctl(tty, KDSKBMODE, static_cast<long>(*state.keyboardMode)) != 0)
        findings.push_back({kPart, Severity::Limits,
            std::string("the keyboard can't be read key by key: ") + std::strerror(errno),
            "Start the program from a login on this console itself, or as root."});
    else if (!state.keyboardMode || !state.displayMode || !state.terminal)
        findings.push_back({kPart, Severity::Limits, "the console doesn't tell all of its state",
            "It can't be put back after a session: run the program under tessella-run, and tessella-run "
            "--restore "
            "behind it."});
}

}

void CheckConsole(Findings& findings)
{
    int const tty = OpenConsole();
    if (tty == -1) {
        int const reason = errno;
        findings.push_back({kPart, Severity::Limits,
            "no keyboard: " + CannotOpen("/dev/tty0", reason) + ", and this terminal is no Linux console",
            "Start the program on a console of this machine (Ctrl-Alt-F2), not over the network or in a "
            "window; or as root."});
        return;
    }
    ConsoleState const state = ReadConsole(tty);
    std::size_t const before = findings.size();
    CheckOwner(findings, state, tty);
    CheckRights(findings, state, tty);
    close(tty);
    if (findings.size() > before) return;
    std::string seen = "a console with its keyboard";
    if (state.activeConsole) seen.append(", number ").append(std::to_string(*state.activeConsole));
    findings.push_back({kPart, Severity::Fine, std::move(seen), {}});
}

}

#include <console/tty_model.h>

#include <console/framebuffer_model.h>

#include <bit>
#include <cerrno>
#include <csignal>

#include <unistd.h>

namespace console {

namespace {

constexpr unsigned long kConsoles = 63;  // MAX_NR_CONSOLES

}

int TtyModel::Answer(Request request, void* argument)
{
    auto const number = std::bit_cast<unsigned long>(argument);
    switch (request) {
    case Request::SetKeyboardMode: return SetKeyboardMode(number);
    case Request::SetConsoleMode: return SetConsoleMode(number);
    case Request::SetLeds: return SetLeds(number);
    case Request::ReleaseDisplay: return ReleaseDisplay(number);
    case Request::ActivateConsole: return Activate(number);
    case Request::AwaitConsole: return Await(number);
    default: break;
    }
    if (argument == nullptr) return EFAULT;
    switch (request) {
    case Request::GetKeyboardMode: *static_cast<int*>(argument) = tty.keyboardMode; return 0;
    case Request::GetConsoleMode: *static_cast<int*>(argument) = tty.consoleMode; return 0;
    // The kernel stores a char here, whatever the caller has behind it.
    case Request::GetLeds: *static_cast<char*>(argument) = static_cast<char>(tty.leds); return 0;
    case Request::GetVtMode: *static_cast<vt_mode*>(argument) = tty.vtMode; return 0;
    case Request::SetVtMode: return SetVtMode(*static_cast<vt_mode const*>(argument));
    case Request::GetVtState:
        *static_cast<vt_stat*>(argument) = {static_cast<unsigned short>(tty.activeConsole), 0,
            static_cast<unsigned short>(1U | 1U << TtyState::kOwnConsole)};
        return 0;
    default: return ENOTTY;
    }
}

int TtyModel::SetKeyboardMode(unsigned long mode)
{
    if (mode > K_OFF) return EINVAL;
    tty.keyboardMode = static_cast<int>(mode);
    return 0;
}

int TtyModel::SetConsoleMode(unsigned long mode)
{
    if (mode > KD_TEXT1) return EINVAL;
    tty.consoleMode = mode == KD_GRAPHICS ? KD_GRAPHICS : KD_TEXT;
    return 0;
}

int TtyModel::SetLeds(unsigned long leds)
{
    if ((leds & ~0x77UL) != 0) return EINVAL;
    tty.leds = static_cast<unsigned>(leds);
    return 0;
}

int TtyModel::SetVtMode(vt_mode const& mode)
{
    if (mode.mode != VT_AUTO && mode.mode != VT_PROCESS) return EINVAL;
    tty.vtMode = mode;
    tty.vtMode.frsig = 0;
    tty.vtProcess = gettid();
    tty.pendingConsole = 0;
    return 0;
}

int TtyModel::Activate(unsigned long console)
{
    if (console < 1 || console > kConsoles) return ENXIO;
    int const wanted = static_cast<int>(console);
    if (wanted == tty.activeConsole) return 0;
    if (tty.activeConsole == TtyState::kOwnConsole) {
        if (tty.vtMode.mode == VT_PROCESS) {
            tty.pendingConsole = wanted;
            if (SignalProcess(tty.vtMode.relsig)) return 0;
            ResetOwnConsole();
        }
        // Nobody would repaint a graphics screen later, so the kernel stays on it.
        else if (tty.consoleMode == KD_GRAPHICS)
            return 0;
    }
    CompleteSwitch(wanted);
    return 0;
}

int TtyModel::ReleaseDisplay(unsigned long answer)
{
    if (tty.vtMode.mode != VT_PROCESS) return EINVAL;
    if (tty.pendingConsole == 0) return answer == VT_ACKACQ ? 0 : EINVAL;
    int const console = tty.pendingConsole;
    tty.pendingConsole = 0;
    if (answer != 0) CompleteSwitch(console);
    return 0;
}

int TtyModel::Await(unsigned long console) const
{
    if (console < 1 || console > kConsoles) return ENXIO;
    return static_cast<int>(console) == tty.activeConsole ? 0 : EAGAIN;
}

/// A console in text mode draws its screen when it is shown, which the program's is not taken for.
void TtyModel::CompleteSwitch(int console)
{
    tty.activeConsole = console;
    if (console != TtyState::kOwnConsole)
        FramebufferModel(state).ShowConsole(console);
    else if (tty.vtMode.mode == VT_PROCESS && !SignalProcess(tty.vtMode.acqsig))
        ResetOwnConsole();
}

bool TtyModel::SignalProcess(int signal) const
{
    int const errnoBefore = errno;
    bool const sent = kill(tty.vtProcess, signal) == 0;
    errno = errnoBefore;
    return sent;
}

void TtyModel::ResetOwnConsole()
{
    tty.keyboardMode = K_UNICODE;
    tty.consoleMode = KD_TEXT;
    tty.vtMode = {};
    tty.vtProcess = 0;
    tty.pendingConsole = 0;
}

}

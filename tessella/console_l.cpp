#include <tessella/console_l.h>

#include <tessella/keyboard_device.h>
#include <tessella/keyboard_l.h>
#include <tessella/screen_guard.h>
#include <tessella/session.h>
#include <tessella/session_state.h>
#include <tessella/window_state.h>

#include <atomic>
#include <cerrno>
#include <csignal>

#include <linux/vt.h>
#include <sys/ioctl.h>
#include <unistd.h>

// The kernel tells one thing by one signal, and not which: going or coming follows from who has the screen.
// So a request that is made twice must not count twice, or the second one would be taken for the return, and
// the session would draw on somebody else's console from then on.
//
// The handler may find its own thread anywhere: in an allocation, in a merge of regions, in the taking of a
// lock. It allocates nothing, leaves regions alone, and the one lock that it takes is made for that.

namespace {

constinit std::atomic<bool> vtSwitchBusy{false};

/// If the kernel doesn't take the answer, the console goes or has come all the same.
void Answer(int answer)
{
    if (ioctl(ConsoleTty(), VT_RELDISP, answer) == -1) BeepAtOnce();
}

/// If the kernel doesn't tell, it is.
bool IsShown()
{
    vt_stat consoles{};
    return ConsoleNumber() == 0 || ioctl(ConsoleTty(), VT_GETSTATE, &consoles) != 0 ||
        consoles.v_active == ConsoleNumber();
}

sigset_t ConsoleSignal()
{
    sigset_t signals{};
    sigemptyset(&signals);
    sigaddset(&signals, SIGUSR2);
    return signals;
}

/// Waits for drawing on other threads to end. A user who loses patience asks again meanwhile; such requests
/// are let in here, and dropped, since the handler is busy. From the answer on the signal means a return,
/// and is kept out until the handler has ended.
void TakeScreen()
{
    sigset_t const repeated = ConsoleSignal();
    sigset_t before{};
    pthread_sigmask(SIG_UNBLOCK, &repeated, &before);
    screenMutex.lock();
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
}

void Leave()
{
    TakeScreen();  // and keep it
    screenVisible = false;
    Answer(1);
}

/// One signal may stand for several: the console has come and is to go again, and the answer has let it go.
/// Then nothing has changed.
void Return()
{
    Answer(VT_ACKACQ);
    if (!IsShown()) return;
    screenVisible = true;
    if (ConsoleTty() != -1) sessionKeyboard->Resync();
    screenLost = true;
    screenMutex.unlock();
    WakeAfterReturn();
}

}

void GrConsoleSignal(int number)
{
    int const errnoBefore = errno;
    signal(number, GrConsoleSignal);
    if (number != SIGUSR2)
        vtSwitchBusy = false;
    else if (!vtSwitchBusy.exchange(true)) {
        screenVisible ? Leave() : Return();
        vtSwitchBusy = false;
    }
    errno = errnoBefore;
}

ConsoleSignalBlock::ConsoleSignalBlock()
{
    sigset_t const blocked = ConsoleSignal();
    pthread_sigmask(SIG_BLOCK, &blocked, &before);
}

ConsoleSignalBlock::~ConsoleSignalBlock() { pthread_sigmask(SIG_SETMASK, &before, nullptr); }

void BeepAtOnce() { [[maybe_unused]] ssize_t const rung = write(STDOUT_FILENO, "\a", 1); }

#include <console/run_program.h>

#include <console/environment.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <optional>
#include <system_error>

#include <fcntl.h>
#include <poll.h>
#include <sys/prctl.h>
#include <sys/signalfd.h>
#include <sys/wait.h>
#include <unistd.h>

namespace console {

namespace {

/// Blocks the signals that the wait for the program answers to, and puts the mask back.
class SignalQueue {
public:
    SignalQueue()
    {
        sigset_t wanted{};
        sigemptyset(&wanted);
        for (int const signal : {SIGCHLD, SIGINT, SIGQUIT, SIGTERM, SIGHUP})
            sigaddset(&wanted, signal);
        sigprocmask(SIG_BLOCK, &wanted, &maskBefore);
        fd = OwnedFd(signalfd(-1, &wanted, SFD_CLOEXEC | SFD_NONBLOCK), "waiting for signals");
    }
    ~SignalQueue() { RestoreMask(); }
    SignalQueue(SignalQueue const&) = delete;
    SignalQueue& operator=(SignalQueue const&) = delete;

    void RestoreMask() const { sigprocmask(SIG_SETMASK, &maskBefore, nullptr); }
    int Fd() const { return fd.Get(); }

    /// Hands on what another process asks of us. What the user's terminal sends, the program gets itself.
    /// True if anything was asked.
    bool ForwardTo(pid_t program) const
    {
        bool asked = false;
        signalfd_siginfo info{};
        while (read(fd.Get(), &info, sizeof info) == static_cast<ssize_t>(sizeof info)) {
            if (info.ssi_signo == SIGCHLD) continue;
            asked = true;
            if (info.ssi_code <= 0) kill(program, static_cast<int>(info.ssi_signo));
        }
        return asked;
    }

private:
    sigset_t maskBefore{};
    OwnedFd fd;
};

/// Adds to a list in the environment whose parts a separator divides.
void Append(char const* variable, char separator, std::string const& part)
{
    char const* const before = std::getenv(variable);
    auto const all = before != nullptr && *before != '\0' ? before + (separator + part) : part;
    setenv(variable, all.c_str(), 1);
}

void SetEnvironment(VirtualConsole const& console, std::string const& preloaded)
{
    setenv(kStateVariable, std::to_string(console.StateFd()).c_str(), 1);
    Append("LD_PRELOAD", ':', preloaded);
    // The address sanitizer's library wants to be the first of all. It works behind ours as well, since all
    // that it stands before, ours passes on to it.
    Append("ASAN_OPTIONS", ':', "verify_asan_link_order=0");
}

/// Never returns; in the new process.
[[noreturn]] void BecomeProgram(SignalQueue const& signals, pid_t parent, int errorFd, char* const* program)
{
    signals.RestoreMask();
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    if (getppid() != parent) _exit(127);  // too late for the line above
    execvp(program[0], program);
    int const error = errno;
    [[maybe_unused]] auto const written = write(errorFd, &error, sizeof error);
    _exit(127);
}

pid_t Start(SignalQueue const& signals, std::span<char*> program)
{
    int ends[2];
    Checked(pipe2(ends, O_CLOEXEC), "making a pipe");
    OwnedFd const readEnd(ends[0], "making a pipe");
    OwnedFd writeEnd(ends[1], "making a pipe");
    pid_t const self = getpid();
    pid_t const child = Checked(fork(), "starting a process");
    if (child == 0) BecomeProgram(signals, self, writeEnd.Get(), program.data());
    writeEnd.Close();
    int error = 0;
    if (read(readEnd.Get(), &error, sizeof error) == static_cast<ssize_t>(sizeof error)) {
        waitpid(child, nullptr, 0);
        throw std::system_error(error, std::generic_category(), program[0]);
    }
    return child;
}

void TakeOff(int tty)
{
    std::array<char, 4096> written{};
    while (read(tty, written.data(), written.size()) > 0) {
    }
}

}

RunOutcome RunProgram(VirtualConsole& console, std::string const& preloaded, std::span<char*> program,
    Script const* script, PlayMode mode, std::function<void()> const& onStart)
{
    SignalQueue const signals;
    SetEnvironment(console, preloaded);
    pid_t const child = Start(signals, program);
    std::optional<ScriptPlayer> player;
    onStart();
    if (script != nullptr) player.emplace(console, *script, mode);
    int const playerFd = player ? player->SignalFd() : -1;
    RunOutcome outcome;
    bool scriptAsked = false;
    int status = 0;
    while (waitpid(child, &status, WNOHANG) == 0) {
        std::array<pollfd, 3> events = {pollfd{signals.Fd(), POLLIN, 0},
            pollfd{console.KeyboardFd(), POLLIN, 0}, pollfd{playerFd, POLLIN, 0}};
        poll(events.data(), events.size(), -1);
        if (signals.ForwardTo(child)) outcome.asked = true;
        TakeOff(console.KeyboardFd());
        if (int const signal = player ? player->TakeSignal() : 0; signal != 0) {
            kill(child, signal);
            scriptAsked = true;
        }
    }
    outcome.asked = outcome.asked || scriptAsked;
    if (player) {
        outcome.scriptProblem = player->Stop();
        outcome.hasMissed = player->HasMissed();
    }
    if (!WIFSIGNALED(status))
        outcome.status = WEXITSTATUS(status);
    else if (!scriptAsked || WTERMSIG(status) != SIGTERM)
        outcome.status = 128 + WTERMSIG(status);
    return outcome;
}

}

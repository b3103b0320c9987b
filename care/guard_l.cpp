#include <care/guard_l.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <cstdint>
#include <system_error>
#include <utility>

#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/signalfd.h>
#include <sys/wait.h>
#include <unistd.h>

namespace care {

namespace {

constexpr std::size_t kKeptWords = 65536;

/// An open file, closed with its owner.
class Descriptor {
public:
    Descriptor() = default;
    explicit Descriptor(int fd) : number(fd) {}
    Descriptor(Descriptor&& other) noexcept : number(std::exchange(other.number, -1)) {}
    Descriptor& operator=(Descriptor other) noexcept
    {
        std::swap(number, other.number);
        return *this;
    }
    ~Descriptor()
    {
        if (number != -1) close(number);
    }
    int Get() const { return number; }

private:
    int number = -1;
};

[[noreturn]] void Throw(int error, char const* what)
{
    throw std::system_error(error, std::generic_category(), what);
}

sigset_t WatchedSignals()
{
    sigset_t signals;
    sigemptyset(&signals);
    for (int const signal : {SIGCHLD, SIGHUP, SIGINT, SIGQUIT, SIGTERM})
        sigaddset(&signals, signal);
    return signals;
}

/// The program, with the signals' handling as this process found it.
pid_t Spawn(char** program, int words, sigset_t const& mask)
{
    posix_spawn_file_actions_t files;
    posix_spawnattr_t attributes;
    posix_spawn_file_actions_init(&files);
    posix_spawnattr_init(&attributes);
    if (words != -1) posix_spawn_file_actions_adddup2(&files, words, STDERR_FILENO);
    posix_spawnattr_setsigmask(&attributes, &mask);
    posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETSIGMASK);
    pid_t child = -1;
    int const error = posix_spawnp(&child, program[0], &files, &attributes, program, environ);
    posix_spawnattr_destroy(&attributes);
    posix_spawn_file_actions_destroy(&files);
    if (error != 0) Throw(error, program[0]);
    return child;
}

/// Takes what is in the pipe. False at its end.
bool TakeWords(int pipe, std::string& words)
{
    std::array<char, 4096> buffer;
    for (;;) {
        ssize_t const count = read(pipe, buffer.data(), buffer.size());
        if (count < 0 && errno == EINTR) continue;
        if (count <= 0) return count != 0;
        words.append(buffer.data(), static_cast<std::size_t>(count));
        if (words.size() > kKeptWords) words.erase(0, words.size() - kKeptWords);
    }
}

/// True if the program has ended.
bool HandleSignal(int signals, pid_t child, int& status)
{
    signalfd_siginfo info;
    if (read(signals, &info, sizeof info) != sizeof info) return false;
    int const signal = static_cast<int>(info.ssi_signo);
    if (signal == SIGCHLD) return waitpid(child, &status, WNOHANG) == child;
    // What is typed at the terminal reaches the program without us.
    if (info.ssi_code != SI_KERNEL) kill(child, signal);
    return false;
}

}

Ending RunGuarded(char** program, bool holdWords)
{
    sigset_t const watched = WatchedSignals();
    sigset_t mask;
    sigprocmask(SIG_BLOCK, &watched, &mask);
    Descriptor const signals(signalfd(-1, &watched, SFD_CLOEXEC));
    if (signals.Get() == -1) Throw(errno, "watching signals");
    Descriptor reading, writing;
    if (holdWords) {
        int ends[2];
        if (pipe2(ends, O_CLOEXEC) != 0) Throw(errno, "making a pipe");
        reading = Descriptor(ends[0]);
        writing = Descriptor(ends[1]);
        fcntl(ends[0], F_SETFL, O_NONBLOCK);
    }
    pid_t const child = Spawn(program, writing.Get(), mask);
    writing = Descriptor();

    Ending ending;
    std::array<pollfd, 2> waited{{{signals.Get(), POLLIN, 0}, {reading.Get(), POLLIN, 0}}};
    for (int status = 0;;) {
        if (poll(waited.data(), waited.size(), -1) < 0) continue;
        if (waited[1].revents != 0 && !TakeWords(reading.Get(), ending.lastWords)) waited[1].fd = -1;
        if (waited[0].revents == 0 || !HandleSignal(signals.Get(), child, status)) continue;
        if (waited[1].fd != -1) TakeWords(reading.Get(), ending.lastWords);
        ending.signal = WIFSIGNALED(status) ? WTERMSIG(status) : 0;
        ending.status = ending.signal != 0 ? 128 + ending.signal : WEXITSTATUS(status);
        return ending;
    }
}

}

// tessella-run: runs a program and puts the console back as it was, whatever ended the program.

#include <care/console_state_l.h>
#include <care/guard_l.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <string>
#include <string_view>
#include <system_error>

#include <unistd.h>

namespace {

constexpr char kHelp[] =
    R"(Usage: tessella-run [--] PROGRAM [ARGUMENT]...
  or:  tessella-run --restore [--tty DEVICE]

Runs a program, and when it has ended, however it did, puts the console back as it was before: keyboard
mode, locks and lights, terminal settings, text or graphics, switching between consoles, and the console that
is shown.

  --restore      run nothing; make a console usable that a program has left in a bad state: put it back to
                 what the system's start gives. From another console, over the network, or blindly. If the
                 shell there shows nothing of what is typed, once more in that shell
  --tty DEVICE   the console to restore, such as /dev/tty1; without it the one that is shown
  --help         show this
  --version      show the version

While the program holds the console, what it writes to the standard error stream can't be read there. The
last 64 KiB of it are kept, if that stream is a terminal, and shown at the end. SIGHUP, SIGINT, SIGQUIT and
SIGTERM are passed on to the program.

The exit status is the program's, or 128 and the signal's number if one killed it; 127 if the program
couldn't be run; with --restore 0, or 1 if the console couldn't be put back in every respect; 2 if the command
line is wrong.
)";

constexpr int kNotRestored = 1;
constexpr int kWrongUsage = 2;
constexpr int kNotRun = 127;

int Complain(std::string const& problem, int status)
{
    std::fprintf(stderr, "tessella-run: %s\n", problem.c_str());
    return status;
}

int Restore(char const* device)
{
    int const tty = device != nullptr ? care::OpenConsole(device) : care::OpenConsole();
    if (tty == -1)
        return Complain(std::string(device != nullptr ? device : "the console") + ": " + std::strerror(errno),
            kNotRestored);
    bool const whole = care::RestoreConsole(tty, care::FreshConsole());
    close(tty);
    return whole
        ? 0
        : Complain(std::string("not everything could be put back: ") + std::strerror(errno), kNotRestored);
}

int Guard(char** program)
{
    int const tty = care::OpenConsole();
    if (tty == -1)
        Complain(std::string("there is no console to look after (") + std::strerror(errno) +
                "); the program runs all the same",
            0);
    care::ConsoleState const before = tty != -1 ? care::ReadConsole(tty) : care::ConsoleState();
    care::Ending ending;
    try {
        ending = care::RunGuarded(program, isatty(STDERR_FILENO) != 0);
    } catch (std::system_error const& error) {
        return Complain(std::string("cannot run ") + error.what(), kNotRun);
    }
    bool const whole = tty == -1 || care::RestoreConsole(tty, before);
    std::fwrite(ending.lastWords.data(), 1, ending.lastWords.size(), stderr);
    if (ending.signal != 0)
        Complain(std::string(program[0]) + " was ended by signal " + std::to_string(ending.signal) + " (" +
                strsignal(ending.signal) + ")",
            0);
    if (!whole) Complain("the console couldn't be put back in every respect", 0);
    return ending.status;
}

}

int main(int count, char** words)
{
    bool restore = false;
    char const* device = nullptr;
    int next = 1;
    for (; next < count && words[next][0] == '-'; ++next) {
        std::string_view const word = words[next];
        if (word == "--") {
            ++next;
            break;
        }
        if (word == "--help") return std::fputs(kHelp, stdout), 0;
        if (word == "--version") return std::puts("tessella-run " TESSELLA_VERSION), 0;
        if (word == "--restore") {
            restore = true;
        } else if (word == "--tty") {
            if (++next == count) return Complain("--tty needs a device (--help tells more)", kWrongUsage);
            device = words[next];
        } else {
            return Complain("unknown option '" + std::string(word) + "' (--help tells more)", kWrongUsage);
        }
    }
    if (restore && next < count)
        return Complain("--restore runs no program (--help tells more)", kWrongUsage);
    if (restore) return Restore(device);
    if (device != nullptr) return Complain("--tty is for --restore (--help tells more)", kWrongUsage);
    if (next == count) return Complain("no program is given (--help tells more)", kWrongUsage);
    return Guard(words + next);
}

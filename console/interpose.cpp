// The functions that stand before libc's. In the preloaded object they come first in the order of look-up; in
// a test program they are the program's own, and its calls bind to them when it is linked.
//
// They have libc's names for the linker alone. Under these names libc's headers declare them, and with its
// checks for buffers define some of them.

#include <console/device_calls.h>
#include <console/vga_trap.h>

#include <atomic>
#include <csignal>
#include <cstdarg>

#include <dlfcn.h>
#include <fcntl.h>
#include <sys/mman.h>

namespace {

/// The function that would have been called without us, looked up at its first use: constructors of other
/// libraries may come before any of ours.
template <typename Function>
class Next {
public:
    constexpr explicit Next(char const* symbol) : name(symbol) {}

    Function Get()
    {
        auto function = found.load(std::memory_order_acquire);
        if (function == nullptr) {
            function = reinterpret_cast<Function>(dlsym(RTLD_NEXT, name));
            found.store(function, std::memory_order_release);
        }
        return function;
    }

private:
    char const* name;
    std::atomic<Function> found{nullptr};
};

using OpenFunction = int (*)(char const*, int, ...);
using OpenAtFunction = int (*)(int, char const*, int, ...);
using CheckedOpenFunction = int (*)(char const*, int);
using CheckedOpenAtFunction = int (*)(int, char const*, int);
using MapFunction = void* (*)(void*, size_t, int, int, int, off_t);
using ControlFunction = int (*)(int, unsigned long, ...);
using PortsFunction = int (*)(unsigned long, unsigned long, int);
using ActionFunction = int (*)(int, struct sigaction const*, struct sigaction*);
using MaskFunction = int (*)(int, sigset_t const*, sigset_t*);
using WriteFunction = ssize_t (*)(int, void const*, size_t);

/// Whether the call has a further argument, the permissions of a file that may be made.
bool HasPermissions(int flags) { return (flags & O_CREAT) != 0 || (flags & O_TMPFILE) == O_TMPFILE; }

}

#define CONSOLE_EXPORT extern "C" __attribute__((visibility("default")))

#define CONSOLE_OPEN(function, symbol)                                                                       \
    CONSOLE_EXPORT int function(char const* path, int flags, ...) __asm__(symbol);                           \
    int function(char const* path, int flags, ...)                                                           \
    {                                                                                                        \
        static constinit Next<OpenFunction> next(symbol);                                                    \
        va_list arguments;                                                                                   \
        va_start(arguments, flags);                                                                          \
        mode_t const permissions = HasPermissions(flags) ? va_arg(arguments, mode_t) : 0;                    \
        va_end(arguments);                                                                                   \
        if (auto const fd = console::OpenDevice(path, flags)) return *fd;                                    \
        return next.Get()(path, flags, permissions);                                                         \
    }

#define CONSOLE_OPEN_AT(function, symbol)                                                                    \
    CONSOLE_EXPORT int function(int folder, char const* path, int flags, ...) __asm__(symbol);               \
    int function(int folder, char const* path, int flags, ...)                                               \
    {                                                                                                        \
        static constinit Next<OpenAtFunction> next(symbol);                                                  \
        va_list arguments;                                                                                   \
        va_start(arguments, flags);                                                                          \
        mode_t const permissions = HasPermissions(flags) ? va_arg(arguments, mode_t) : 0;                    \
        va_end(arguments);                                                                                   \
        if (auto const fd = console::OpenDevice(path, flags)) return *fd;                                    \
        return next.Get()(folder, path, flags, permissions);                                                 \
    }

#define CONSOLE_CHECKED_OPEN(function, symbol)                                                               \
    CONSOLE_EXPORT int function(char const* path, int flags) __asm__(symbol);                                \
    int function(char const* path, int flags)                                                                \
    {                                                                                                        \
        static constinit Next<CheckedOpenFunction> next(symbol);                                             \
        if (auto const fd = console::OpenDevice(path, flags)) return *fd;                                    \
        return next.Get()(path, flags);                                                                      \
    }

#define CONSOLE_CHECKED_OPEN_AT(function, symbol)                                                            \
    CONSOLE_EXPORT int function(int folder, char const* path, int flags) __asm__(symbol);                    \
    int function(int folder, char const* path, int flags)                                                    \
    {                                                                                                        \
        static constinit Next<CheckedOpenAtFunction> next(symbol);                                           \
        if (auto const fd = console::OpenDevice(path, flags)) return *fd;                                    \
        return next.Get()(folder, path, flags);                                                              \
    }

#define CONSOLE_MAP(function, symbol)                                                                        \
    CONSOLE_EXPORT void* function(void*, size_t, int, int, int, off_t) __asm__(symbol);                      \
    void* function(void* address, size_t length, int protection, int flags, int fd, off_t offset)            \
    {                                                                                                        \
        static constinit Next<MapFunction> next(symbol);                                                     \
        if (console::MapDevice(fd)) return MAP_FAILED;                                                       \
        void* const memory = next.Get()(address, length, protection, flags, fd, offset);                     \
        if (memory != MAP_FAILED) console::OnMapped(fd, memory, length);                                     \
        return memory;                                                                                       \
    }

CONSOLE_OPEN(ConsoleOpen, "open")
CONSOLE_OPEN(ConsoleOpen64, "open64")
CONSOLE_OPEN_AT(ConsoleOpenAt, "openat")
CONSOLE_OPEN_AT(ConsoleOpenAt64, "openat64")
CONSOLE_CHECKED_OPEN(ConsoleCheckedOpen, "__open_2")
CONSOLE_CHECKED_OPEN(ConsoleCheckedOpen64, "__open64_2")
CONSOLE_CHECKED_OPEN_AT(ConsoleCheckedOpenAt, "__openat_2")
CONSOLE_CHECKED_OPEN_AT(ConsoleCheckedOpenAt64, "__openat64_2")
CONSOLE_MAP(ConsoleMap, "mmap")
CONSOLE_MAP(ConsoleMap64, "mmap64")

CONSOLE_EXPORT int ConsoleControl(int fd, unsigned long number, ...) __asm__("ioctl");
int ConsoleControl(int fd, unsigned long number, ...)
{
    static constinit Next<ControlFunction> next("ioctl");
    va_list arguments;
    va_start(arguments, number);
    void* const argument = va_arg(arguments, void*);
    va_end(arguments);
    if (auto const result = console::ControlDevice(fd, number, argument)) return *result;
    return next.Get()(fd, number, argument);
}

CONSOLE_EXPORT int ConsolePorts(unsigned long from, unsigned long count, int allowed) __asm__("ioperm");
int ConsolePorts(unsigned long from, unsigned long count, int allowed)
{
    static constinit Next<PortsFunction> next("ioperm");
    if (auto const result = console::AllowPorts(from, count)) return *result;
    return next.Get()(from, count, allowed);
}

CONSOLE_EXPORT int ConsoleAction(
    int signal, struct sigaction const* action, struct sigaction* before) __asm__("sigaction");
int ConsoleAction(int signal, struct sigaction const* action, struct sigaction* before)
{
    static constinit Next<ActionFunction> next("sigaction");
    if (auto const result = console::HandleSignal(signal, action, before)) return *result;
    return next.Get()(signal, action, before);
}

#define CONSOLE_MASK(function, symbol)                                                                       \
    CONSOLE_EXPORT int function(int how, sigset_t const* set, sigset_t* before) __asm__(symbol);             \
    int function(int how, sigset_t const* set, sigset_t* before)                                             \
    {                                                                                                        \
        static constinit Next<MaskFunction> next(symbol);                                                    \
        if (set == nullptr || how == SIG_UNBLOCK) return next.Get()(how, set, before);                       \
        sigset_t const left = console::WithoutOwnSignals(*set);                                              \
        return next.Get()(how, &left, before);                                                               \
    }

CONSOLE_MASK(ConsoleThreadMask, "pthread_sigmask")
CONSOLE_MASK(ConsoleProcessMask, "sigprocmask")

CONSOLE_EXPORT ssize_t ConsoleWrite(int fd, void const* data, size_t length) __asm__("write");
ssize_t ConsoleWrite(int fd, void const* data, size_t length)
{
    static constinit Next<WriteFunction> next("write");
    if (auto const written = console::WriteDevice(fd, data, length)) return *written;
    return next.Get()(fd, data, length);
}

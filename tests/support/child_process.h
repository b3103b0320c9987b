#pragma once

#include <cstdio>
#include <string>

#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

/// There only with the address sanitizer, which looks for leaks when a process ends, but not by `_exit`.
extern "C" [[gnu::weak]] int __lsan_do_recoverable_leak_check();

/// What a child process wrote, and how it ended.
struct ChildOutcome {
    std::string out;
    std::string err;
    int status = 0;
};

inline std::string ReadAll(int file)
{
    std::string text(static_cast<std::size_t>(lseek(file, 0, SEEK_END)), 0);
    return pread(file, text.data(), text.size(), 0) == static_cast<ssize_t>(text.size()) ? text
                                                                                         : "unreadable";
}

/// Runs `body` in a process of its own, whose exit status is its result. `parent` runs meanwhile with the
/// child's id, waits for it and returns its status.
template <class Body, class Parent>
ChildOutcome RunChild(Body body, Parent parent)
{
    int const out = memfd_create("out", 0);
    int const err = memfd_create("err", 0);
    std::fflush(nullptr);
    pid_t const child = fork();
    if (child == 0) {
        dup2(out, STDOUT_FILENO);
        dup2(err, STDERR_FILENO);
        int result = body();
        if (__lsan_do_recoverable_leak_check && __lsan_do_recoverable_leak_check() != 0) result = 99;
        std::fflush(stdout);
        _exit(result);
    }
    ChildOutcome outcome;
    outcome.status = parent(child);
    outcome.out = ReadAll(out);
    outcome.err = ReadAll(err);
    close(out);
    close(err);
    return outcome;
}

template <class Body>
ChildOutcome RunChild(Body body)
{
    return RunChild(body, [](pid_t child) {
        int status = -1;
        waitpid(child, &status, 0);
        return status;
    });
}

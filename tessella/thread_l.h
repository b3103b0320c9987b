#pragma once

#include <array>
#include <span>

#include <pthread.h>

/// A thread that waits for a device, and the pipe that ends it. Signals are for the application: input
/// threads run with all of them blocked.
class InputThread {
public:
    /// Runs `body` with `argument` on a thread of its own. False if the system refuses a pipe or a thread:
    /// the device is then not heard, which is all that can be done about it.
    bool Start(void* (*body)(void*), void* argument);

    /// Tells the thread to end and waits until it has. Only once after a start.
    void Stop();

    /// True from a start on, for ever: a device has one session a process.
    bool WasStarted() const { return started; }

    /// What a `poll` means that fails for a reason that stays: a descriptor or an address that is none.
    enum class PollFailure : unsigned char { Ignored, Ends };

    /// Waits until one of the devices, two at most, can be read, and gives its index; -1 if the thread is to
    /// end. On the thread itself.
    int WaitForInput(std::span<int const> devices, PollFailure failure) const;

private:
    pthread_t thread{};
    std::array<int, 2> stopPipe{-1, -1};  ///< the end that is read, the end that is written
    bool started = false;
};

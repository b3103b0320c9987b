#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>

/// A recursive mutex that a signal handler may take, and another run of the handler give back, whatever its
/// thread was doing with it at that moment. The system's own cannot be interrupted so: between becoming
/// locked and knowing by whom, the thread would wait for itself.
class ScreenMutex {
public:
    void lock();
    bool try_lock();
    /// False if somebody else has held it for so long.
    bool try_lock_for(std::chrono::nanoseconds limit);
    /// Nothing if the thread doesn't hold it.
    void unlock();

private:
    bool Take(std::chrono::nanoseconds const* limit);

    // Holder and depth change in one step, so that a handler finds them true, and a thread notices what a
    // handler has done.
    std::atomic<std::uint64_t> state{0};     ///< the holding thread, with how often it holds from bit 48 up
    std::atomic<std::uint32_t> waiting{0};   ///< threads that sleep, or are about to
    std::atomic<std::uint32_t> releases{0};  ///< what they sleep on; counted while there are any
};

#pragma once

#include <pthread.h>

namespace Common {

/// A lock that reports the thread which releases what it does not hold. For std::lock_guard and its like.
/// There is nothing to destroy, so a global one serves until the last thread is gone.
class Mutex {
public:
    constexpr Mutex() = default;
    Mutex(Mutex const&) = delete;
    Mutex& operator=(Mutex const&) = delete;

    void lock();
    void unlock();

private:
    pthread_mutex_t mutex = PTHREAD_ERRORCHECK_MUTEX_INITIALIZER_NP;
};

}

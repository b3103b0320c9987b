#include <tessella/event_wait_l.h>

#include <tessella/event.h>

#include <cstdint>

#include <pthread.h>

constinit std::recursive_mutex grabMutex;

namespace {

pthread_mutex_t eventMutex = PTHREAD_MUTEX_INITIALIZER;
pthread_cond_t eventCond = PTHREAD_COND_INITIALIZER;

// Guarded by eventMutex. They outlive a session.
std::uint32_t wakeCount = 0;
bool unfreezeFlag = false;

/// Applications count milliseconds in the field for microseconds, and seconds beside them.
timespec Deadline(timeval const& timeout)
{
    timeval now{};
    gettimeofday(&now, nullptr);
    auto const microseconds = timeout.tv_usec % 1000 * 1000 + now.tv_usec;
    return {timeout.tv_sec + now.tv_sec + microseconds / 1'000'000, microseconds % 1'000'000 * 1000};
}

/// Under eventMutex. True if the caller is to leave.
bool WaitForWake(timeval const* timeout)
{
    if (!timeout) {
        pthread_cond_wait(&eventCond, &eventMutex);
        return unfreezeFlag;
    }
    timespec const deadline = Deadline(*timeout);
    return pthread_cond_timedwait(&eventCond, &eventMutex, &deadline) != 0 || unfreezeFlag;
}

void Wake(bool unfreeze)
{
    pthread_mutex_lock(&eventMutex);
    ++wakeCount;
    if (unfreeze) unfreezeFlag = true;
    pthread_cond_signal(&eventCond);
    pthread_mutex_unlock(&eventMutex);
}

}

void GrPostInputWake() { Wake(false); }

void GrUnfreeze() { Wake(true); }

bool WaitForInput(timeval const* timeout)
{
    grabMutex.unlock();
    pthread_mutex_lock(&eventMutex);
    bool const leave = wakeCount != 0 || WaitForWake(timeout);
    if (wakeCount != 0) --wakeCount;
    unfreezeFlag = false;
    pthread_mutex_unlock(&eventMutex);
    grabMutex.lock();
    return !leave;
}

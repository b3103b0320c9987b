#pragma once

#include <mutex>

struct timeval;

/// Held by the application's thread for the whole session, except while it waits for events. Never held
/// together with the mutex of the wake-ups, below.
extern std::recursive_mutex grabMutex;

/// Wakes the application to look at its input. The input threads call it for all that they store, after
/// letting go of their own mutexes.
void GrPostInputWake();

/// Lets other threads have the library and waits for a wake-up; one that has been posted before is taken
/// without waiting. `timeout` limits the wait unless it is null; `tv_usec` counts milliseconds below 1,000.
///
/// True if the input is to be looked at. False if the application's call is to return: time ran out, it was
/// unfrozen, or there was nothing to wait for.
bool WaitForInput(timeval const* timeout);

#pragma once

#include <atomic>

#include <pthread.h>

/// The state of the session, global because input threads and signal handlers reach it with no object in
/// hand.

/// Between a successful `GrInit` and the end of `GrDone`. The application's thread only.
extern bool initialized;

/// The console shows our screen. Written by the application's thread and the console's signal handler.
extern std::atomic<bool> screenVisible;

/// The thread that called `GrInit`, for whoever looks with a debugger.
extern pthread_t sessionThread;

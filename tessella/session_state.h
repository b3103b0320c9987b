#pragma once

#include <pthread.h>

/// The state of the session, global because input threads and signal handlers reach it with no object in hand.
extern bool initialized;         ///< between a successful `GrInit` and the end of `GrDone`
extern bool screenVisible;       ///< the console shows our screen
extern pthread_t sessionThread;  ///< the one that called `GrInit`

#pragma once

#include <mutex>

#include <pthread.h>

/// Held by the application's thread for the whole session, except while it waits for events.
extern std::recursive_mutex grabMutex;

/// Wakes the waiting application. Never held together with `grabMutex`. They exist during a session only.
extern pthread_mutex_t eventMutex;
extern pthread_cond_t eventCond;

void CreateEventWait();
void DestroyEventWait();

#pragma once

#include <mutex>

#include <pthread.h>

/// Held by the application's thread for the whole session, except while it waits for events.
extern std::recursive_mutex grabMutex;

/// Wakes the waiting application. Never held together with `grabMutex`. They exist during a session only.
extern pthread_mutex_t eventMutex;
extern pthread_cond_t eventCond;

/// Make and destroy the two, before the input threads start and after they have ended.
void CreateEventWait();
void DestroyEventWait();

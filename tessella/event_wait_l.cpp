#include <tessella/event_wait_l.h>

constinit std::recursive_mutex grabMutex;
pthread_mutex_t eventMutex;
pthread_cond_t eventCond;

void CreateEventWait()
{
    pthread_mutex_init(&eventMutex, nullptr);
    pthread_cond_init(&eventCond, nullptr);
}

void DestroyEventWait()
{
    pthread_cond_destroy(&eventCond);
    pthread_mutex_destroy(&eventMutex);
}

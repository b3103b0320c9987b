#include <tessella/session_state.h>

bool initialized = false;
constinit std::atomic<bool> screenVisible{false};
pthread_t sessionThread;

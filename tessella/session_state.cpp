#include <tessella/session_state.h>

bool initialized = false;
bool screenVisible = false;
pthread_t sessionThread;

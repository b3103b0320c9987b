#include <console/state.h>

#include <cerrno>

#include <sys/stat.h>

namespace console {

bool Identify(int fd, FileIdentity& identity)
{
    int const errnoBefore = errno;
    struct stat status {};
    if (fstat(fd, &status) == -1) {
        errno = errnoBefore;
        return false;
    }
    identity = {status.st_dev, status.st_ino};
    return true;
}

void InitMutex(State& state)
{
    pthread_mutexattr_t attributes{};
    pthread_mutexattr_init(&attributes);
    pthread_mutexattr_setpshared(&attributes, PTHREAD_PROCESS_SHARED);
    pthread_mutexattr_setrobust(&attributes, PTHREAD_MUTEX_ROBUST);
    pthread_mutex_init(&state.mutex, &attributes);
    pthread_mutexattr_destroy(&attributes);
}

StateLock::StateLock(State& shared) : state(shared)
{
    sigset_t all{};
    sigfillset(&all);
    pthread_sigmask(SIG_SETMASK, &all, &signalsBefore);
    if (pthread_mutex_lock(&state.mutex) == EOWNERDEAD) pthread_mutex_consistent(&state.mutex);
}

StateLock::~StateLock()
{
    pthread_mutex_unlock(&state.mutex);
    pthread_sigmask(SIG_SETMASK, &signalsBefore, nullptr);
}

}

#include <tessella/thread_l.h>

#include <cerrno>
#include <csignal>

#include <poll.h>
#include <unistd.h>

namespace {

bool IsLasting(int error) { return error == EFAULT || error == EINVAL || error == EBADF; }

}

bool InputThread::Start(void* (*body)(void*), void* argument)
{
    sigset_t all, before;
    sigfillset(&all);
    pthread_sigmask(SIG_SETMASK, &all, &before);
    if (pipe(stopPipe.data()) == 0) {
        started = pthread_create(&thread, nullptr, body, argument) == 0;
        if (!started)
            for (int& end : stopPipe)
                close(end);
    }
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
    return started;
}

void InputThread::Stop()
{
    static constexpr char kStop[4]{};
    if (write(stopPipe[1], kStop, sizeof kStop) == sizeof kStop) pthread_join(thread, nullptr);
    for (int const end : stopPipe)
        close(end);
}

int InputThread::WaitForInput(std::span<int const> devices, PollFailure failure) const
{
    pollfd waiting[3] = {{stopPipe[0], POLLIN, 0}};
    std::size_t count = 1;
    for (int const device : devices)
        waiting[count++] = {device, POLLIN, 0};
    for (;;) {
        bool const failed = poll(waiting, count, -1) < 0;
        if (failed && failure == PollFailure::Ends && IsLasting(errno)) return -1;
        if (waiting[0].revents & POLLIN) return -1;
        for (std::size_t i = 1; i < count; ++i) {
            if (waiting[i].revents & POLLIN) return static_cast<int>(i) - 1;
            // A device that is gone would have poll return at once for ever; a negative descriptor is passed
            // over.
            if (waiting[i].revents & (POLLERR | POLLHUP | POLLNVAL)) waiting[i].fd = -1;
        }
    }
}

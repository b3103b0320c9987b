#include <console/viewer.h>

#include <array>
#include <chrono>
#include <exception>

#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>
#include <unistd.h>

namespace console {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::minutes kGreetingLimit{2};  // somebody may have to type a password
constexpr int kSecond = 1000;

/// Follows the screen for a scope.
class Following {
public:
    Following(ScreenWatch& screen, int eventFd) : watch(screen), fd(eventFd) { watch.Follow(fd); }
    ~Following() { watch.Leave(fd); }
    Following(Following const&) = delete;
    Following& operator=(Following const&) = delete;

private:
    ScreenWatch& watch;
    int fd;
};

}

Viewer::Viewer(ViewerShare const& shared, OwnedFd connection, RfbGreeting greetedBy, int endedFd)
    : share(shared), socket(std::move(connection)), greeting(greetedBy),
      wakeFd(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK), "greeting a viewer"),
      thread([this, endedFd] { Run(endedFd); })
{}

Viewer::~Viewer()
{
    stopping = true;
    shutdown(socket.Get(), SHUT_RDWR);
    eventfd_write(wakeFd.Get(), 1);
    thread.join();
}

void Viewer::Run(int endedFd)
{
    try {
        Serve();
    } catch (std::exception const&) {
        // Without memory or descriptors for one more viewer, the others go on.
    }
    shutdown(socket.Get(), SHUT_RDWR);
    ended = true;
    eventfd_write(endedFd, 1);
}

void Viewer::Serve()
{
    Following const following(share.watch, wakeFd.Get());
    RfbSession session(share, socket.Get(), greeting);
    auto const greetingEnd = Clock::now() + kGreetingLimit;
    while (!stopping && session.IsOpen()) {
        greeted = session.HasGreeted();
        if (!greeted && Clock::now() > greetingEnd) return;
        std::array<pollfd, 2> events = {pollfd{session.Fd(), POLLIN, 0}, pollfd{wakeFd.Get(), POLLIN, 0}};
        poll(events.data(), events.size(), greeted ? -1 : kSecond);
        if (events[0].revents != 0) session.TakeMessages();
        eventfd_t count = 0;
        eventfd_read(wakeFd.Get(), &count);
        session.UpdatePicture();
    }
}

}

#pragma once

#include <console/owned.h>
#include <console/rfb_session.h>

#include <atomic>
#include <thread>

namespace console {

/// One viewer, served on a thread of its own with a picture of its own, so that nothing that a viewer sends,
/// or fails to send, holds up another. What it shares must outlive it.
class Viewer {
public:
    /// The thread has the signal mask of the caller. `endedFd`, an event counter, is written to when the
    /// viewer has gone.
    Viewer(ViewerShare const& shared, OwnedFd connection, RfbGreeting greetedBy, int endedFd);
    /// Hangs up.
    ~Viewer();
    Viewer(Viewer const&) = delete;
    Viewer& operator=(Viewer const&) = delete;

    bool HasEnded() const { return ended; }
    bool HasGreeted() const { return greeted; }

private:
    void Run(int endedFd);
    void Serve();

    ViewerShare const& share;
    OwnedFd const socket;  // the session has a descriptor of its own
    RfbGreeting const greeting;
    OwnedFd const wakeFd;
    std::atomic<bool> ended{false};
    std::atomic<bool> greeted{false};
    std::atomic<bool> stopping{false};
    std::thread thread;
};

}

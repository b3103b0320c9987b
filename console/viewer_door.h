#pragma once

#include <console/listener.h>
#include <console/viewer.h>

#include <atomic>
#include <chrono>
#include <memory>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace console {

/// Lets viewers in, on a thread of its own that waits for nobody in particular: it takes connections, reads
/// what they begin with, answers browsers that want the page, and makes viewers of the others.
class ViewerDoor {
public:
    struct Ports {
        std::optional<Listener> web;
        std::optional<Listener> vnc;
        std::string page;  ///< the file that browsers get
    };

    /// Both must outlive the door.
    ViewerDoor(ViewerShare const& shared, Ports const& opened);
    /// Hangs up on everybody.
    ~ViewerDoor();

    /// Begins the thread. It has the signal mask of the caller.
    void Start();

private:
    using Clock = std::chrono::steady_clock;

    /// Somebody who has not become a viewer.
    struct Guest {
        OwnedFd socket;
        bool fromWeb = false;
        Clock::time_point deadline;
        std::string answer;  ///< what is left of it; empty before there is one, and when it is sent
        bool leaving = false;
    };

    void Run();
    void Serve();
    void Admit(Listener const& listener, bool fromWeb);
    // Each gives false for a guest that is to be shown out, or has become a viewer.
    bool Attend(Guest& guest);
    bool ReadRequest(Guest& guest);
    bool ReadVersion(Guest& guest);
    bool Send(Guest& guest);
    bool HasRoom();
    void LetIn(Guest& guest, RfbGreeting greeting);
    std::string Page() const;

    ViewerShare const& share;
    Ports const& ports;
    OwnedFd const wakeFd;
    std::atomic<bool> stopping{false};
    std::vector<Guest> guests;                     // the thread's
    std::vector<std::unique_ptr<Viewer>> viewers;  // likewise
    std::thread thread;
};

}

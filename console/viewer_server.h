#pragma once

#include <console/screen_watch.h>
#include <console/viewer_door.h>
#include <console/viewer_input.h>
#include <console/viewer_options.h>

#include <optional>
#include <string>

namespace console {

/// Shows a console to viewers, web browsers and VNC viewers, and lets them use its keyboard and mouse.
class ViewerServer {
public:
    /// Opens the ports; nobody is let in yet. `page` is the file that browsers get. Throws `std::exception`
    /// with what is wrong if an address cannot be listened at or the password cannot be read.
    ViewerServer(VirtualConsole& console, ViewerOptions const& wanted, std::string page);
    /// Hangs up on all viewers. What they held is not let go of: nobody is there any more.
    ~ViewerServer() { input.Stop(); }
    ViewerServer(ViewerServer const&) = delete;
    ViewerServer& operator=(ViewerServer const&) = delete;

    /// Begins to serve, on threads of its own that leave all signals to others, and tells the user where.
    void Start();

    /// The program has ended, because it was asked to from outside or by itself. Nothing is recorded any
    /// more. Gives why the recording couldn't be written, or an empty text.
    std::string EndRecording(bool asked);

private:
    void Tell() const;

    // The recording's file is begun anew when all else that could fail has not.
    ViewerOptions const options;
    std::string const password;
    ViewerDoor::Ports const ports;
    ScreenWatch watch;
    std::optional<Recording> recording;
    ViewerInput input;
    ViewerShare share;
    ViewerDoor door;  // the last member: its viewers use the others
};

}

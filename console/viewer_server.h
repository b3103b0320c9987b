#pragma once

#include <console/screen_watch.h>
#include <console/viewer_door.h>
#include <console/viewer_input.h>
#include <console/viewer_options.h>

#include <string>

namespace console {

/// Shows a console to viewers, web browsers and VNC viewers, and lets them use its keyboard and mouse.
class ViewerServer {
public:
    /// Opens the ports; nobody is let in yet. `page` is the file that browsers get. Throws `std::exception`
    /// with what is wrong if an address cannot be listened at or the password cannot be read.
    ViewerServer(VirtualConsole& console, ViewerOptions const& options, std::string page);

    /// Begins to serve, on threads of its own that leave all signals to others, and tells the user where.
    void Start();

private:
    void Tell() const;

    ViewerOptions const options;
    ScreenWatch watch;
    ViewerInput input;
    ViewerShare share;
    ViewerDoor door;  // the last member: its viewers use the others
};

}

#include <console/mouse_handshake.h>

namespace console {

// The program is through if it says no more for so long. If it hasn't turned on the wheel yet, that is
// probably still to come.
static constexpr std::chrono::milliseconds kHandshakePause{50};
static constexpr std::chrono::milliseconds kPlainPause{500};

bool MouseHandshake::IsOver(VirtualConsole& console)
{
    auto const now = Clock::now();
    if (!console.IsMouseRead()) spokenTo = now;
    bool const plain = console.Mouse().protocol == MouseProtocol::Plain;
    return now - spokenTo >= (plain ? kPlainPause : kHandshakePause);
}

}

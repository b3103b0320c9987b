#pragma once

#include <console/script.h>
#include <console/script_player.h>
#include <console/virtual_console.h>

#include <functional>
#include <span>
#include <string>

namespace console {

struct RunOutcome {
    /// The program's exit status, or 128 and the number of the signal that killed it; 0 if that was the
    /// script's request to end.
    int status = 0;
    bool asked = false;  ///< the program was asked to end: by the script or by whoever runs this process
    std::string scriptProblem;  ///< why the script wasn't played to its end; see `ScriptPlayer::Stop`
    bool hasMissed = false;     ///< the reason is a screen that is not as expected
};

/// Runs a program on a console until it ends, and plays a script beside it unless that is null. `onStart` is
/// called when the program has been started, with the signals blocked that this function waits for. Meanwhile
/// signals that ask this process to end are handed to it, and what it writes to the tty is taken off. If this
/// process dies, so does the program. Throws `std::system_error` if the program cannot be run. `preloaded` is
/// the path of the preloaded object; `program`, the program's name and arguments, ends before a null pointer.
/// For a process of one thread; `onStart` may begin others.
RunOutcome RunProgram(VirtualConsole& console, std::string const& preloaded, std::span<char*> program,
    Script const* script, PlayMode mode, std::function<void()> const& onStart);

}

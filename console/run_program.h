#pragma once

#include <console/virtual_console.h>

#include <span>
#include <string>

namespace console {

/// Runs a program on a console until it ends. Meanwhile signals that ask this process to end are handed to
/// it, and what it writes to the tty is taken off. If this process dies, so does the program. Gives the
/// program's exit status, or 128 and the number of the signal that killed it. Throws `std::system_error` if
/// the program cannot be run. `preloaded` is the path of the preloaded object; `program`, the program's name
/// and arguments, ends before a null pointer. For a process of one thread.
int RunProgram(VirtualConsole& console, std::string const& preloaded, std::span<char*> program);

}

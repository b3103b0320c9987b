#pragma once

#include <string>

namespace care {

/// How a program ended.
struct Ending {
    int status = 0;         ///< its own, or 128 and the number of the signal that ended it
    int signal = 0;         ///< 0 if none did
    std::string lastWords;  ///< the end of what it wrote to the standard error stream, if that was held back
};

/// Runs a program and waits for its end. Signals that ask this process to end are passed on to the program.
/// `holdWords`: its standard error stream is kept, the last 64 KiB of it, instead of shown. Throws
/// std::system_error if the program cannot be run.
Ending RunGuarded(char** program, bool holdWords);

}

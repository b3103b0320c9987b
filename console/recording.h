#pragma once

#include <console/owned.h>
#include <console/script.h>

#include <chrono>
#include <optional>
#include <string>

#include <sys/types.h>

namespace console {

/// Writes what happens at the console as a script that does the same. All that has happened is in the file
/// at once, but for a row of moves, which is written when it ends. For one thread at a time.
class Recording {
public:
    /// Begins the file anew, with a comment. Throws `std::system_error` if it cannot be written.
    Recording(std::string const& path, std::string const& comment);

    /// The program starts: the time from which the first pause counts.
    void Begin() { doneAt = Clock::now(); }
    /// Something is done now.
    void Add(StepAction const& action);
    /// What was added has been read by the program. The next pause counts from here, as a script's does.
    void OnRead();
    /// Nothing is to be done just now.
    void OnIdle();
    /// The program has ended, because it was asked to from outside or by itself. Gives why something couldn't
    /// be written, or an empty text.
    std::string End(bool asked);

private:
    using Clock = std::chrono::steady_clock;

    void AddPause();
    void WriteMoves();
    void Write(std::string const& line);

    std::string const name;
    OwnedFd const file;
    StepPrinter printer;
    Clock::time_point doneAt;  // when the last step was done
    Clock::duration owed{};    // pauses that were too short to be written
    std::string moves;         // a line that may go on
    /// Where in the file releases begin that the program hasn't read, if there is nothing behind them.
    std::optional<off_t> unreadReleases;
    int error = 0;  // the first one
};

}

#pragma once

#include <csignal>

/// The handler of the signal by which the kernel asks for the console, because the user wants another one,
/// and tells of its return. Both have to come to the same thread, the application's: on leaving it takes the
/// screen for its thread, after waiting for whatever is being drawn on others, and on the return it gives it
/// back, to be painted anew.
void GrConsoleSignal(int number);

/// Keeps the signal from the calling thread while it lives. A request that comes while a session starts waits
/// until the session knows that the console is its own.
class ConsoleSignalBlock {
public:
    ConsoleSignalBlock();
    ConsoleSignalBlock(ConsoleSignalBlock const&) = delete;
    ConsoleSignalBlock& operator=(ConsoleSignalBlock const&) = delete;
    ~ConsoleSignalBlock();

private:
    sigset_t before;
};

/// What `GrBeep` does, without the stream's lock and memory: for handlers of signals, and for threads that
/// the end of a session waits for, whatever the application was doing.
void BeepAtOnce();

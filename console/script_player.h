#pragma once

#include <console/owned.h>
#include <console/script.h>
#include <console/virtual_console.h>

#include <atomic>
#include <condition_variable>
#include <mutex>
#include <string>
#include <thread>

namespace console {

/// What becomes of expectations: the screen is compared with their files, or written to them.
enum class PlayMode : unsigned char { Compare, Bless };

/// Plays a script on a console, on a thread of its own, beside the program. Each step waits until the program
/// has got so far that it can be done: that it has opened the mouse, reads raw keys, has mapped the
/// framebuffer, or takes part in console switches. What the mouse and the keyboard report is given time to be
/// read before the next step.
class ScriptPlayer {
public:
    /// Begins to play. Both must stay until the player has gone. The thread takes over the signals that the
    /// caller has blocked.
    ScriptPlayer(VirtualConsole& onConsole, Script const& toPlay, PlayMode mode);

    /// Becomes readable when a signal should be sent to the program.
    int SignalFd() const { return signalFd.Get(); }
    /// The signal, SIGTERM or later SIGKILL, once; 0 if there is none to be sent.
    int TakeSignal();

    /// For when the program has ended: plays no further. Gives what went wrong, with the script's name and
    /// the line, or an empty text.
    std::string Stop();

    /// After `Stop`: true if what went wrong is a screen that is not as expected.
    bool HasMissed() const { return missed; }

private:
    using Clock = std::chrono::steady_clock;
    using Problem = std::string;
    enum class Outcome : unsigned char { Met, TooLate, Stopped };

    void Play();
    Problem PlaySteps();
    Problem Do(MouseReport const& report);
    Problem Do(KeyByte const& key);
    Problem Do(Pause const& pause);
    Problem Do(Settle const& settle);
    Problem Do(Screenshot const& shot);
    Problem Do(Expectation const& expected);
    Problem Do(ConsoleSwitch const& to);
    Problem Do(Quit const& quit);
    Problem NeedScreen();

    /// Looks at a condition again and again.
    template <class Condition>
    Outcome Await(Condition isMet, std::chrono::milliseconds limit, std::chrono::milliseconds interval);
    /// Waits until the program is ready for something. `otherwise` tells what it has not done by the limit.
    template <class Condition>
    Problem Need(Condition isMet, char const* otherwise);
    /// False if playing is to stop.
    bool Sleep(std::chrono::milliseconds time);
    void EndProgram();
    void Ask(int signal);

    VirtualConsole& console;
    Script const& script;
    PlayMode const mode;
    OwnedFd signalFd;
    std::atomic<int> signalToSend{0};
    // The thread's, until it is joined.
    bool mouseReady = false;
    bool keysReady = false;
    Problem problem;
    bool missed = false;
    std::mutex sleepMutex;
    std::condition_variable_any sleeper;
    std::stop_token stop;
    std::jthread thread;  // the last member, so that it ends before the others go
};

}

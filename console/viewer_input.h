#pragma once

#include <console/mouse_handshake.h>
#include <console/pointer_path.h>
#include <console/recording.h>
#include <console/script.h>
#include <console/virtual_console.h>

#include <array>
#include <bitset>
#include <chrono>
#include <condition_variable>
#include <deque>
#include <mutex>
#include <thread>
#include <variant>

namespace console {

/// What one viewer holds down.
struct Hands {
    std::bitset<128> keys;  ///< by their codes
    unsigned buttons = 0;   ///< bit 0 left, bit 1 right, bit 2 middle
};

/// Brings what the viewers do to the console's keyboard and mouse, in order and as fast as the program reads,
/// on a thread of its own. What is for a device that the program doesn't read waits, and doesn't hold up what
/// is for the other one. While another console is shown, nothing reaches the program.
///
/// Viewers share one keyboard and one mouse: a key or a button is down as long as one of them holds it. All
/// members may be called on any thread.
class ViewerInput {
public:
    /// What is brought is recorded, too, unless `toRecording` is null; it must outlive this.
    ViewerInput(VirtualConsole& onConsole, Recording* toRecording)
        : console(onConsole), recording(toRecording)
    {}
    ~ViewerInput() { Stop(); }

    /// Begins the thread. It has the signal mask of the caller.
    void Start();
    /// Nothing is brought any more.
    void Stop();

    /// A key goes down or up, or repeats.
    void Key(Hands& hands, unsigned char code, bool down);
    /// The pointer goes to a pixel; there, buttons change to those that are down.
    void Point(Hands& hands, int x, int y, unsigned down);
    /// By one notch, 1 away from the user and -1 towards them.
    void TurnWheel(int notch);
    void SwitchTo(unsigned toConsole);
    /// The viewer goes away and lets go of everything.
    void LetGo(Hands& hands);

private:
    using Clock = std::chrono::steady_clock;
    struct Place {
        int x = 0;
        int y = 0;
    };
    struct Button {
        unsigned bit = 0;
        bool down = false;
    };
    struct Notch {
        int turn = 0;
    };
    using Event = std::variant<KeyByte, Place, Button, Notch, ConsoleSwitch>;
    enum class Device : unsigned char { Free, Busy, Stuck };

    // All below are under the mutex.
    void Add(Event const& event);
    bool IsFull() const;
    void Run(std::stop_token const& stop);
    bool Step();
    void NoticeConsole();
    void NoticeReading(Device keyboard, Device mouse);
    bool IsAway() const { return shownConsole != TtyState::kOwnConsole; }
    bool IsMouseOpen();
    Device KeyboardState();
    Device MouseState();
    Device StateFor(Event const& event, Device keyboard, Device mouse) const;
    // Each does a part of what an event asks for; true if nothing is left to be done.
    bool Do(KeyByte key);
    bool Do(Place place);
    bool Do(Button button);
    bool Do(Notch notch);
    bool Do(ConsoleSwitch to);
    void Report(MouseReport const& report);

    VirtualConsole& console;
    Recording* const recording;  // the thread's, while it runs
    std::mutex mutex;
    std::condition_variable_any wake;
    std::deque<Event> events;
    bool hasNews = false;                    ///< since the thread has looked at the events
    std::array<unsigned, 128> keyHolders{};  ///< how many viewers hold each key
    std::array<unsigned, 3> buttonHolders{};

    std::bitset<128> keysDown;   ///< as far as the events have been brought; on any console
    unsigned wantedButtons = 0;  ///< likewise
    unsigned buttons = 0;        ///< that the program has been told of
    PointerPath path;
    int shownConsole = TtyState::kOwnConsole;
    MouseHandshake handshake;
    bool mouseReady = false;
    unsigned mouseOpens = 0;
    Clock::time_point mouseOpened, mouseReported, keySent;
    bool keyRecorded = false;     ///< and not known to be read
    bool reportRecorded = false;  ///< likewise

    std::jthread thread;  // the last member, so that it ends before the others go; not under the mutex
};

}

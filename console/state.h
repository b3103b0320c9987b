#pragma once

#include <console/display_mode.h>
#include <console/request.h>
#include <console/vga_model.h>

#include <array>
#include <atomic>
#include <csignal>
#include <cstdint>

#include <linux/vt.h>
#include <pthread.h>
#include <sys/types.h>

namespace console {

/// What a descriptor refers to. Descriptors are recognised by it, so that duplicates and those that a program
/// inherited count too, and numbers that were closed and used again don't.
struct FileIdentity {
    dev_t device = 0;
    ino_t inode = 0;

    bool operator==(FileIdentity const&) const = default;
};

/// False if the descriptor is closed. Leaves errno as it was.
bool Identify(int fd, FileIdentity& identity);

struct TtyState {
    static constexpr int kOwnConsole = 1;  ///< the number of the console that the program sits on

    int keyboardMode = K_UNICODE;
    int consoleMode = KD_TEXT;
    unsigned leds = 0;    ///< bits 0-2 the lock states, 4-6 their defaults
    vt_mode vtMode{};     ///< begins as VT_AUTO
    pid_t vtProcess = 0;  ///< the thread that gets the signals of `vtMode`, if it lets them in
    int activeConsole = kOwnConsole;
    int pendingConsole = 0;  ///< the switch that waits for a release, 0 if none does
};

enum class MouseProtocol : unsigned char { Plain = 0, Wheel = 3, Explorer = 4 };  ///< by their ids

struct MouseState {
    MouseProtocol protocol = MouseProtocol::Plain;
    unsigned wheelMatched = 0;     ///< how much of the sequence that turns on the wheel has come
    unsigned explorerMatched = 0;  ///< the same for the five-button protocol
    unsigned buttons = 0;          ///< bit 0 left, bit 1 right, bit 2 middle
};

struct ColourMap {
    std::array<std::uint16_t, 256> red{}, green{}, blue{};

    bool operator==(ColourMap const&) const = default;
};

/// The video memory is one file. A program maps it from its start; behind all that it can map lie the planes
/// of the 4-plane mode, a word for each byte of its window.
inline constexpr std::size_t kVideoMemory =
    std::size_t{2} * kLongestPitch * kLongestSide;  // enough for every mode
inline constexpr std::size_t kVgaPlanesOffset = kVideoMemory;
inline constexpr std::size_t kVgaPlanesLength = VgaModel::kWindow * sizeof(std::uint32_t);

/// All that the devices know. It lies in memory that the tool and the program share, so that the tool can
/// look at it while the program runs and after it has died; it therefore holds no pointers.
struct State {
    static constexpr std::uint32_t kMagic = 0x54434F4E;

    std::uint32_t magic = kMagic;
    std::uint32_t size = sizeof(State);

    // Fixed before the program starts. The descriptors have the same numbers in the tool and in the program.
    int framebufferFd = -1;
    std::array<char, 32> framebufferPath{};  ///< under /proc/self/fd, so that each open is one of its own
    std::array<char, 64> ttyPath{};
    int mouseProgramFd = -1;
    int mouseDeviceFd = -1;
    FileIdentity framebuffer, tty, mouse, mouseDevice;

    std::atomic<unsigned> mouseOpens{0};  ///< the quick way out for writes of programs without a mouse

    pthread_mutex_t mutex{};  ///< of all below; locked through `StateLock`
    DisplayMode mode;
    PixelFormat format;  ///< as told to the program; not always that of the mode
    ColourMap colourMap;
    VgaState vga;  ///< changed by the program's accesses alone, one at a time, and not locked
    TtyState ttyState;
    MouseState mouseState;
    std::array<int, kFaultSlots> faults{};              ///< an error number, or 0
    std::array<std::uint32_t, kFaultSlots> requests{};  ///< how often each call came, failed ones included
};

static_assert(std::atomic<unsigned>::is_always_lock_free);

void InitMutex(State& state);

/// Holds the state for a scope. Signals wait meanwhile: a handler may make requests of its own, and would
/// wait for its own thread. A process that dies within the scope doesn't lock out the others.
class StateLock {
public:
    explicit StateLock(State& shared);
    ~StateLock();
    StateLock(StateLock const&) = delete;
    StateLock& operator=(StateLock const&) = delete;

private:
    State& state;
    sigset_t signalsBefore{};
};

}

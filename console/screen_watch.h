#pragma once

#include <console/virtual_console.h>

#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <thread>
#include <vector>

namespace console {

/// A picture as viewers get it: four bytes a pixel, red, green and blue first.
struct Frame {
    unsigned width = 0;
    unsigned height = 0;
    std::uint64_t number = 0;  ///< another one with each change
    std::vector<std::uint32_t> pixels;

    std::uint32_t* Row(unsigned y) { return pixels.data() + std::size_t{y} * width; }
    std::uint32_t const* Row(unsigned y) const { return pixels.data() + std::size_t{y} * width; }
};

/// Looks at the screen, some 30 times a second on a thread of its own as long as anybody follows it, and
/// keeps what it shows as a frame. All members may be called on any thread.
class ScreenWatch {
public:
    explicit ScreenWatch(VirtualConsole& onConsole) : console(onConsole) {}
    ~ScreenWatch();

    /// Begins the thread. It has the signal mask of the caller.
    void Start();

    /// From now on the descriptor, of an event counter, is written to whenever the frame has changed. The
    /// frame is new when this returns.
    void Follow(int eventFd);
    void Leave(int eventFd);

    /// Calls a function with the frame, which stands still meanwhile.
    template <class Function>
    void Read(Function function)
    {
        std::lock_guard const lock(mutex);
        function(static_cast<Frame const&>(frame));
    }

private:
    void Run(std::stop_token const& stop);
    void Look();

    VirtualConsole& console;
    std::mutex mutex;  // of all below
    std::condition_variable_any wake;
    std::vector<int> followers;
    Frame frame;
    DisplayMode mode;   // that the frame shows
    ColourMap colours;  // likewise
    std::vector<unsigned char> memory;
    std::jthread thread;  // the last member, so that it ends before the others go; not under the mutex
};

}

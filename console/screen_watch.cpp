#include <console/screen_watch.h>

#include <algorithm>
#include <chrono>
#include <cstring>

#include <sys/eventfd.h>

namespace console {

namespace {

constexpr std::chrono::milliseconds kInterval{33};

/// A row of the picture, from a row of video memory.
void ShowRow(
    DisplayMode mode, ColourMap const& colours, std::span<unsigned char const> row, std::uint32_t* to)
{
    mode.height = 1;
    auto const picture = TakePicture(mode, colours, row);
    for (std::size_t i = 0; i < picture.bytes.size(); i += 3)
        *to++ = picture.bytes[i] | std::uint32_t{picture.bytes[i + 1]} << 8 |
            std::uint32_t{picture.bytes[i + 2]} << 16;
}

}

ScreenWatch::~ScreenWatch()
{
    thread.request_stop();
    if (thread.joinable()) thread.join();
}

void ScreenWatch::Start()
{
    thread = std::jthread([this](std::stop_token const& stop) { Run(stop); });
}

void ScreenWatch::Follow(int eventFd)
{
    std::lock_guard const lock(mutex);
    followers.push_back(eventFd);
    Look();
    wake.notify_all();
}

void ScreenWatch::Leave(int eventFd)
{
    std::lock_guard const lock(mutex);
    std::erase(followers, eventFd);
}

void ScreenWatch::Run(std::stop_token const& stop)
{
    std::unique_lock lock(mutex);
    while (wake.wait(lock, stop, [this] { return !followers.empty(); })) {
        Look();
        wake.wait_for(lock, stop, kInterval, [] { return false; });
    }
}

/// Under the mutex. Rows that are as before cost no more than a comparison.
void ScreenWatch::Look()
{
    auto const shown = console.Memory();
    bool const isOther = shown.mode != mode || shown.colours != colours || memory.empty();
    if (isOther) {
        mode = shown.mode;
        colours = shown.colours;
        frame.width = mode.width;
        frame.height = mode.height;
        frame.pixels.resize(std::size_t{mode.width} * mode.height);
        memory.assign(shown.bytes.size(), 0);
    }
    bool changed = isOther;
    std::size_t const pitch = memory.size() / mode.height;
    for (unsigned y = 0; y < mode.height; ++y) {
        auto* const known = memory.data() + y * pitch;
        auto const* const now = shown.bytes.data() + y * pitch;
        if (!isOther && std::memcmp(known, now, pitch) == 0) continue;
        std::memcpy(known, now, pitch);
        ShowRow(mode, colours, {known, pitch}, frame.Row(y));
        changed = true;
    }
    if (!changed) return;
    ++frame.number;
    for (int const follower : followers)
        eventfd_write(follower, 1);
}

}

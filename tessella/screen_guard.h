#pragma once

#include <tessella/region.h>
#include <tessella/screen_mutex_l.h>

#include <atomic>
#include <cstdint>

/// Serialises access to the framebuffer. Held from the start of the outermost guard to its end. Before it
/// comes, in the order of locking, the mouse's mutex. The handler of console switches keeps it for the
/// application's thread while somebody else has the console.
extern ScreenMutex screenMutex;

/// Above 0, nobody may draw or move the cursor on the screen. It rests at 1 while the pointer is not in use;
/// guards then take no lock at all, as there is no cursor to protect. Not per thread.
extern std::atomic<std::uint32_t> hideCount;

/// The bracket around all drawing on the framebuffer, for the pixels of a region or rectangle in screen
/// coordinates, which may be empty. Guards nest on one thread, with any regions; a nested one costs one
/// counter step. Left on every way out, exceptions included. Threads of the application take turns by
/// `grabMutex`, not by this.
class GrScreenGuard {
public:
    explicit GrScreenGuard(GrRegion const& region);
    explicit GrScreenGuard(GrRect const& rect);
    ~GrScreenGuard();

    /// Guards these pixels, too: as a guard within this one would, but without waiting for what was drawn
    /// last, as every step of the counter does.
    void Extend(GrRegion const& region) const;
    void Extend(GrRect const& rect) const;

    GrScreenGuard(GrScreenGuard const&) = delete;
    GrScreenGuard& operator=(GrScreenGuard const&) = delete;

private:
    template <typename Area>
    static void Enter(Area const& area);
    template <typename Area>
    static void KeepClear(Area const& area);
    static void PutCursorBack();
};

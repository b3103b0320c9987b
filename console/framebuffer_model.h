#pragma once

#include <console/state.h>

#include <cstddef>

#include <linux/fb.h>

namespace console {

/// The framebuffer's driver: it tells the mode as the kernel's VESA driver does, and keeps the colour map.
/// Any thread, any process that shares the state.
class FramebufferModel {
public:
    explicit FramebufferModel(State& shared) : state(shared) {}

    /// Answers one of the framebuffer's ioctls; 0 or an error number. The caller holds the state.
    int Answer(Request request, void* argument);

    /// Shows another console, of which nothing is known but that its screen is not the program's: a colour of
    /// its own. The caller holds the state.
    void ShowConsole(int console) const;

    /// The memory that a program is told of: twice what the mode shows, as the VESA driver takes it.
    static std::size_t MemoryLength(DisplayMode const& mode);

private:
    fb_fix_screeninfo FixedInfo() const;
    fb_fix_screeninfo PlanarFixedInfo() const;
    fb_var_screeninfo VariableInfo() const;
    int PutColourMap(fb_cmap const& map);
    int GetColourMap(fb_cmap const& map) const;

    State& state;
};

}

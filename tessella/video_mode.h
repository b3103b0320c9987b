#pragma once

#include <tessella/screen.h>

#include <array>
#include <cstdint>

/// How the screen is drawn on in one kind of framebuffer.
struct GrVideoMode {
    unsigned bits;  ///< bits a pixel, as the driver tells
    unsigned
        colorBits;  ///< lengths of the three colour fields together; kAnyColorBits where they don't count
    unsigned depth;
    unsigned bytesPerPixel;
    decltype(GrScreenRecord::createScreenContext) createScreenContext;
    decltype(GrScreenRecord::createImageContext) createImageContext;

    static constexpr unsigned kAnyColorBits = ~0u;
};

/// The mode for what the driver reports, or null if the library cannot draw on such a framebuffer. Where the
/// fields lie in a pixel is not looked at.
GrVideoMode const* FindVideoMode(unsigned bits, unsigned colorBits);

/// One component of a colour map, as the framebuffer driver takes it: 16 bits an entry.
using GrColorMapChannel = std::array<std::uint16_t, 256>;

struct GrColorMap {
    GrColorMapChannel red, green, blue;
};

/// The colour map of the 8-bit mode: black, the 6 by 6 by 6 cube from entry 20, and a last entry of 63 on the
/// 16-bit scale, which is next to black. The entries that no colour converts to are 0.
GrColorMap MakeColorMap();

#pragma once

#include <tessella/context.h>
#include <tessella/export.h>
#include <tessella/region.h>

#include <cstdint>

class GrImage;

/// What is known of the screen; one global record, filled by `GrInit` and `GrChangeMode`. After one of them
/// has failed it may tell of a mode that was refused.
struct GrScreenRecord {
    int fbFd = -1;  ///< descriptor of the framebuffer device; -1 before it is opened

    /// Base of the shared mapping. Null before the first mode and after the session; all bits set if the
    /// kernel refused the mapping.
    unsigned char* fbMemory = nullptr;
    std::uint32_t fbLength = 0;       ///< length of the mapping in bytes
    std::uint32_t width = 0;          ///< visible size in pixels
    std::uint32_t height = 0;         ///< visible size in pixels
    std::uint32_t depth = 0;          ///< colour depth: 4, 8, 15, 16 or 24 (also for 32 bits a pixel)
    std::uint32_t bytesPerPixel = 0;  ///< 1 in the 4-bit and 8-bit modes
    std::uint32_t stride = 0;         ///< bytes from one row to the next

    /// The whole screen. Owned by the session and deleted by `GrDone` and `GrChangeMode`; null while no mode
    /// is in force.
    GrContext* context = nullptr;

    /// Makes a context over the screen, limited to a region in screen coordinates, with its origin at the
    /// given point. It fits the present mode only. The caller deletes it. Null before the first mode.
    GrContext* (*createScreenContext)(GrRegion const& limit, int originX, int originY) = nullptr;

    /// Makes a context over an image of the screen's pixel format. The caller deletes it, before the image.
    /// Null before the first mode.
    GrContext* (*createImageContext)(GrImage* image) = nullptr;

    /// Error rows for dithering on the screen, `width` times 3; only while `bytesPerPixel` is below 3. Owned
    /// and used by the library alone.
    std::int32_t* ditherLine = nullptr;
};

/// For reading, on the application's thread. Only the session writes it.
GR_API extern GrScreenRecord GrScreen;

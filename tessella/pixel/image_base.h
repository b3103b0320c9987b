#pragma once

#include <tessella/image.h>
#include <tessella/pixel/context_base.h>

#include <cstddef>
#include <memory>

/// The fields of an image context: size, flags and planes as they are when the context is made.
struct GrImageContextState : GrContextI {
    GrImageContextState(GrImage const& image, int bytesPerPixel)
        : clip(GrRect{0, 0, image.width, image.height}), limit(clip), height(image.height),
          width(image.width), flags(image.flags), pixels(image.pixels), alphaPlane(image.alphaPlane),
          stride(static_cast<std::uint32_t>(image.width) * static_cast<std::uint32_t>(bytesPerPixel))
    {}

protected:
    GrRegion clip;
    GrRegion limit;
    std::int32_t height, width;
    std::uint8_t pattern[8] = {0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF};
    std::uint32_t flags;
    bool patternTransparent = false;
    std::unique_ptr<std::int32_t[]> ditherRows;  // three rows of `width`, in the formats that dither
    std::int32_t baseOriginX = 0, baseOriginY = 0;
    std::int32_t originX = 0, originY = 0;
    unsigned char* pixels;      // the image's; may be null
    unsigned char* alphaPlane;  // the image's; may be null
    std::uint32_t stride;
};

/// Contexts over an image of `N` bytes a pixel, which must outlive them.
template <int N>
class GrImageContextBase : public GrContextBase<GrImageContextState> {
public:
    void SetBaseOrigin(int x, int y) override
    {
        baseOriginX = originX = x;
        baseOriginY = originY = y;
    }

    void SetLimitRegion(GrRegion const& region) override
    {
        limit = region;
        limit.Offset(baseOriginX, baseOriginY);
        clip = limit;
    }

protected:
    explicit GrImageContextBase(GrImage const& image) : GrContextBase(image, N) {}

    /// Images need no lock.
    struct Guard {
        explicit Guard(GrRegion const&) {}
        explicit Guard(GrRect const&) {}
    };
    struct TextGuard {
        explicit TextGuard(GrImageContextBase const&) {}
    };
    struct WalkGuard {
        WalkGuard(GrImageContextBase const&, GrRegion const&) {}
        WalkGuard(GrImageContextBase const&, GrRect const&) {}
    };

    /// False over an image that has alpha values only.
    bool HasPixels() const { return pixels != nullptr; }
    unsigned char* PixelBase() const { return pixels; }
    std::ptrdiff_t Stride() const { return stride; }
    std::int32_t* ErrorRows() const { return ditherRows.get(); }
};

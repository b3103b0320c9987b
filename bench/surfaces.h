#pragma once

#include <tessella/image.h>

#include <cstddef>
#include <cstdint>
#include <memory>

struct SDL_Surface;
union pixman_image;

constexpr int kSurfaceHeight = 768;

struct PixmanImageDeleter {
    void operator()(pixman_image* image) const;
};
struct SdlSurfaceDeleter {
    void operator()(SDL_Surface* surface) const;
};
using PixmanImage = std::unique_ptr<pixman_image, PixmanImageDeleter>;
using SdlSurface = std::unique_ptr<SDL_Surface, SdlSurfaceDeleter>;

/// A screen's worth of memory, on a page boundary like a framebuffer's, which every contender sees as an
/// image of its own. Its width gives the pitch.
class Surface {
public:
    /// `bits` is 8, 16, 24 or 32.
    Surface(int width, int bits);
    ~Surface();
    Surface(Surface const&) = delete;

    int Bits() const { return bits; }
    int Bytes() const { return bits / 8; }
    std::ptrdiff_t Stride() const { return std::ptrdiff_t{width} * Bytes(); }
    unsigned char* Row(int y) const { return memory + y * Stride(); }
    std::size_t Size() const { return static_cast<std::size_t>(kSurfaceHeight * Stride()); }

    /// A context of our own through the public interface, with the fore colour set.
    std::unique_ptr<GrContext> NewContext() const;
    PixmanImage NewPixmanImage() const;
    SdlSurface NewSdlSurface() const;

    /// The pixel that the contexts paint with.
    std::uint32_t Pixel() const { return pixel; }

private:
    int width, bits;
    unsigned char* memory;
    GrImage image;
    std::uint32_t pixel = 0;
};

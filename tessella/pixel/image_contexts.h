#pragma once

#include <tessella/pixel/generic_context.h>
#include <tessella/pixel/image_base.h>

/// The context over an image in memory: what it adds are its making, and the streams that fill images and are
/// made of them. In the formats that dither it brings error rows.
template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
class GrImageContext final
    : public GrGenericContext<GrGenericSurface<GrImageContextBase<Surface::kBytes>, Surface>, Colors> {
public:
    explicit GrImageContext(GrImage const& image);

    void LoadPixels(std::uint8_t const* data, unsigned step) override;
    void LoadPixelsDithered(std::uint8_t const* data, std::uint8_t const* alpha, unsigned step) override;
    void UnloadPixels(std::uint8_t* data, unsigned step) override;
};

/// A new context over `image`, with what its format needs for converting. The caller deletes it, before the
/// image. Instantiated for every image format there is.
template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
GrContext* CreateImageContext(GrImage* image);

#include <tessella/pixel/image_streams.inl>

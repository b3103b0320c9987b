#pragma once

#include <tessella/pixel/generic_context.h>
#include <tessella/pixel/image_base.h>

/// The context over an image in memory; it adds nothing but its making. In the formats that dither it brings
/// error rows.
template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
class GrImageContext final
    : public GrGenericContext<GrGenericSurface<GrImageContextBase<Surface::kBytes>, Surface>, Colors> {
public:
    explicit GrImageContext(GrImage const& image);
};

/// A new context over `image`, with what its format needs for converting. The caller deletes it, before the
/// image. Instantiated for every image format there is.
template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
GrContext* CreateImageContext(GrImage* image);

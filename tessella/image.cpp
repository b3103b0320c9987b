#include <tessella/image.h>

#include <common/assert.h>
#include <tessella/pixel/image_contexts.h>
#include <tessella/screen.h>

#include <memory>

namespace {

constexpr char kSource[] = GR_SOURCE("tessella/image");
constexpr std::uint32_t kChangeableFlags = GrImageNoDither | GrImageOverBack;

/// An alpha plane goes with true colour only.
std::uint32_t CompleteFlags(std::uint32_t flags)
{
    return flags & GrImageHasAlpha ? flags | GrImageTrueColor : flags;
}

/// Contexts over images are of this one kind, whichever factory made them.
std::unique_ptr<GrContextI> NewImageContext(GrImage const& image)
{
    return std::unique_ptr<GrContextI>(static_cast<GrContextI*>(image.GetContext()));
}

}

GrImage::GrImage(int imageWidth, int imageHeight, std::uint32_t imageFlags)
    : width(imageWidth), height(imageHeight), bits(static_cast<std::int32_t>(GrScreen.depth)),
      bytes(static_cast<std::int32_t>(GrScreen.bytesPerPixel)), flags(CompleteFlags(imageFlags)),
      pixels(nullptr), alphaPlane(nullptr)
{
    if (flags & GrImageTrueColor) {
        bits = 32;
        bytes = 4;
    }
    if (width <= 0 || height <= 0) return;
    std::size_t const area = static_cast<std::size_t>(width) * static_cast<std::size_t>(height);
    constexpr std::uint32_t kNoPixels = GrImageHasAlpha | GrImageAlphaOnly;
    if ((flags & kNoPixels) != kNoPixels) pixels = new unsigned char[area * static_cast<unsigned>(bytes)]();
    if (flags & GrImageHasAlpha) {
        try {
            alphaPlane = new unsigned char[area];
        } catch (...) {
            delete[] pixels;
            throw;
        }
    }
}

GrImage::GrImage(int imageWidth, int imageHeight, unsigned char* ownedPixels, unsigned char* ownedAlpha,
    std::uint32_t imageFlags)
    : width(imageWidth), height(imageHeight), flags(CompleteFlags(imageFlags)), pixels(ownedPixels),
      alphaPlane(ownedAlpha)
{
    if (flags & GrImageTrueColor) {
        bits = 32;
        bytes = 4;
    }
}

GrImage::~GrImage()
{
    delete[] pixels;
    delete[] alphaPlane;
}

void GrImage::Detach()
{
    pixels = nullptr;
    alphaPlane = nullptr;
}

void GrImage::SetFlags(std::uint32_t newFlags)
{
    flags = (flags & ~kChangeableFlags) | (newFlags & kChangeableFlags);
}

void GrImage::Load(unsigned char const* data, unsigned step)
{
    flags |= GrImagePremultiplied;  // before the context is made: it decides the context's class
    if (auto const context = NewImageContext(*this)) context->LoadPixels(data, step);
}

void GrImage::Unload(unsigned char* data, unsigned step)
{
    if (auto const context = NewImageContext(*this)) context->UnloadPixels(data, step);
}

GrContext* GrImage::GetContext() const
{
    // The image stays as it is: what a context draws on are the pixels that it points to.
    auto* const image = const_cast<GrImage*>(this);
    if (isTrueColor())
        return flags & GrImagePremultiplied ? CreateImageContext<GrSurface32, GrColorsRGBA>(image)
                                            : CreateImageContext<GrSurface32, GrColorsRGB>(image);

    // An image that was made in another mode may have the depth of this one and pixels of another width.
    bool const isScreens = static_cast<std::uint32_t>(bits) == GrScreen.depth &&
        static_cast<std::uint32_t>(bytes) == GrScreen.bytesPerPixel;
    if (GrScreen.createImageContext && isScreens) return GrScreen.createImageContext(image);

    switch (bits) {
    case 4: return CreateImageContext<GrSurface8, GrColors4>(image);
    case 8: return CreateImageContext<GrSurface8, GrColors8>(image);
    case 15: return CreateImageContext<GrSurface16, GrColors15>(image);
    case 16: return CreateImageContext<GrSurface16, GrColors16>(image);
    case 24:
        return bytes == 4 ? CreateImageContext<GrSurface32, GrColors24>(image)
                          : CreateImageContext<GrSurface24, GrColors24>(image);
    case 32: return CreateImageContext<GrSurface32, GrColors24>(image);
    default: GR_ASSERT_TEXT(false, "false"); return nullptr;
    }
}

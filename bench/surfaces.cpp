#include <bench/surfaces.h>

#include <SDL.h>
#include <pixman.h>

#include <cstdlib>
#include <cstring>
#include <new>

namespace {

constexpr std::size_t kPage = 4096;
constexpr GrColor kColor = GrMakeColor(32, 96, 160);  // no two bytes of its pixels are the same

unsigned char* NewPages(std::size_t size)
{
    void* const pages = std::aligned_alloc(kPage, (size + kPage - 1) / kPage * kPage);
    if (pages == nullptr) throw std::bad_alloc();
    std::memset(pages, 0, size);
    return static_cast<unsigned char*>(pages);
}

}

void PixmanImageDeleter::operator()(pixman_image* image) const { pixman_image_unref(image); }

void SdlSurfaceDeleter::operator()(SDL_Surface* surface) const { SDL_FreeSurface(surface); }

Surface::Surface(int surfaceWidth, int bitsPerPixel)
    : width(surfaceWidth), bits(bitsPerPixel), memory(NewPages(Size())),
      image(surfaceWidth, kSurfaceHeight, memory, nullptr, 0)
{
    image.bits = bits;
    image.bytes = Bytes();
    NewContext()->FillRegion(GrRect{0, 0, 1, 1});
    std::memcpy(&pixel, memory, static_cast<std::size_t>(Bytes()));
}

Surface::~Surface()
{
    image.Detach();
    std::free(memory);
}

std::unique_ptr<GrContext> Surface::NewContext() const
{
    std::unique_ptr<GrContext> context(image.GetContext());
    context->SetForeColor(kColor);
    return context;
}

PixmanImage Surface::NewPixmanImage() const
{
    pixman_format_code_t const formats[] = {PIXMAN_a8, PIXMAN_r5g6b5, PIXMAN_r8g8b8, PIXMAN_x8r8g8b8};
    return PixmanImage(pixman_image_create_bits(formats[Bytes() - 1], width, kSurfaceHeight,
        reinterpret_cast<std::uint32_t*>(memory), static_cast<int>(Stride())));
}

SdlSurface Surface::NewSdlSurface() const
{
    Uint32 const formats[] = {
        SDL_PIXELFORMAT_INDEX8, SDL_PIXELFORMAT_RGB565, SDL_PIXELFORMAT_BGR24, SDL_PIXELFORMAT_RGB888};
    return SdlSurface(SDL_CreateRGBSurfaceWithFormatFrom(
        memory, width, kSurfaceHeight, bits, static_cast<int>(Stride()), formats[Bytes() - 1]));
}

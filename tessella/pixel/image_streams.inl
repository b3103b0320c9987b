#include <tessella/pixel/error_rows.h>

// A pixel of a stream begins with red, green and blue, the order of a colour's own bytes.
inline GrColor ColorAt(std::uint8_t const* bytes) { return GrMakeColor(bytes[0], bytes[1], bytes[2]); }

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void GrImageContext<Surface, Colors>::LoadPixels(std::uint8_t const* data, unsigned step)
{
    if (this->width < 1) return;
    if (Colors::kDithers && !(this->flags & GrImageNoDither)) {
        LoadPixelsDithered(data, this->alphaPlane, step);
        return;
    }
    unsigned char* alpha = this->alphaPlane;
    for (int y = 0; y < this->height; ++y) {
        unsigned char* const row = this->pixels ? this->RowAddress(y) : nullptr;
        for (int x = 0; x < this->width; ++x, data += step) {
            GrColor color = ColorAt(data);
            if (alpha) {
                color |= static_cast<GrColor>(data[3]) << 24;
                *alpha++ = data[3];
            }
            if (row) this->WritePixel(row, x, Colors::ToPixel(color));
        }
    }
}

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void GrImageContext<Surface, Colors>::LoadPixelsDithered(
    std::uint8_t const* data, std::uint8_t const* alpha, unsigned step)
{
    if constexpr (Colors::kDithers) {
        if (!this->pixels || this->width < 1) return;
        GrErrorRows errors(this->ditherRows.get(), this->width);
        for (int y = 0; y < this->height; ++y) {
            errors.StartRow();
            unsigned char* const row = this->RowAddress(y);
            for (int x = 0; x < this->width; ++x, data += step)
                if (!alpha || *alpha++ == 255)
                    this->WritePixel(row, x, errors.template Diffuse<Colors>(ColorAt(data), x));
        }
    }
}

template <GrSurfacePolicy Surface, GrColorsPolicy Colors>
void GrImageContext<Surface, Colors>::UnloadPixels(std::uint8_t* data, unsigned step)
{
    if (!this->pixels || this->width < 1) return;
    for (int y = 0; y < this->height; ++y) {
        unsigned char* const row = this->RowAddress(y);
        for (int x = 0; x < this->width; ++x, data += step) {
            bool const isLast = y == this->height - 1 && x == this->width - 1;
            std::uint64_t const color =
                Colors::FromPixel(static_cast<typename Colors::Pixel>(Surface::ReadPixel(row, x)));
            std::memcpy(data, &color, isLast ? 3 : sizeof color);
        }
    }
}

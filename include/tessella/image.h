#pragma once

#include <tessella/context.h>
#include <tessella/export.h>

#include <cstdint>

/// Flags of a `GrImage`.
enum : std::uint32_t {
    GrImageNoDither = 4,            ///< do not diffuse errors when converting; changeable with `SetFlags`
    GrImageHasAlpha = 8,            ///< there is an alpha plane; implies `GrImageTrueColor`
    GrImageOverBack = 16,           ///< blend over the context's back colour; changeable with `SetFlags`
    GrImageAlphaOnly = 32,          ///< with `GrImageHasAlpha`: the image has no `pixels`
    GrImageTrueColor = 0x10000,     ///< 4 bytes a pixel, the pixel being a `GrColor`
    GrImagePremultiplied = 0x20000  ///< true-colour pixels are premultiplied by their alpha
};

/// A picture in memory, in some pixel format, with an optional plane of alpha values.
///
/// An image has no lock: one thread at a time uses it and its contexts.
class GR_API GrImage {
public:
    std::int32_t width;         ///< in pixels
    std::int32_t height;        ///< in pixels
    std::int32_t bits;          ///< the format's depth: 4, 8, 15, 16, 24 or 32
    std::int32_t bytes;         ///< bytes a pixel
    std::uint32_t flags;        ///< `GrImageNoDither` and the others
    unsigned char* pixels;      ///< rows from the top, without padding between them; owned; may be null
    unsigned char* alphaPlane;  ///< one byte a pixel; owned; may be null

    /// An image of black pixels in the screen's format as it is now, or in true colour if `imageFlags` say
    /// so. The alpha plane, if asked for, is not initialised. Without a positive width and height there is
    /// neither. If memory runs out, `std::bad_alloc` leaves the constructor.
    GrImage(int imageWidth, int imageHeight, std::uint32_t imageFlags);

    /// An image around pixels and alpha values allocated with `new[]`, either of which may be null; the image
    /// owns them from now on. Meant for true colour (`bits` 32, `bytes` 4): without `GrImageTrueColor` or
    /// `GrImageHasAlpha` in `imageFlags`, `bits` and `bytes` are uninitialised and the caller assigns them.
    GrImage(int imageWidth, int imageHeight, unsigned char* ownedPixels, unsigned char* ownedAlpha,
        std::uint32_t imageFlags);

    GrImage(GrImage const&) = delete;
    GrImage& operator=(GrImage const&) = delete;
    ~GrImage();

    /// Lets go of pixels and alpha plane without releasing them; they are the caller's from now on. Contexts
    /// made before still draw on them.
    void Detach();

    /// A new context over the image, in its format, with the image's size as its limit. The caller deletes
    /// it, before the image. Null for `bits` that no format has, after a failed assertion. `bytes` tell the
    /// two formats of 24 bits apart, and count for no other one. An image made in the screen's format keeps
    /// its own when the mode changes.
    GrContext* GetContext() const;

    /// Fills the image from a stream of `width` times `height` pixels, row after row from the top. A pixel
    /// begins with its red, green and blue bytes; `step` is the distance from one to the next, usually 3
    /// or 4; the bytes that a larger one passes over are not looked at, and with a smaller one pixels share
    /// bytes. The image counts as premultiplied from here on, for contexts made later, too: the colours of a
    /// true-colour image are multiplied by their alpha, and become 0 if there is no alpha plane.
    ///
    /// An image with an alpha plane takes it from the fourth byte of each pixel, of which there must be one.
    /// But formats of at most 16 bits diffuse their errors, unless `GrImageNoDither` is set, and then expect
    /// the alpha plane to be filled already: pixels with a value below 255 are left alone, and fourth bytes
    /// are not looked at. Nothing happens if the image's format has no context, or its size no pixels.
    void Load(unsigned char const* data, unsigned step);

    /// Writes the image as a stream like that of `Load`, without the alpha plane. All pixels but the last
    /// write 8 bytes from their place on, red, green, blue, the colour's alpha and zeros, which the next ones
    /// overwrite in part; the last writes 3. With a `step` of 3, the buffer needs room for 2 bytes behind the
    /// stream, with one below 3 for 8 - 2 * `step`, and with a `step` of 4 or more for none. Below 3, only
    /// the first `step` bytes of a pixel remain; above 8, the bytes between are not touched. An image without
    /// pixels writes nothing.
    void Unload(unsigned char* data, unsigned step);

    /// Changes `GrImageNoDither` and `GrImageOverBack` to what `newFlags` say, and nothing else. Contexts
    /// made before keep the old ones.
    void SetFlags(std::uint32_t newFlags);

    /// True if a pixel is a `GrColor`.
    bool isTrueColor() const { return (flags & GrImageTrueColor) != 0; }
};

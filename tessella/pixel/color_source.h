#pragma once

#include <tessella/color.h>
#include <tessella/pixel/pixel_extent.h>

class GrContext;

/// A context to copy colours from. Those of the library's own classes give many at a time, the same that
/// their `GetPixel` would.
class GrColorSource {
public:
    explicit GrColorSource(GrContext& copied);

    /// True if colours may be read before some pixels are written: they are not the source's own. Of contexts
    /// of other classes nothing is known, and they are asked pixel by pixel.
    bool MayReadAhead(GrPixelExtent const& written) const { return read && !extent.Meets(written); }

    /// `count` colours from context point `x`, `y` on; 0 outside the clip. They are put into `room`, unless
    /// they lie somewhere as they are.
    GrColor const* Read(int x, int y, int count, GrColor* room) const
    {
        return read(source, x, y, count, room);
    }

private:
    template <typename Context>
    bool IsOf();

    GrContext& source;
    GrPixelExtent extent{};
    GrColor const* (*read)(GrContext& source, int x, int y, int count, GrColor* room) = nullptr;
};

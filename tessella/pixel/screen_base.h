#pragma once

#include <tessella/pixel/context_base.h>
#include <tessella/screen.h>
#include <tessella/screen_guard.h>

#include <cstddef>
#include <optional>

/// The fields of a screen context. Surface coordinates are screen coordinates.
struct GrScreenContextState : GrContext {
    GrScreenContextState(GrRegion const& region, int x, int y)
        : clip(region), limit(region), baseOriginX(x), baseOriginY(y), originX(x), originY(y)
    {}

protected:
    GrRegion clip;
    std::uint8_t pattern[8] = {0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF};
    bool patternTransparent = false;
    GrRegion limit;
    std::int32_t baseOriginX, baseOriginY;
    std::int32_t originX, originY;
};

/// Contexts over the mapped framebuffer. They hold no address: base and stride are read from `GrScreen` at
/// each use, since the mapping can go, with the session or for a new mode, while a context lives.
class GrScreenContextBase : public GrContextBase<GrScreenContextState> {
protected:
    using GrContextBase::GrContextBase;

    /// Held around every access to pixels.
    using Guard = GrScreenGuard;

    /// Held around a string of text, over nothing: the cursor only goes where glyphs land.
    class TextGuard {
    public:
        explicit TextGuard(GrScreenContextBase& drawnContext) : context(drawnContext)
        {
            context.textGuard = &guard;
        }
        ~TextGuard() { context.textGuard = nullptr; }
        TextGuard(TextGuard const&) = delete;
        TextGuard& operator=(TextGuard const&) = delete;

    private:
        GrScreenContextBase& context;
        GrScreenGuard const guard{GrRect{}};
    };

    /// The guard of one walk over the clip; within a text's, that is extended.
    class WalkGuard {
    public:
        template <typename Area>
        WalkGuard(GrScreenContextBase const& context, Area const& area)
        {
            if (context.textGuard)
                context.textGuard->Extend(area);
            else
                own.emplace(area);
        }

    private:
        std::optional<GrScreenGuard> own;
    };

    /// False while there is no mapping, or the kernel refused it: nothing is painted then.
    static bool HasPixels();
    static unsigned char* PixelBase() { return GrScreen.fbMemory; }
    static std::ptrdiff_t Stride() { return GrScreen.stride; }
    static std::int32_t* ErrorRows() { return GrScreen.ditherLine; }

private:
    GrScreenGuard const* textGuard = nullptr;  // while text is drawn
};

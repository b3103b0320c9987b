#pragma once

#include <tessella/context.h>

#include <array>
#include <cstdint>
#include <cstring>
#include <functional>
#include <vector>

/// The judge of contexts: a picture painted pixel by pixel, with the clip as one flag a pixel. It is slow and
/// knows nothing of bands, spans or widths beyond a pixel's bytes. Coordinates off the surface are outside
/// its limit, as they are outside that of a context.
class Canvas {
public:
    struct Format {
        int bits, bytes;
        bool dithers;
        std::uint32_t allBits;
        std::function<std::uint32_t(GrColor)> toPixel;
        std::function<GrColor(std::uint32_t)> fromPixel;
        bool readable = true;  // else the context sees 0 everywhere, and blends over the back colour
    };
    template <typename Surface, typename Colors>
    static Format FormatOf(int bits = Colors::kBits)
    {
        return {bits, Surface::kBytes, Colors::kDithers, Surface::kAllBits,
            [](GrColor c) { return Colors::ToPixel(c); },
            [](std::uint32_t p) { return Colors::FromPixel(static_cast<typename Colors::Pixel>(p)); }, true};
    }

    /// Error diffusion, a pixel at a time: half to the right, half down.
    class Errors {
    public:
        explicit Errors(int columns = 0) : above(static_cast<std::size_t>(columns)) {}
        void StartRow() { left = {}; }
        std::uint32_t Diffuse(Format const& to, GrColor color, int x)
        {
            auto& column = above[static_cast<std::size_t>(x)];
            GrColor wanted = 0xFF000000;
            for (std::size_t i = 0; i < 3; ++i) {
                int const sum = static_cast<int>(color >> 8 * i & 255) + column[i] + left[i];
                wanted |= static_cast<GrColor>(sum < 0 ? 0 : sum > 255 ? 255 : sum) << 8 * i;
            }
            std::uint32_t const pixel = to.toPixel(wanted);
            GrColor const reached = to.fromPixel(pixel);
            for (std::size_t i = 0; i < 3; ++i)
                left[i] = column[i] = (int(wanted >> 8 * i & 255) - int(reached >> 8 * i & 255)) / 2;
            return pixel;
        }

    private:
        std::vector<std::array<int, 3>> above;
        std::array<int, 3> left = {};
    };

    Format const format;
    int const width, height;
    std::vector<unsigned char> memory;
    int originX = 0, originY = 0;
    std::uint32_t fore = 0, back;

    Canvas(Format pixelFormat, int surfaceWidth, int surfaceHeight, int surfaceStride)
        : format(std::move(pixelFormat)), width(surfaceWidth), height(surfaceHeight),
          memory(static_cast<std::size_t>(surfaceStride * surfaceHeight)), back(format.allBits),
          stride(surfaceStride), limit(static_cast<std::size_t>(width * height), true), clip(limit)
    {}

    void SetClipRegion(GrRegion const& region)
    {
        ForEachPixel([&](int x, int y, std::size_t i) {
            clip[i] = limit[i] && region.Contains(x - originX, y - originY);
        });
    }
    void ExcludeClipRect(GrRect const& rect) { ExcludeClipRegion(rect); }
    void ExcludeClipRegion(GrRegion const& region)
    {
        ForEachPixel([&](int x, int y, std::size_t i) {
            if (region.Contains(x - originX, y - originY)) clip[i] = false;
        });
    }
    void ResetClipRegion() { clip = limit; }
    void SetLimit(GrRegion const& region)
    {
        ForEachPixel([&](int x, int y, std::size_t i) { limit[i] = clip[i] = region.Contains(x, y); });
    }
    void SetBaseOrigin(int x, int y)
    {
        baseX = originX = x;
        baseY = originY = y;
    }
    void SetOrigin(int x, int y)
    {
        originX = baseX + x;
        originY = baseY + y;
    }
    void SetForeColor(GrColor color) { fore = format.toPixel(color); }
    void SetBackColor(GrColor color) { back = format.toPixel(color); }
    void SetPattern(std::uint8_t const bits[8], int dx, int dy, bool isTransparent)
    {
        for (int y = 0; y < 8; ++y)
            for (int x = 0; x < 8; ++x)
                pattern[y][x] = bits[((y - dy) % 8 + 8) % 8] >> ((x - dx) % 8 + 8) % 8 & 1;
        transparent = isTransparent;
    }
    void SetRasterMode(std::uint32_t mode) { copies = mode == 4; }

    void DrawPixel(int x, int y) { Paint(x + originX, y + originY); }
    void FillRegion(GrRegion const& region)
    {
        ForEachPixel([&](int x, int y, std::size_t) {
            if (region.Contains(x - originX, y - originY)) Paint(x, y);
        });
    }
    GrColor GetPixel(int x, int y) const
    {
        x += originX;
        y += originY;
        if (!InClip(x, y)) return 0;
        return format.fromPixel(Seen(x, y));
    }
    std::uint32_t Seen(int x, int y) const { return format.readable ? Read(x, y) : 0; }
    std::uint32_t Under(int x, int y, bool overDestination) const
    {
        return overDestination && format.readable ? Read(x, y) : back;
    }

    /// A pixel of the surface, wherever the clip lies; and painting it within the clip.
    std::uint32_t Read(int x, int y) const
    {
        std::uint32_t pixel = 0;
        std::memcpy(&pixel, memory.data() + Offset(x, y), static_cast<std::size_t>(format.bytes));
        return pixel;
    }
    void Write(int x, int y, std::uint32_t pixel)
    {
        std::memcpy(memory.data() + Offset(x, y), &pixel, static_cast<std::size_t>(format.bytes));
    }
    void Paint(int x, int y)
    {
        if (!InClip(x, y) || !PatternPaints(x, y)) return;
        Write(x, y, !copies ? ~Read(x, y) : pattern[y % 8][x % 8] ? fore : back);
    }
    bool PatternPaints(int x, int y) const { return pattern[y % 8][x % 8] || !transparent; }

    /// A colour over another one; `share` of 256 of it, unless it was multiplied by its alpha already.
    static GrColor Mixed(GrColor color, GrColor under, int alpha, int share)
    {
        GrColor mixed = 0xFF000000;
        for (int shift = 0; shift < 24; shift += 8) {
            int const own = color >> shift & 255, other = under >> shift & 255;
            mixed |= static_cast<GrColor>(own * share / 256 + other * (255 - alpha) / 256) << shift;
        }
        return mixed;
    }

    bool InClip(int x, int y) const
    {
        return x >= 0 && y >= 0 && x < width && y < height && clip[static_cast<std::size_t>(y * width + x)];
    }

private:
    template <typename Visit>
    void ForEachPixel(Visit visit) const
    {
        for (int y = 0; y < height; ++y)
            for (int x = 0; x < width; ++x)
                visit(x, y, static_cast<std::size_t>(y * width + x));
    }
    std::size_t Offset(int x, int y) const { return static_cast<std::size_t>(y * stride + x * format.bytes); }

    int stride;
    std::vector<bool> limit, clip;
    int baseX = 0, baseY = 0;
    bool pattern[8][8] = {{1, 1, 1, 1, 1, 1, 1, 1}, {1, 1, 1, 1, 1, 1, 1, 1}, {1, 1, 1, 1, 1, 1, 1, 1},
        {1, 1, 1, 1, 1, 1, 1, 1}, {1, 1, 1, 1, 1, 1, 1, 1}, {1, 1, 1, 1, 1, 1, 1, 1},
        {1, 1, 1, 1, 1, 1, 1, 1}, {1, 1, 1, 1, 1, 1, 1, 1}};
    bool transparent = false;
    bool copies = true;
};

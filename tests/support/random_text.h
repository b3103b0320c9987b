#pragma once

#include <support/canvas.h>
#include <tessella/font.h>

#include <gtest/gtest.h>

#include <random>
#include <set>
#include <utility>

/// Random text in fonts of random glyphs, on a context and on the canvas that judges it: pixel by pixel, one
/// glyph after the other.
class RandomText {
public:
    RandomText(GrContext& drawnContext, Canvas& judgingCanvas, unsigned seed)
        : context(drawnContext), canvas(judgingCanvas), random(seed)
    {}

    void Step()
    {
        Font font(random);
        int const x = Number(-20, canvas.width), y = Number(-5, canvas.height + 5);
        bool const transparent = Number(0, 1) != 0;
        unsigned short text[6];
        unsigned char bytes[6];
        bool const wide = Number(0, 1) != 0;
        for (int i = 0; i < 6; ++i)
            text[i] = bytes[i] = static_cast<unsigned char>(random() % 8);
        if (wide) text[3] = 0x4E00;
        auto const length = static_cast<unsigned>(Number(0, 6));
        if (font.valid) Judge(x, y, text, length, font, transparent);
        if (wide)
            context.DrawTextW(x, y, text, length, &font, transparent);
        else
            context.DrawText(x, y, bytes, length, &font, transparent);
    }

private:
    /// Code 7 has no glyph, 5 may lead back, 0x4E00 has the glyph of 1, and some have no pixels.
    struct Font : GrFontBase {
        explicit Font(std::mt19937& random) : GrFontBase(false, 400)
        {
            valid = random() % 20 != 0;
            embolden = random() % 3 == 0;
            height = random() % 20;
            ascent = random() % 20;
            kerns = random() % 2 != 0;
            for (int code = 0; code < 7; ++code) {
                auto& [top, left, advance, width, rows, pitch, bitsPerPixel, data] = glyphs[code];
                top = static_cast<int>(random() % 30) - 10;
                left = static_cast<int>(random() % 9) - 4;
                advance = random() % 12 - (code == 5 ? 6 : 0);
                width = random() % (code == 6 ? 80 : 20);
                rows = random() % 18;
                bitsPerPixel = random() % 3 == 0 ? 8 : 1;
                pitch = random() % 2 != 0 ? (width + 7) / 8 + random() % 2 : 0;
                for (unsigned i = 0; i < width * rows; ++i)
                    bytes[code].push_back(static_cast<unsigned char>(
                        random() % 3 != 0 || bitsPerPixel == 1 ? random() : random() % 2 * 255));
                // Not a byte more than a font must have.
                if (bitsPerPixel == 1) bytes[code].resize(pitch != 0 ? pitch * rows : (width * rows + 7) / 8);
                bytes[code].shrink_to_fit();
                data = bytes[code].data();
            }
        }
        unsigned GetTextWidth(unsigned char const*, unsigned) override { return 0; }
        unsigned GetTextWidthW(unsigned short const*, unsigned) override { return 0; }
        bool GetGlyph(unsigned code, GrGlyphInfo& info) override
        {
            if (code == 7) return false;
            info = glyphs[code == 0x4E00 ? 1 : code];
            return true;
        }
        bool GetKerning(int out[2], unsigned code, unsigned previous) override
        {
            EXPECT_NE(previous, 0u);
            out[0] = static_cast<int>(code % 5) - 2;
            out[1] = static_cast<int>(previous % 7) - 3;
            return kerns && code != previous;
        }
        GrGlyphInfo glyphs[7];
        std::vector<unsigned char> bytes[7];
        bool kerns;
    };

    int Number(int from, int to) { return std::uniform_int_distribution(from, to)(random); }

    void Judge(int x, int y, unsigned short const* text, unsigned length, Font& font, bool transparent)
    {
        int pen = x + canvas.originX, previous = 0;
        int const first = pen, baseline = y + canvas.originY, top = baseline - static_cast<int>(font.ascent);
        std::set<std::pair<int, int>> boxes;
        for (; length > 0; --length, previous = *text++) {
            GrGlyphInfo glyph;
            if (!font.GetGlyph(*text, glyph)) continue;
            int left = pen + glyph.left, glyphTop = baseline - glyph.top, shift[2];
            if (previous != 0 && font.GetKerning(shift, *text, static_cast<unsigned>(previous))) {
                left += shift[0];
                glyphTop += shift[1];
            }
            auto const width = static_cast<int>(glyph.width), rows = static_cast<int>(glyph.rows);
            for (int v = 0; v < rows; ++v)
                for (int u = 0; u < width + font.embolden; ++u)
                    boxes.emplace(left + u, glyphTop + v);
            Strike(left, glyphTop, glyph, transparent);
            if (font.embolden && !transparent) {
                bool const grey = glyph.bitsPerPixel != 1;
                int const u = left + width - grey * canvas.originX, v = glyphTop - grey * canvas.originY;
                for (int i = v; i < v + rows; ++i)
                    if (canvas.InClip(u, i) && canvas.PatternPaints(u, i)) canvas.Write(u, i, canvas.back);
            }
            if (font.embolden) Strike(left + 1, glyphTop, glyph, true);
            pen += static_cast<int>(glyph.advance) + font.embolden;
        }
        for (int v = top; !transparent && v < top + static_cast<int>(font.height); ++v)
            for (int u = first; u < pen; ++u)
                if (!boxes.contains({u, v}) && canvas.InClip(u, v)) canvas.Write(u, v, canvas.back);
    }

    void Strike(int left, int top, GrGlyphInfo const& glyph, bool transparent)
    {
        auto const width = static_cast<int>(glyph.width), pitch = static_cast<int>(glyph.pitch);
        for (int v = 0; v < static_cast<int>(glyph.rows); ++v)
            for (int u = 0; u < width; ++u) {
                int const x = left + u, y = top + v, streamed = v * width + u;
                if (!canvas.InClip(x, y)) continue;
                if (glyph.bitsPerPixel != 1) {
                    Blend(x, y, glyph.bits[streamed], transparent);
                    continue;
                }
                bool const set = pitch == 0 ? glyph.bits[streamed / 8] >> streamed % 8 & 1
                                            : glyph.bits[v * pitch + u / 8] >> (7 - u % 8) & 1;
                if (!transparent)
                    canvas.Write(x, y, set ? canvas.fore : canvas.back);
                else if (set)
                    canvas.Paint(x, y);
            }
    }

    void Blend(int x, int y, int alpha, bool overDestination)
    {
        std::uint32_t const under = canvas.Under(x, y, overDestination);
        GrColor const mixed =
            Canvas::Mixed(canvas.format.fromPixel(canvas.fore), canvas.format.fromPixel(under), alpha, alpha);
        canvas.Write(x, y, alpha == 0 ? under : alpha == 255 ? canvas.fore : canvas.format.toPixel(mixed));
    }

    GrContext& context;
    Canvas& canvas;
    std::mt19937 random;
};

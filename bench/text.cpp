#include <bench/rows.h>
#include <bench/shapes.h>
#include <bench/surfaces.h>
#include <common/bundle_api.h>
#include <common/library_path.h>
#include <tessella/font_factory.h>
#include <tessella/screen.h>
#include <tessella/screen_guard.h>
#include <tessella/video_mode.h>

#include <SDL.h>
#include <benchmark/benchmark.h>
#include <malloc.h>
#include <pixman.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <random>
#include <string>
#include <utility>
#include <vector>

// Lines of text on the screen, its lock taken and its clip applied, beside glyphs that a peer has been given
// beforehand and blits one by one.

namespace {

constexpr unsigned kLength = 80;
constexpr int kBaseline = 12;
constexpr std::uint32_t kFore = 0x2060A0, kBack = 0x102030;  // 0xRRGGBB

/// Letters of strokes: eight pixels wide, or as they come.
class Letters : public GrFontBase {
public:
    Letters(bool isGrey, bool isProportional) : GrFontBase(isGrey, 400)
    {
        height = isProportional ? 17 : 16;
        ascent = 13;
        valid = true;
        std::mt19937 random(1);
        for (std::size_t i = 0; i < kLetters; ++i) {
            GrGlyphInfo& glyph = glyphs[i];
            glyph.top = isProportional ? 10 + static_cast<int>(i % 3) : 13;
            glyph.left = isProportional;
            glyph.width = isProportional ? 3 + i % 10 : 8;
            glyph.rows = isProportional ? 7 + i % 7 : 16;
            glyph.advance = glyph.width + 2 * isProportional;
            glyph.bitsPerPixel = isGrey ? 8 : 1;
            glyph.pitch = isProportional ? 0 : 1;
            // Two stems and a bar, with soft edges where there are levels.
            std::vector<unsigned char>& levels = grey[i];
            for (unsigned y = 0; y < glyph.rows; ++y)
                for (unsigned x = 0; x < glyph.width; ++x) {
                    bool const ink = x == 1 || x + 2 == glyph.width || y == glyph.rows / 2;
                    bool const edge = x == 2 || x + 1 == glyph.width;
                    levels.push_back(static_cast<unsigned char>(ink ? 255 : edge ? random() % 256 : 0));
                }
            bits[i].resize(levels.size() / 8 + 1);
            for (std::size_t bit = 0; bit < levels.size(); ++bit)
                if (levels[bit] == 255)
                    bits[i][bit / 8] |=
                        static_cast<unsigned char>(isProportional ? 1 << bit % 8 : 128 >> bit % 8);
            glyph.bits = isGrey ? levels.data() : bits[i].data();
        }
    }

    unsigned GetTextWidth(unsigned char const*, unsigned) override { return 0; }
    unsigned GetTextWidthW(unsigned short const*, unsigned) override { return 0; }
    bool GetGlyph(unsigned code, GrGlyphInfo& info) override
    {
        info = glyphs[code];
        return true;
    }
    bool GetKerning(int[2], unsigned, unsigned) override { return false; }

    /// A glyph's level, of 255, in both kinds of font.
    unsigned char Level(unsigned code, unsigned x, unsigned y) const
    {
        unsigned char const level = grey[code][y * glyphs[code].width + x];
        return smooth || level == 255 ? level : 0;
    }

    static constexpr std::size_t kLetters = 30;

private:
    GrGlyphInfo glyphs[kLetters];
    std::vector<unsigned char> grey[kLetters], bits[kLetters];
};

/// A row in the making: a line of text on a screen.
struct TextRow {
    std::string name;
    Surface& surface;
    Letters& letters;
    bool transparent;
    int tolerance;                      // how far channels of two contenders may be apart
    std::vector<GrColor> picture = {};  // what the first contender painted
    std::vector<unsigned char> text = {};

    TextRow(std::string rowName, Surface& screen, Letters& font, bool isTransparent)
        : name(std::move(rowName)), surface(screen), letters(font), transparent(isTransparent),
          tolerance(!font.smooth        ? 0
                  : screen.Bits() == 16 ? 16
                                        : 3)
    {
        for (unsigned i = 0; i < kLength; ++i)
            text.push_back(static_cast<unsigned char>(i * 7 % 30));
    }

    /// `draw` draws the line at its place.
    template <typename Draw>
    void Add(char const* contender, std::shared_ptr<Draw> draw)
    {
        std::memset(surface.Row(0), 0x5C, surface.Size());
        (*draw)(kBaseline);
        auto const context = surface.NewContext();
        std::vector<GrColor> colors;
        for (int y = 0; y < kBaseline + 10; ++y)
            for (int x = 0; x < kScreenWidth; ++x)
                colors.push_back(context->GetPixel(x, y));
        if (picture.empty()) picture = colors;
        for (std::size_t i = 0; i < colors.size(); ++i)
            for (int shift = 0; shift < 24; shift += 8)
                ExpectSame(std::abs(static_cast<int>(colors[i] >> shift & 255) -
                               static_cast<int>(picture[i] >> shift & 255)) <= tolerance,
                    name);
        AddContender(name, contender, [draw](benchmark::State& state) {
            int y = 0;
            for (auto _ : state) {
                y = (y + 16) % 640;
                (*draw)(kBaseline + y);
                benchmark::ClobberMemory();
            }
        });
    }

    /// Calls `visit` with every glyph, its code and the x of its pen.
    template <typename Visit>
    void ForEachGlyph(Visit visit) const
    {
        int pen = 0;
        for (unsigned char const code : text) {
            GrGlyphInfo glyph;
            letters.GetGlyph(code, glyph);
            visit(glyph, code, pen);
            pen += static_cast<int>(glyph.advance);
        }
    }

    void AddOurs();
    void AddPixman();
    void AddSdl();
};

constexpr GrColor Swapped(std::uint32_t color)
{
    return GrMakeColor(color >> 16 & 255, color >> 8 & 255, color & 255);
}

void TextRow::AddOurs()
{
    GrScreen.fbMemory = surface.Row(0);
    GrScreen.stride = static_cast<std::uint32_t>(surface.Stride());
    unsigned const bits = static_cast<unsigned>(surface.Bits());
    std::shared_ptr<GrContext> const context(
        FindVideoMode(bits, bits == 32 ? 24 : bits)
            ->createScreenContext(GrRect{0, 0, kScreenWidth, kSurfaceHeight}, 0, 0));
    context->SetForeColor(Swapped(kFore));
    context->SetBackColor(Swapped(kBack));
    auto draw = [context, this_ = *this](int y) {
        GrScreen.fbMemory = this_.surface.Row(0);
        GrScreen.stride = static_cast<std::uint32_t>(this_.surface.Stride());
        context->DrawText(0, y, this_.text.data(), kLength, &this_.letters, this_.transparent);
    };
    Add(kOurs, std::make_shared<decltype(draw)>(draw));
}

/// Its own way with text: glyphs in a cache, and a list of them that is composited in one call.
void TextRow::AddPixman()
{
    struct Line {
        pixman_glyph_cache_t* cache = pixman_glyph_cache_create();
        std::vector<pixman_glyph_t> glyphs;
        PixmanImage target, source;
        void operator()(int y)
        {
            pixman_composite_glyphs_no_mask(PIXMAN_OP_OVER, source.get(), target.get(), 0, 0, 0, y, cache,
                static_cast<int>(glyphs.size()), glyphs.data());
        }
    };
    auto line = std::make_shared<Line>();
    pixman_color_t const color{(kFore >> 16) * 257, (kFore >> 8 & 255) * 257, (kFore & 255) * 257, 0xFFFF};
    line->source.reset(pixman_image_create_solid_fill(&color));
    line->target = surface.NewPixmanImage();
    pixman_glyph_cache_freeze(line->cache);
    ForEachGlyph([&](GrGlyphInfo const& glyph, unsigned code, int pen) {
        void* const key = reinterpret_cast<void*>(std::uintptr_t{code} + 1);
        void const* cached = pixman_glyph_cache_lookup(line->cache, line.get(), key);
        if (cached == nullptr) {
            auto const format = letters.smooth ? PIXMAN_a8 : PIXMAN_a1;
            PixmanImage const image(pixman_image_create_bits(
                format, static_cast<int>(glyph.width), static_cast<int>(glyph.rows), nullptr, 0));
            auto* const data = reinterpret_cast<unsigned char*>(pixman_image_get_data(image.get()));
            auto const stride = static_cast<unsigned>(pixman_image_get_stride(image.get()));
            for (unsigned y = 0; y < glyph.rows; ++y)
                for (unsigned x = 0; x < glyph.width; ++x)
                    if (letters.smooth)
                        data[y * stride + x] = letters.Level(code, x, y);
                    else if (letters.Level(code, x, y) != 0)
                        data[y * stride + x / 8] |= static_cast<unsigned char>(1 << x % 8);
            cached =
                pixman_glyph_cache_insert(line->cache, line.get(), key, -glyph.left, glyph.top, image.get());
        }
        line->glyphs.push_back({pen, 0, cached});
    });
    Add(kPixman, line);
}

/// A surface for each letter, of bits or of colours with alpha.
void TextRow::AddSdl()
{
    struct Line {
        std::vector<SdlSurface> letters;
        std::vector<std::pair<SDL_Surface*, SDL_Rect>> glyphs;
        SdlSurface target;
        void operator()(int y)
        {
            for (auto const& [glyph, place] : glyphs) {
                SDL_Rect box = place;
                box.y += y;
                SDL_BlitSurface(glyph, nullptr, target.get(), &box);
            }
        }
    };
    auto line = std::make_shared<Line>();
    line->target = surface.NewSdlSurface();
    line->letters.resize(Letters::kLetters);
    ForEachGlyph([&](GrGlyphInfo const& glyph, unsigned code, int pen) {
        SdlSurface& letter = line->letters[code];
        if (!letter) {
            letter.reset(SDL_CreateRGBSurfaceWithFormat(0, static_cast<int>(glyph.width),
                static_cast<int>(glyph.rows), letters.smooth ? 32 : 1,
                letters.smooth ? SDL_PIXELFORMAT_ARGB8888 : SDL_PIXELFORMAT_INDEX1MSB));
            auto* const data = static_cast<unsigned char*>(letter->pixels);
            for (unsigned y = 0; y < glyph.rows; ++y)
                for (unsigned x = 0; x < glyph.width; ++x) {
                    std::uint32_t const level = letters.Level(code, x, y), pixel = level << 24 | kFore;
                    unsigned char* const row = data + y * static_cast<unsigned>(letter->pitch);
                    if (letters.smooth)
                        std::memcpy(row + x * 4, &pixel, 4);
                    else if (level != 0)
                        row[x / 8] |= static_cast<unsigned char>(128 >> x % 8);
                }
            auto const part = [](std::uint32_t color, int shift) {
                return static_cast<Uint8>(color >> shift);
            };
            SDL_Color const palette[] = {{part(kBack, 16), part(kBack, 8), part(kBack, 0), 255},
                {part(kFore, 16), part(kFore, 8), part(kFore, 0), 255}};
            if (!letters.smooth) SDL_SetPaletteColors(letter->format->palette, palette, 0, 2);
            if (letters.smooth) SDL_SetSurfaceBlendMode(letter.get(), SDL_BLENDMODE_BLEND);
        }
        line->glyphs.push_back({letter.get(), {pen + glyph.left, -glyph.top, 0, 0}});
    });
    Add(kSdl, line);
}

}

void AddRows()
{
    hideCount = 0;  // as in a session with a pointer: the lock is taken
    static Letters bits(false, false), grey(true, false);
    static Letters proportionalBits(false, true), proportionalGrey(true, true);
    static Surface screens[] = {
        {kScreenWidth, 32}, {kScreenWidth, 16}, {kScreenWidth + 16, 32}, {kScreenWidth + 16, 16}};
    for (Surface& screen : screens) {
        std::string const format = ", " + std::to_string(screen.Bits()) + " bits, width " +
            std::to_string(screen.Stride() / screen.Bytes());
        for (Letters* const letters : {&grey, &proportionalGrey}) {
            TextRow row((letters == &grey ? "grey text, 8x16" : "grey text, proportional") + format, screen,
                *letters, true);
            row.AddOurs();
            if (screen.Bits() == 32)
                row.AddPixman();
            else
                row.AddSdl();
        }
        if (screen.Bits() == 16) continue;
        for (Letters* const letters : {&bits, &proportionalBits}) {
            TextRow row((letters == &bits ? "1-bit text, transparent" : "1-bit text, proportional") + format,
                screen, *letters, true);
            row.AddOurs();
            row.AddPixman();
        }
        TextRow row("1-bit text, opaque" + format, screen, bits, false);
        row.AddOurs();
        row.AddSdl();
    }
}

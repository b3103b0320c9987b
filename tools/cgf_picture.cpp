#include <tools/cgf_picture.h>

#include <algorithm>
#include <png.h>

namespace tools {

namespace {

constexpr int kMargin = 8;
constexpr unsigned kSetSize = 256;
constexpr unsigned kRowSize = 16;
constexpr std::size_t kMostPixels = std::size_t{1} << 28;

enum Colour : std::uint8_t { kPaper, kEvenBox, kOddBox, kBaseline, kInk, kColourCount };
constexpr png_byte kColours[kColourCount][3] = {
    {255, 255, 255}, {212, 232, 255}, {255, 232, 196}, {152, 168, 184}, {0, 0, 0}};

/// Half-open, with y downward.
struct Box {
    int x1 = 0, y1 = 0, x2 = 0, y2 = 0;

    void Add(Box const& other)
    {
        *this = {
            std::min(x1, other.x1), std::min(y1, other.y1), std::max(x2, other.x2), std::max(y2, other.y2)};
    }
};

std::size_t PixelsOf(Box const& box)
{
    return static_cast<std::size_t>(box.x2 - box.x1) * static_cast<std::size_t>(box.y2 - box.y1);
}

struct Canvas {
    Box box;
    std::vector<std::uint8_t> pixels;

    explicit Canvas(Box const& itsBox) : box(itsBox), pixels(PixelsOf(box), kPaper) {}
    int Width() const { return box.x2 - box.x1; }
    int Height() const { return box.y2 - box.y1; }

    void Fill(Box const& area, Colour colour)
    {
        for (int y = area.y1; y < area.y2; ++y) {
            auto const row = pixels.begin() + std::ptrdiff_t{y - box.y1} * Width() - box.x1;
            std::fill(row + area.x1, row + area.x2, colour);
        }
    }
};

Box InkOf(Glyph const& glyph, int pen, int baseline)
{
    int const x = pen + glyph.left;
    int const y = baseline - glyph.top;
    return {x, y, x + static_cast<int>(glyph.width), y + static_cast<int>(glyph.rows)};
}

void PaintInk(Canvas& canvas, Glyph const& glyph, Box const& box)
{
    auto ink = glyph.ink.begin();
    for (int y = box.y1; y < box.y2; ++y)
        for (int x = box.x1; x < box.x2; ++x)
            if (*ink++) canvas.Fill({x, y, x + 1, y + 1}, kInk);
}

std::vector<std::uint8_t> Enlarged(Canvas const& canvas, std::size_t scale)
{
    std::vector<std::uint8_t> pixels;
    pixels.reserve(canvas.pixels.size() * scale * scale);
    auto row = canvas.pixels.begin();
    for (; row != canvas.pixels.end(); row += canvas.Width())
        for (std::size_t copy = 0; copy < scale; ++copy)
            std::for_each(row, row + canvas.Width(),
                [&](std::uint8_t pixel) { pixels.insert(pixels.end(), scale, pixel); });
    return pixels;
}

}

void GlyphPicture::AddText(std::u16string_view text)
{
    for (;;) {
        auto const end = text.find(u'\n');
        AddLine(text.substr(0, end));
        nextBaseline += font.height;
        if (end == text.npos) return;
        text.remove_prefix(end + 1);
    }
}

void GlyphPicture::AddLine(std::u16string_view line)
{
    int pen = 0;
    for (char16_t const code : line) {
        auto const* const glyph = font.Find(code);
        if (glyph == nullptr) continue;
        placed.push_back({glyph, pen, nextBaseline});
        pen += static_cast<int>(glyph->advance);
    }
}

void GlyphPicture::AddSet(unsigned number)
{
    constexpr std::u16string_view kDigits = u"0123456789ABCDEF";
    for (unsigned row = 0; row < kSetSize / kRowSize; ++row) {
        AddLine(std::u16string{kDigits[number / 16], kDigits[number % 16], kDigits[row]});
        int pen = 0;
        for (unsigned column = 0; column < kRowSize; ++column) {
            pen += 2 * font.height;
            auto const code = static_cast<char16_t>(number * kSetSize + row * kRowSize + column);
            if (auto const found = font.glyphs.find(code); found != font.glyphs.end())
                placed.push_back({&found->second, pen, nextBaseline});
        }
        nextBaseline += font.height * 3 / 2;
    }
}

std::string GlyphPicture::Save(std::string const& path, unsigned scale) const
{
    auto const roomOf = [this](Placed const& place) {
        int const top = place.baseline - font.ascent;
        return Box{place.pen, top, place.pen + static_cast<int>(place.glyph->advance), top + font.height};
    };
    // Outside the room where a font's ascent is above its height.
    auto const baselineOf = [&](Placed const& place) {
        Box const room = roomOf(place);
        return Box{room.x1, place.baseline, room.x2, place.baseline + 1};
    };
    Box box;
    for (auto const& place : placed) {
        box.Add(roomOf(place));
        box.Add(baselineOf(place));
        box.Add(InkOf(*place.glyph, place.pen, place.baseline));
    }
    box = {box.x1 - kMargin, box.y1 - kMargin, box.x2 + kMargin, box.y2 + kMargin};
    if (PixelsOf(box) > kMostPixels / scale / scale) return "the picture would be too large";
    Canvas canvas(box);

    for (bool odd = false; auto const& place : placed) {
        if (boxes == Boxes::No) break;
        auto const room = roomOf(place);
        canvas.Fill(room, odd ? kOddBox : kEvenBox);
        canvas.Fill(baselineOf(place), kBaseline);
        odd = !odd;
    }
    for (auto const& place : placed)
        PaintInk(canvas, *place.glyph, InkOf(*place.glyph, place.pen, place.baseline));

    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    image.width = static_cast<png_uint_32>(canvas.Width()) * scale;
    image.height = static_cast<png_uint_32>(canvas.Height()) * scale;
    image.format = PNG_FORMAT_RGB_COLORMAP;
    image.colormap_entries = kColourCount;
    auto const pixels = Enlarged(canvas, scale);
    if (png_image_write_to_file(&image, path.c_str(), 0, pixels.data(), 0, kColours) != 0) return {};
    return image.message;
}

}

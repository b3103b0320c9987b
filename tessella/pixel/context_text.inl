#include <algorithm>
#include <cstring>
#include <limits>
#include <span>

inline GrBits BitsOf(GrGlyphInfo const& glyph)
{
    return {glyph.bits, static_cast<int>(glyph.width), static_cast<int>(glyph.rows),
        static_cast<int>(glyph.pitch), true};
}

/// The levels of a grey glyph as an image of alpha values. They stay the font's.
struct GrGlyphImage : GrImage {
    explicit GrGlyphImage(GrGlyphInfo const& glyph)
        : GrImage(static_cast<int>(glyph.width), static_cast<int>(glyph.rows), nullptr,
              const_cast<unsigned char*>(glyph.bits), GrImageHasAlpha)
    {}
    ~GrGlyphImage() { Detach(); }
};

/// False if the pen goes back somewhere, by an advance that is negative when taken as signed.
template <typename Character>
bool GoesForward(GrFont& font, Character const* text, unsigned length)
{
    GrGlyphInfo glyph;
    return std::ranges::none_of(std::span(text, length),
        [&](unsigned code) { return font.GetGlyph(code, glyph) && static_cast<int>(glyph.advance) < 0; });
}

/// The back colour in the cells of an opaque text, where no glyph's box is. As long as boxes follow each
/// other without meeting, and no box reaches beyond the pen behind it, three rectangles beside each are all.
/// Others are cut out of a region of gaps, until the pen has passed them all.
template <typename S>
class GrGenericContextBase<S>::TextBack {
public:
    /// `comesLast`: only behind the last glyph is it known what to paint. What makes a glyph bold may leave
    /// pixels of its box alone, or hit the gaps of others; and a pen that goes back may end before them.
    TextBack(GrGenericContextBase& drawnContext, int pen, int cellTop, int cellBottom, bool comesLast)
        : context(drawnContext), top(cellTop), bottom(cellBottom), painted(pen), reach(pen), last(comesLast)
    {}

    /// The glyph in `box` has been drawn, and the pen is behind it now.
    void Pass(GrRect const& box, int pen)
    {
        if (box.IsEmpty()) return;
        if (!hasGaps && !last && box.x1 >= painted && box.x2 <= pen) {
            Fill({painted, top, box.x1, bottom});
            Fill({box.x1, top, box.x2, std::min(box.y1, bottom)});
            Fill({box.x1, std::max(box.y2, top), box.x2, bottom});
            painted = reach = box.x2;
            return;
        }
        if (!hasGaps) CutRegion(gaps.Get(), context.clip, GrRect{painted, top, kFarRight, bottom});
        hasGaps = true;
        gaps.Get() -= box;
        reach = std::max(reach, box.x2);
        if (!last && reach <= pen) FillGaps(reach);
    }

    /// What lies behind the last pen stays as it is.
    void End(int pen)
    {
        if (hasGaps)
            FillGaps(pen);
        else
            Fill({painted, top, pen, bottom});
    }

private:
    static constexpr int kFarRight = std::numeric_limits<int>::max();

    void Fill(GrRect const& rect)
    {
        if (rect.IsEmpty()) return;
        context.WalkClip(
            rect, 0, 0, [&](GrRange columns, GrRange rows, int, int) { FillRange(columns, rows); });
    }

    void FillGaps(int end)
    {
        LocalRegion const cut;
        GrRegion const& region = cut.Get();
        CutRegion(cut.Get(), gaps.Get(), GrRect{painted, top, end, bottom});
        painted = end;
        hasGaps = false;
        if (!region) return;
        typename S::WalkGuard const guard(context, region);
        if (!context.HasPixels()) return;
        for (auto const& band : BandsOf(region))
            for (auto const& range : RangesOf(band))
                FillRange(range, {band.r1, band.r2});
    }

    void FillRange(GrRange const& columns, GrRange const& rows)
    {
        context.FillRange(columns, rows, context.backColor);
    }

    GrGenericContextBase& context;
    int const top, bottom;  ///< of the cells
    int painted;            ///< all of the cells left of here is, but for the gaps
    int reach;              ///< the right edge of the boxes so far
    bool const last;
    bool hasGaps = false;
    LocalRegion const gaps;  ///< from `painted` on
};

/// Transparent glyphs of bits, collected in one picture and painted together: rows of the surface lie so far
/// apart that to walk them glyph by glyph takes longer than to put the bits side by side before.
template <typename S>
class GrGenericContextBase<S>::TextInk {
public:
    explicit TextInk(GrGenericContextBase& drawnContext) : context(drawnContext) {}
    ~TextInk() { Paint(); }
    TextInk(TextInk const&) = delete;
    TextInk& operator=(TextInk const&) = delete;

    /// Takes a glyph of bits; false if it is too large.
    bool Add(GrRect const& box, GrGlyphInfo const& glyph)
    {
        if (box.IsEmpty()) return true;
        if (!place.IsEmpty() && !IsWithin(box)) Paint();
        if (place.IsEmpty()) {
            // Where vectors are aligned, and with room for glyphs that stand higher.
            left = std::max(box.x1, kFarthest) & -kAlignment;
            top = std::max(box.y1, kFarthest) - kRows / 4;
        }
        if (glyph.width > GrBitsReader::kMost || glyph.rows > kRows || !IsWithin(box)) return false;
        Clear(box);
        Collect(box, BitsOf(glyph));
        return true;
    }

    /// Paints all that has been collected.
    void Paint()
    {
        if (place.IsEmpty()) return;
        GrBits const bits{RowOf(place.y1), place.x2 - place.x1, place.y2 - place.y1, kPitch, false};
        context.DrawBits(place.x1, place.y1, bits, true);
        place = {};
    }

private:
    static constexpr int kWidth = 512, kRows = 64, kAlignment = 16, kPitch = kWidth / 8;
    static constexpr int kFarthest = std::numeric_limits<int>::min() / 2;

    bool IsWithin(GrRect const& box) const
    {
        constexpr int kMax = std::numeric_limits<int>::max();  // a box that reaches it may be cut off there
        return box.x1 >= left && box.y1 >= top && box.x2 < kMax && std::int64_t{box.x2} - left <= kWidth &&
            box.y2 < kMax && std::int64_t{box.y2} - top <= kRows;
    }

    unsigned char* RowOf(int y) { return ink + std::ptrdiff_t{y - top} * kPitch; }

    /// Makes the place hold the box, too.
    void Clear(GrRect const& box)
    {
        if (place.IsEmpty()) place = {left, box.y1, left, box.y1};
        for (; place.y1 > box.y1; --place.y1)
            std::fill_n(RowOf(place.y1 - 1), kPitch, std::uint8_t{0});
        for (; place.y2 < box.y2; ++place.y2)
            std::fill_n(RowOf(place.y2), kPitch, std::uint8_t{0});
        place.x2 = std::max(place.x2, box.x2);
    }

    void Collect(GrRect const& box, GrBits const& bits)
    {
        GrBitsReader const reader(bits);
        auto const inside = ~std::uint64_t{0} >> (64 - bits.width);
        auto const glyphWidth = static_cast<unsigned>(bits.width);
        int const column = box.x1 - left;
        unsigned char* to = RowOf(box.y1) + column / 8;
        int const most = static_cast<int>((GrBitsReader::kMost - glyphWidth) / reader.pitch) + 1;
        std::size_t first = 0;
        for (int rows = bits.height; rows > 0;
             rows -= most, first += reader.pitch * static_cast<unsigned>(most)) {
            std::uint64_t read = reader.Read(first);
            for (int y = std::min(rows, most);; read >>= reader.pitch) {
                std::uint64_t word;
                std::memcpy(&word, to, sizeof word);
                word |= (read & inside) << column % 8;
                std::memcpy(to, &word, sizeof word);
                to += kPitch;
                if (--y == 0) break;
            }
        }
    }

    GrGenericContextBase& context;
    GrRect place{};                                            ///< what has been collected, on the surface
    int left, top;                                             ///< of the picture
    std::uint8_t ink[kRows * kPitch + sizeof(std::uint64_t)];  ///< words may reach beyond the last row
};

template <typename S>
template <typename Character>
void GrGenericContextBase<S>::DrawCharacters(
    int x, int y, Character const* text, unsigned length, GrFont& font, bool transparent)
{
    if (!font.IsValid()) return;
    bool const bold = static_cast<GrFontBase&>(font).embolden;
    int pen = Moved(x, this->originX);
    int const baseline = Moved(y, this->originY);
    int const top = SeenFrom(baseline, static_cast<int>(font.GetAscent()));

    typename S::TextGuard const guard(*this);
    // Where pixels are not packed, a store may reach others of its byte, so that the order is seen.
    bool const gapsLast = !transparent && (!S::kPacked || bold || !GoesForward(font, text, length));
    bool const collects = S::kPacked && transparent && !bold && this->IsSolid();
    TextInk ink(*this);
    TextBack back(*this, pen, top, Moved(top, static_cast<int>(font.GetHeight())), gapsLast);
    GrGlyphInfo glyph;
    unsigned previous = 0;
    for (unsigned const code : std::span(text, length)) {
        if (font.GetGlyph(code, glyph)) {
            int const left = Moved(pen, glyph.left), glyphTop = SeenFrom(baseline, glyph.top);
            GrRect box{left, glyphTop, Moved(left, static_cast<int>(glyph.width)),
                Moved(glyphTop, static_cast<int>(glyph.rows))};
            pen = Moved(Moved(pen, static_cast<int>(glyph.advance)), bold);
            int shift[2];
            if (previous != 0 && font.GetKerning(shift, code, previous)) box = Moved(box, shift[0], shift[1]);
            if (!collects || glyph.bitsPerPixel != 1 || !ink.Add(box, glyph)) {
                ink.Paint();
                StrikeGlyph(box, glyph, transparent);
            }
            if (bold) Embolden(box, glyph, transparent);
            if (!transparent) back.Pass({box.x1, box.y1, Moved(box.x2, bold), box.y2}, pen);
        }
        previous = code;
    }
    if (!transparent) back.End(pen);
}

template <typename S>
void GrGenericContextBase<S>::StrikeGlyph(GrRect const& box, GrGlyphInfo const& glyph, bool transparent)
{
    if (glyph.bitsPerPixel == 1) return DrawBits(box.x1, box.y1, BitsOf(glyph), transparent);
    GrGlyphImage const image(glyph);
    this->DrawImageAlpha(InContext(box), &image, 0, 0, {transparent, false, false, 0});
}

template <typename S>
void GrGenericContextBase<S>::Embolden(GrRect const& box, GrGlyphInfo const& glyph, bool transparent)
{
    if (!transparent) {
        // The column of a grey glyph stands where its context coordinates say on the surface.
        GrRect const beside = glyph.bitsPerPixel == 1 ? box : InContext(box);
        WalkClip({beside.x2, beside.y1, Moved(beside.x2, 1), beside.y2}, 0, 0,
            [&](GrRange columns, GrRange rows, int, int) {
                this->PatternColumn(columns.r1, rows.r1, rows.r2 - rows.r1, this->backColor, this->backColor);
            });
    }
    StrikeGlyph(Moved(box, 1, 0), glyph, true);
}

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

template <typename S>
template <typename Character>
void GrGenericContextBase<S>::DrawCharacters(
    int x, int y, Character const* text, unsigned length, GrFont& font, bool transparent)
{
    if (!font.IsValid()) return;
    bool const embolden = static_cast<GrFontBase&>(font).embolden;
    int pen = Moved(x, this->originX);
    int const baseline = Moved(y, this->originY);
    int const top = SeenFrom(baseline, static_cast<int>(font.GetAscent()));
    int const bottom = Moved(top, static_cast<int>(font.GetHeight()));
    constexpr int kFarRight = std::numeric_limits<int>::max();

    // Held for the whole string, over nothing: the cursor only goes where glyphs land.
    typename S::Guard const guard(GrRect{});
    LocalRegion const cell;  // what of it no glyph's box covers
    GrRegion& gaps = cell.Get();
    if (!transparent) CutRegion(gaps, this->clip, GrRect{pen, top, kFarRight, bottom});
    unsigned previous = 0;
    for (unsigned const code : std::span(text, length)) {
        GrGlyphInfo glyph;
        if (font.GetGlyph(code, glyph)) {
            int const left = Moved(pen, glyph.left), glyphTop = SeenFrom(baseline, glyph.top);
            GrRect box{left, glyphTop, Moved(left, static_cast<int>(glyph.width)),
                Moved(glyphTop, static_cast<int>(glyph.rows))};
            pen = Moved(pen, static_cast<int>(glyph.advance) + embolden);
            int shift[2];
            if (previous != 0 && font.GetKerning(shift, code, previous)) box = Moved(box, shift[0], shift[1]);
            if (!transparent) gaps -= GrRect{box.x1, box.y1, Moved(box.x2, embolden), box.y2};
            StrikeGlyph(box, glyph, transparent, embolden);
        }
        previous = code;
    }
    if (transparent) return;
    gaps -= GrRect{pen, top, kFarRight, bottom};
    if (gaps) FillBack(gaps);
}

template <typename S>
void GrGenericContextBase<S>::StrikeGlyph(
    GrRect box, GrGlyphInfo const& glyph, bool transparent, bool embolden)
{
    bool const isGrey = glyph.bitsPerPixel != 1;
    if (isGrey)
        box = {SeenFrom(box.x1, this->originX), SeenFrom(box.y1, this->originY),
            SeenFrom(box.x2, this->originX), SeenFrom(box.y2, this->originY)};
    auto const strike = [&](int x, bool overDestination) {
        if (!isGrey) return DrawBits(x, box.y1, BitsOf(glyph), overDestination);
        GrGlyphImage const image(glyph);
        GrRect const at{x, box.y1, Moved(x, image.width), box.y2};
        this->DrawImageAlpha(at, &image, 0, 0, {overDestination, false, false, 0});
    };
    strike(box.x1, transparent);
    if (!embolden) return;
    // The column of a grey glyph stands where its context coordinates say on the surface.
    if (!transparent)
        WalkClip(
            {box.x2, box.y1, Moved(box.x2, 1), box.y2}, 0, 0, [&](GrRange columns, GrRange rows, int, int) {
                this->PatternColumn(columns.r1, rows.r1, rows.r2 - rows.r1, this->backColor, this->backColor);
            });
    strike(Moved(box.x1, 1), true);
}

template <typename S>
void GrGenericContextBase<S>::FillBack(GrRegion const& region) const
{
    typename S::Guard const guard(region);
    if (!this->HasPixels()) return;
    for (auto const& band : BandsOf(region))
        for (auto const& range : RangesOf(band))
            this->FillRows({this->PixelAddress(this->RowAddress(band.r1), range.r1), this->Stride(),
                               range.r2 - range.r1, band.r2 - band.r1},
                this->backColor);
}

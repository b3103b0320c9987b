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
    GrGlyphInfo glyph;
    unsigned previous = 0;
    for (unsigned const code : std::span(text, length)) {
        if (font.GetGlyph(code, glyph)) {
            int const left = Moved(pen, glyph.left), glyphTop = SeenFrom(baseline, glyph.top);
            GrRect box{left, glyphTop, Moved(left, static_cast<int>(glyph.width)),
                Moved(glyphTop, static_cast<int>(glyph.rows))};
            pen = Moved(pen, static_cast<int>(glyph.advance) + embolden);
            int shift[2];
            if (previous != 0 && font.GetKerning(shift, code, previous)) box = Moved(box, shift[0], shift[1]);
            if (!transparent) gaps -= GrRect{box.x1, box.y1, Moved(box.x2, embolden), box.y2};
            StrikeGlyph(box, glyph, transparent);
            if (embolden) Embolden(box, glyph, transparent);
        }
        previous = code;
    }
    if (transparent) return;
    gaps -= GrRect{pen, top, kFarRight, bottom};
    if (gaps) FillBack(gaps);
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

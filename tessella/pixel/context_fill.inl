template <typename S>
void GrGenericContextBase<S>::GetClipRect(GrRect& rect)
{
    this->clip.GetOuterRect(rect);
    rect = InContext(rect);
}

template <typename S>
void GrGenericContextBase<S>::DrawPixel(int x, int y)
{
    x = Moved(x, this->originX);
    y = Moved(y, this->originY);
    if (!this->clip.Contains(x, y)) return;
    typename S::Guard const guard(GrRect{x, y, x + 1, y + 1});
    if (!this->HasPixels()) return;
    this->PatternPixel(
        this->RowAddress(y), x, this->pattern[y & 7], this->patternTransparent, this->rasterMode);
}

template <typename S>
void GrGenericContextBase<S>::FillRegion(GrRegion const& region)
{
    LocalRegion const cut;
    GrRegion& local = cut.Get();
    if (this->originX == 0 && this->originY == 0) {
        CutRegion(local, region, this->clip);
    } else {
        LocalRegion const moved;
        moved.Get() = region;
        moved.Get().Offset(this->originX, this->originY);
        CutRegion(local, moved.Get(), this->clip);
    }
    typename S::Guard const guard(local);
    if (!this->HasPixels()) return;
    bool const solid = this->IsSolid();
    for (auto const& band : BandsOf(local)) {
        unsigned char* const top = this->RowAddress(band.r1);
        for (auto const& range : RangesOf(band)) {
            if (solid) {
                this->FillRange(range, {band.r1, band.r2}, this->foreColor);
                continue;
            }
            unsigned char* row = top;
            for (int y = band.r1; y < band.r2; ++y, row += this->Stride())
                this->PatternSpan(row, range.r1, range.r2 - range.r1, this->pattern[y & 7],
                    this->patternTransparent, this->rasterMode);
        }
    }
}

template <typename S, GrColorsPolicy Colors>
GrColor GrGenericContext<S, Colors>::GetPixel(int x, int y)
{
    x = Moved(x, this->originX);
    y = Moved(y, this->originY);
    if (!this->clip.Contains(x, y)) return 0;
    typename S::Guard const guard(GrRect{x, y, x + 1, y + 1});
    if (!this->HasPixels()) return 0;
    return Colors::FromPixel(static_cast<Pixel>(S::ReadPixel(this->RowAddress(y), x)));
}

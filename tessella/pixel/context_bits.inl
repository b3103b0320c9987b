template <typename S>
template <typename Visit>
void GrGenericContextBase<S>::WalkClip(GrRect const& target, int sx, int sy, Visit const& visit)
{
    // Nearly always, and needs no region of its own.
    if (IsOneRectangle(this->clip)) {
        auto const& band = this->clip.bands.items[0];
        GrRange const columns{std::max(band.items[0].r1, target.x1), std::min(band.items[0].r2, target.x2)};
        GrRange const rows{std::max(band.r1, target.y1), std::min(band.r2, target.y2)};
        GrRect const local{columns.r1, rows.r1, columns.r2, rows.r2};
        typename S::WalkGuard const guard(*this, local);
        if (!local.IsEmpty() && this->HasPixels())
            visit(columns, rows, SourceOf(sx, columns.r1, target.x1), SourceOf(sy, rows.r1, target.y1));
        return;
    }
    LocalRegion const cut;
    GrRegion& local = cut.Get();
    CutRegion(local, this->clip, target);
    typename S::WalkGuard const guard(*this, local);
    if (!this->HasPixels()) return;
    for (auto const& band : BandsOf(local))
        for (auto const& range : RangesOf(band))
            visit(range, GrRange{band.r1, band.r2}, SourceOf(sx, range.r1, target.x1),
                SourceOf(sy, band.r1, target.y1));
}

template <typename S>
void GrGenericContextBase<S>::DrawBits(int x, int y, GrBits const& bits, bool transparent)
{
    GrRect const box{x, y, Moved(x, bits.width), Moved(y, bits.height)};
    WalkClip(box, 0, 0, [&](GrRange xRange, GrRange yRange, int firstColumn, int bitsRow) {
        unsigned char* row = this->RowAddress(yRange.r1);
        if constexpr (S::kPacked)
            if (!transparent || this->IsSolid())
                return PaintBits<typename S::Width>({{this->PixelAddress(row, xRange.r1), this->Stride(),
                                                         xRange.r2 - xRange.r1, yRange.r2 - yRange.r1},
                    bits, firstColumn, bitsRow, this->foreColor, this->backColor, transparent});
        for (int rowY = yRange.r1; rowY < yRange.r2; ++rowY, ++bitsRow, row += this->Stride()) {
            std::uint8_t const patternByte = this->pattern[rowY & 7];
            int column = firstColumn;
            for (int pixelX = xRange.r1; pixelX < xRange.r2; ++pixelX, ++column) {
                bool const set = bits.IsSet(bitsRow, column);
                if (!transparent)
                    this->WritePixel(row, pixelX, set ? this->foreColor : this->backColor);
                else if (set)
                    this->PatternPixel(row, pixelX, patternByte, this->patternTransparent, this->rasterMode);
            }
        }
    });
}

template <typename S>
void GrGenericContextBase<S>::DrawBitmap(int x, int y, GrBitmap const& bitmap)
{
    DrawBits(Moved(x, this->originX), Moved(y, this->originY), BitsOf(bitmap), false);
}

template <typename S>
void GrGenericContextBase<S>::DrawBitmapTransparent(int x, int y, GrBitmap const& bitmap)
{
    DrawBits(Moved(x, this->originX), Moved(y, this->originY), BitsOf(bitmap), true);
}

template <typename S>
void GrGenericContextBase<S>::MaskedRows(
    GrRange xRange, GrRange yRange, GrImage const& image, GrBitmap const& mask, int sx, int sy) const
{
    if (!image.pixels || !mask.data) return;
    GrBits const bits = BitsOf(mask);
    std::ptrdiff_t const imageStride = std::ptrdiff_t{image.width} * S::kBytes;
    unsigned char const* source = image.pixels + sy * imageStride;
    unsigned char* row = this->RowAddress(yRange.r1);
    for (int y = yRange.r1; y < yRange.r2; ++y, ++sy, source += imageStride, row += this->Stride())
        for (int x = xRange.r1, column = sx; x < xRange.r2; ++x, ++column)
            if (bits.IsSet(sy, column)) this->WritePixel(row, x, S::Width::ReadPixel(source, column));
}

template <typename S>
void GrGenericContextBase<S>::DrawImageMasked(
    GrRect const& dst, GrImage const& image, GrBitmap const& mask, int sx, int sy)
{
    if (image.width != mask.width || image.height != mask.height) return;
    WalkClip(OnSurface(dst), sx, sy, [&](GrRange xRange, GrRange yRange, int imageX, int imageY) {
        MaskedRows(xRange, yRange, image, mask, imageX, imageY);
    });
}

template <typename S>
void GrGenericContextBase<S>::DrawImageMaskedDirect(
    GrRect const& dst, GrImage const& image, GrBitmap const& mask, int sx, int sy)
{
    if (HasPixelsIn(dst)) MaskedRows({dst.x1, dst.x2}, {dst.y1, dst.y2}, image, mask, sx, sy);
}

template <typename S>
void GrGenericContextBase<S>::DrawImageDirect(GrRect const& dst, GrImage const& image, int sx, int sy)
{
    if (HasPixelsIn(dst)) this->CopyRowsIn({dst.x1, dst.x2}, {dst.y1, dst.y2}, image, sx, sy);
}

template <typename S>
void GrGenericContextBase<S>::ReadImageDirect(GrRect const& src, GrImage& image, int dx, int dy)
{
    if (HasPixelsIn(src)) this->CopyRowsOut({src.x1, src.x2}, {src.y1, src.y2}, image, dx, dy);
}

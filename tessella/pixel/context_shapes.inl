#include <algorithm>

template <typename S>
void GrGenericContextBase<S>::FillScan(unsigned char* row, GrRegion const& region, GrRect const& line) const
{
    int const y = line.y1;
    auto const bands = BandsOf(region);
    auto const band = std::ranges::upper_bound(bands, y, {}, &GrRegion::Band::r2);
    if (band == bands.end() || y < band->r1) return;
    for (auto const& range : RangesOf(*band)) {
        int const left = std::max(range.r1, line.x1);
        int const right = std::min(range.r2, line.x2);
        if (left < right)
            this->PatternSpan(
                row, left, right - left, this->pattern[y & 7], this->patternTransparent, this->rasterMode);
    }
}

template <typename S>
template <typename Walker>
void GrGenericContextBase<S>::FillLines(GrRegion const& region, Walker& walker) const
{
    unsigned char* row = this->RowAddress(walker.Row());
    for (GrRect line; walker.NextLine(line); row += this->Stride())
        FillScan(row, region, line);
}

template <typename S>
void GrGenericContextBase<S>::DrawLine(int x1, int y1, int x2, int y2)
{
    x1 = Moved(x1, this->originX);
    y1 = Moved(y1, this->originY);
    x2 = Moved(x2, this->originX);
    y2 = Moved(y2, this->originY);
    if (y1 > y2) {
        std::swap(x1, x2);
        std::swap(y1, y2);
    }
    LocalRegion const cut;
    GrRegion const& local = cut.Get();
    CutRegion(cut.Get(), this->clip, GrRect{std::min(x1, x2), y1, Moved(std::max(x1, x2), 1), Moved(y2, 1)});
    if (!local) return;
    typename S::Guard const guard(local);
    if (!this->HasPixels()) return;
    if (x1 == x2) {
        DrawColumn(local, x1);
    } else if (y1 == y2) {
        if (auto const* const band = local.FindBand(y1))
            for (auto const& range : RangesOf(*band))
                this->PatternSpan(this->RowAddress(y1), range.r1, range.r2 - range.r1, this->pattern[y1 & 7],
                    this->patternTransparent, this->rasterMode);
    } else {
        GrLineWalker line(x1, y1, x2, y2);
        while (line.left != 0) {
            auto const [count, inside] = line.NextRun(local);
            if (inside) DrawRun(line, count);
            line.Skip(count);
        }
    }
}

template <typename S>
void GrGenericContextBase<S>::DrawColumn(GrRegion const& region, int x) const
{
    for (auto const& band : BandsOf(region)) {
        if (band.item_count == 0) continue;
        if (this->rasterMode == GrRasterModeCopy) {
            this->PatternColumn(x, band.r1, band.r2 - band.r1, this->foreColor, this->backColor);
            continue;
        }
        unsigned char* row = this->RowAddress(band.r1);
        for (int y = band.r1; y < band.r2; ++y, row += this->Stride())
            this->PatternPixel(row, x, this->pattern[y & 7], this->patternTransparent, this->rasterMode);
    }
}

/// Paints `count` pixels of the line from the present one on, all of them within the clip.
template <typename S>
void GrGenericContextBase<S>::DrawRun(GrLineWalker line, std::uint64_t count) const
{
    if (!this->IsSolid()) {
        for (; count > 0; --count, line.Step())
            this->PatternPixel(this->RowAddress(line.y), line.x, this->pattern[line.y & 7],
                this->patternTransparent, this->rasterMode);
        return;
    }
    unsigned char* address = this->PixelAddress(this->RowAddress(line.y), line.x);
    std::ptrdiff_t const along = line.longX * S::kBytes + line.longY * this->Stride();
    std::ptrdiff_t const turn = along + line.shortX * S::kBytes + line.shortY * this->Stride();
    if (line.longer == line.shorter) {
        this->StepPixels(address, turn, count, this->foreColor);
        return;
    }
    auto const pixel = this->foreColor;
    std::uint64_t error = line.error;
    for (;;) {
        this->WritePixel(address, 0, pixel);
        if (--count == 0) return;
        error += line.shorter;
        bool const turns = error >= line.longer;
        error -= turns ? line.longer : 0;
        address += turns ? turn : along;
    }
}

template <typename S>
void GrGenericContextBase<S>::FillPolygon(std::int16_t const xy[], unsigned count)
{
    if (count < 3) return;
    GrPolygonWalker walker(xy, count, this->originX, this->originY);
    LocalRegion const cut;
    CutRegion(cut.Get(), this->clip, walker.Bounds());
    typename S::Guard const guard(cut.Get());
    if (cut.Get() && this->HasPixels()) FillLines(cut.Get(), walker);
}

template <typename S>
void GrGenericContextBase<S>::DrawArc(int x, int y, int w, int h, int start, int sweep)
{
    if (!this->HasPixels()) return;
    x = Moved(x, this->originX);
    y = Moved(y, this->originY);
    w = Moved(w, 1);
    h = Moved(h, 1);
    GrArcState arc;
    ArcSetup(arc, x, y, w, h, start, sweep, this->PixelBase(), static_cast<std::uint32_t>(this->Stride()),
        this->clip);
    GrRegion const& region = arc.region.Get();
    if (!region) return;
    typename S::Guard const guard(region);
    Coverage const quadrants[] = {CoverageOf(QuadrantBox(0, x, y, w, h), region),
        CoverageOf(QuadrantBox(1, x, y, w, h), region), CoverageOf(QuadrantBox(2, x, y, w, h), region),
        CoverageOf(QuadrantBox(3, x, y, w, h), region)};
    auto const paint = [&](int quadrant, unsigned char* row, int column, int line) {
        Coverage const coverage = quadrants[quadrant];
        if (coverage == Coverage::All || (coverage == Coverage::Part && region.Contains(column, line)))
            this->PatternPixel(
                row, column, this->pattern[line & 7], this->patternTransparent, this->rasterMode);
    };
    while (arc.upperRow >= arc.topRow) {
        paint(0, arc.upperAddress, arc.right, arc.upperRow);
        if (arc.left != arc.right) paint(1, arc.upperAddress, arc.left, arc.upperRow);
        if (arc.upperRow != arc.lowerRow) {
            paint(2, arc.lowerAddress, arc.left, arc.lowerRow);
            if (arc.left == arc.right) return;
            paint(3, arc.lowerAddress, arc.right, arc.lowerRow);
        }
        if (arc.right - arc.left < 2) return;
        if (arc.decision < 0) arc.MoveColumns();
        if (arc.decision >= 0) arc.MoveRows();
    }
}

template <typename S>
void GrGenericContextBase<S>::FillArc(int x, int y, int w, int h, int start, int sweep)
{
    if (!this->HasPixels()) return;
    GrArcState arc;
    ArcSetup(arc, Moved(Moved(x, this->originX), 1), Moved(Moved(y, this->originY), 1), Moved(w, -1),
        Moved(h, -1), start, sweep, this->PixelBase(), static_cast<std::uint32_t>(this->Stride()),
        this->clip);
    if (arc.region.Get()) FillEllipse(arc);
    if (arc.wedgeCount != 0) FillWedges(arc);
}

template <typename S>
void GrGenericContextBase<S>::FillEllipse(GrArcState& arc) const
{
    GrRegion const& region = arc.region.Get();
    typename S::Guard const guard(region);
    for (;;) {
        FillScan(arc.upperAddress, region, {arc.left, arc.upperRow, Moved(arc.right, 1), arc.upperRow + 1});
        if (arc.lowerRow != arc.upperRow)
            FillScan(
                arc.lowerAddress, region, {arc.left, arc.lowerRow, Moved(arc.right, 1), arc.lowerRow + 1});
        if (arc.upperRow <= arc.topRow) return;
        while (arc.decision < 0) {
            arc.MoveColumns();
            // Tall boxes of two columns and their like come to an end here, short of their top.
            if (arc.left > arc.right) return;
        }
        arc.MoveRows();
    }
}

template <typename S>
void GrGenericContextBase<S>::FillWedges(GrArcState const& arc) const
{
    LocalRegion const restScratch, cut;
    GrRegion& rest = restScratch.Get();
    GrRegion& local = cut.Get();
    rest = this->clip;
    rest -= arc.region.Get();
    for (int i = 0; i < arc.wedgeCount; ++i) {
        GrWedgeWalker walker(arc.wedges[i]);
        CutRegion(local, this->clip, walker.Bounds());
        if (!local) continue;
        typename S::Guard const guard(local);
        CutRegion(local, rest, walker.Bounds());
        FillLines(local, walker);
    }
}

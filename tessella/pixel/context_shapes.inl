#include <algorithm>
#include <utility>

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
    GrRange const rows = RowsOf(region);
    for (GrRect line; walker.NextLine(line) && line.y1 < rows.r2;)
        if (line.y1 >= rows.r1) FillScan(this->RowAddress(line.y1), region, line);
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
        if (this->rasterMode == GrRasterModeCopy)
            this->PatternColumn(x, band.r1, band.r2 - band.r1, this->foreColor, this->backColor);
        else
            this->InvertColumn(x, band.r1, band.r2 - band.r1);
    }
}

/// Paints `count` pixels of the line from the present one on, all of them within the clip.
template <typename S>
void GrGenericContextBase<S>::DrawRun(GrLineWalker line, std::uint64_t count) const
{
    if constexpr (S::kPacked)
        if (this->IsSolid()) return DrawSolidRun(line, count);
    for (; count > 0; --count, line.Step())
        this->PatternPixel(this->RowAddress(line.y), line.x, this->pattern[line.y & 7],
            this->patternTransparent, this->rasterMode);
}

template <typename S>
void GrGenericContextBase<S>::DrawSolidRun(GrLineWalker const& line, std::uint64_t count) const
{
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
    auto* const base = this->PixelBase();
    auto const pitch = static_cast<std::uint32_t>(this->Stride());
    GrArcState arc;
    if constexpr (S::kPacked) {
        GrRect const box{x, y, Moved(x, w), Moved(y, h)};
        if (IsWholeTurn(sweep) && this->IsSolid() && IsOneRectangle(this->clip) &&
            CoverageOf(box, this->clip) == Coverage::All) {
            typename S::Guard const guard(box);
            WalkSetup(arc, x, y, w, h, base, pitch);
            return DrawOutline(arc);
        }
    }
    ArcSetup(arc, x, y, w, h, start, sweep, base, pitch, this->clip);
    GrRegion const& region = arc.region;
    if (!region) return;
    typename S::Guard const guard(region);
    GrEllipseWalk const walk(arc);
    Coverage quadrants[4];
    for (int q = 0; q < 4; ++q)
        quadrants[q] = CoverageOf(QuadrantBox(q, x, y, w, h), region);
    if constexpr (S::kPacked) {
        auto const isWhole = [](Coverage coverage) { return coverage == Coverage::All; };
        if (this->IsSolid() && std::all_of(quadrants, quadrants + 4, isWhole)) return DrawOutline(arc);
    }
    WalkOutline(walk, [&](int quadrant, std::uintptr_t address, int column, int line) {
        Coverage const coverage = quadrants[quadrant];
        if (coverage == Coverage::All || (coverage == Coverage::Part && region.Contains(column, line)))
            this->PatternPixel(
                RowAt(address), column, this->pattern[line & 7], this->patternTransparent, this->rasterMode);
    });
}

/// Paints the points of an ellipse that lies on the surface and within the clip, some in the middle twice.
/// Where the next point is is as good as random, so masks decide it, and no branches.
template <typename S>
void GrGenericContextBase<S>::DrawOutline(GrArcState const& arc) const
{
    auto const pixel = this->foreColor;
    std::int64_t const stepX = arc.stepX, stepY = arc.stepY;
    std::ptrdiff_t const pitch = this->Stride();
    std::int64_t decision = arc.decision;
    std::int64_t nextSpan = arc.spanTerm - stepX;
    std::int64_t nextRow = arc.rowTerm + stepY;
    unsigned char* upper = this->PixelAddress(RowAt(arc.upperAddress), arc.left);
    unsigned char* lower = this->PixelAddress(RowAt(arc.lowerAddress), arc.left);
    std::ptrdiff_t reach = std::ptrdiff_t{arc.right} - arc.left;
    auto const paint = [&] {
        for (unsigned char* const address : {upper, lower}) {
            this->WritePixel(address, 0, pixel);
            this->WritePixel(address + reach * S::kBytes, 0, pixel);
        }
    };
    // Steep: from point to point the rows move, and the columns may. Rows move only as long as a point of the
    // next one lies within the ellipse, so the outline does not leave its box.
    for (;;) {
        paint();
        if (reach < 2) return;
        std::int64_t const inward = decision >> 63;
        decision += nextSpan & inward;
        nextSpan -= stepX & inward;
        reach += 2 * inward;
        upper += S::kBytes & inward;
        lower += S::kBytes & inward;
        if (decision < 0) break;
        upper -= pitch;
        lower += pitch;
        decision -= nextRow;
        nextRow += stepY;
    }
    // Flat, and never steep again: the columns move, and the rows may.
    for (;;) {
        paint();
        if (reach < 2) return;
        decision += nextSpan;
        nextSpan -= stepX;
        reach -= 2;
        std::int64_t const outward = ~(decision >> 63);
        decision -= nextRow & outward;
        nextRow += stepY & outward;
        upper += S::kBytes - (pitch & outward);
        lower += S::kBytes + (pitch & outward);
    }
}

/// Has the points of the ellipse painted, each with the quadrant that it lies in.
template <typename S>
template <typename Paint>
void GrGenericContextBase<S>::WalkOutline(GrEllipseWalk walk, Paint paint)
{
    for (;;) {
        paint(0, walk.upperAddress, walk.right, walk.upperRow);
        if (walk.left != walk.right) paint(1, walk.upperAddress, walk.left, walk.upperRow);
        if (walk.upperRow != walk.lowerRow) {
            paint(2, walk.lowerAddress, walk.left, walk.lowerRow);
            if (walk.left == walk.right) return;
            paint(3, walk.lowerAddress, walk.right, walk.lowerRow);
        }
        if (walk.right - walk.left < 2) return;
        if (walk.decision < 0) walk.MoveColumns();
        if (walk.decision < 0) continue;
        walk.MoveRows();
        if (walk.IsBeyond()) return;
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
    if (arc.region) {
        typename S::Guard const guard(arc.region);
        FillEllipse(GrEllipseWalk(arc), arc.region);
    }
    if (arc.wedgeCount != 0) FillWedges(arc);
}

template <typename S>
void GrGenericContextBase<S>::FillEllipse(GrEllipseWalk walk, GrRegion const& region) const
{
    for (;;) {
        int const right = Moved(walk.right, 1);
        if (walk.Meets(walk.upperRow))
            FillScan(RowAt(walk.upperAddress), region, {walk.left, walk.upperRow, right, walk.upperRow + 1});
        if (walk.Meets(walk.lowerRow) && walk.lowerRow != walk.upperRow)
            FillScan(RowAt(walk.lowerAddress), region, {walk.left, walk.lowerRow, right, walk.lowerRow + 1});
        if (walk.upperRow <= walk.topRow) return;
        while (walk.decision < 0) {
            walk.MoveColumns();
            // Tall ellipses of an even width come to an end here, short of their top.
            if (walk.left > walk.right) return;
        }
        walk.MoveRows();
        if (walk.IsBeyond()) return;
    }
}

template <typename S>
void GrGenericContextBase<S>::FillWedges(GrArcState const& arc) const
{
    LocalRegion const restScratch, cut;
    GrRegion& rest = restScratch.Get();
    GrRegion& local = cut.Get();
    rest = this->clip;
    rest -= arc.region;
    for (int i = 0; i < arc.wedgeCount; ++i) {
        GrWedgeWalker walker(arc.wedges[i]);
        CutRegion(local, this->clip, walker.Bounds());
        if (!local) continue;
        typename S::Guard const guard(local);
        CutRegion(local, rest, walker.Bounds());
        FillLines(local, walker);
    }
}

#include <algorithm>
#include <iterator>
#include <memory>
#include <type_traits>

template <typename S, GrColorsPolicy Colors>
void GrGenericContext<S, Colors>::DrawImage(GrRect const& dst, GrImage const& image, int sx, int sy)
{
    if (image.alphaPlane) {
        bool const overDestination = !(image.flags & GrImageOverBack);
        bool const dither = Colors::kDithers && !(image.flags & GrImageNoDither);
        this->DrawImageAlpha(dst, &image, sx, sy, {overDestination, dither, false, 0});
    } else if (!HasOwnFormat(image)) {
        std::unique_ptr<GrContext> const source(image.GetContext());
        if (source) GrGenericContext::CopyFromContext(dst, source.get(), sx, sy);
    } else {
        this->WalkClip(
            this->OnSurface(dst), sx, sy, [&](GrRange xRange, GrRange yRange, int imageX, int imageY) {
                this->CopyRowsIn(xRange, yRange, image, imageX, imageY);
            });
    }
}

template <typename S, GrColorsPolicy Colors>
void GrGenericContext<S, Colors>::ReadImage(GrRect const& src, GrImage& image, int dx, int dy)
{
    if (!HasOwnFormat(image)) {
        std::unique_ptr<GrContext> const target(image.GetContext());
        GrRect const dst{dx, dy, SourceOf(dx, src.x2, src.x1), SourceOf(dy, src.y2, src.y1)};
        if (target) target->CopyFromContext(dst, this, src.x1, src.y1);
    } else {
        this->WalkClip(
            this->OnSurface(src), dx, dy, [&](GrRange xRange, GrRange yRange, int imageX, int imageY) {
                this->CopyRowsOut(xRange, yRange, image, imageX, imageY);
            });
    }
}

template <typename S, GrColorsPolicy Colors>
GrPixelExtent GrGenericContext<S, Colors>::ExtentOfClip() const
{
    if (!this->clip || !this->HasPixels()) return {nullptr, nullptr};
    GrRange const rows = RowsOf(this->clip);
    return {this->RowAddress(rows.r1), this->RowAddress(rows.r2)};
}

template <typename S, GrColorsPolicy Colors>
GrColor const* GrGenericContext<S, Colors>::ReadClipped(int x, int y, int count, GrColor* room) const
{
    int const left = Moved(x, this->originX), right = Moved(left, count), row = Moved(y, this->originY);
    GrRegion::Band const* const band = this->HasPixels() ? this->clip.FindBand(row) : nullptr;
    bool const isWhole =
        band && band->item_count == 1 && band->items[0].r1 <= left && right <= band->items[0].r2;
    if (!isWhole) std::fill_n(room, count, GrColor{0});
    if (!band) return room;
    for (auto const& range : RangesOf(*band)) {
        int const from = std::max(range.r1, left), to = std::min(range.r2, right);
        if (from >= to) continue;
        typename S::Guard const guard(GrRect{from, row, to, row + 1});
        unsigned char const* const first = this->PixelAddress(this->RowAddress(row), from);
        if constexpr (std::is_same_v<Colors, GrColorsRGB>)
            if (isWhole && reinterpret_cast<std::uintptr_t>(first) % alignof(GrColor) == 0)
                return reinterpret_cast<GrColor const*>(first);
        ReadColors<typename S::Width, Colors>(first, to - from, room + (from - left));
    }
    return room;
}

template <typename S, GrColorsPolicy Colors>
void GrGenericContext<S, Colors>::CopyFromContext(GrRect const& dst, GrContext* source, int sx, int sy)
{
    if (!source) return;
    GrColorSource const colorSource(*source);
    bool const readAhead = S::kPacked && colorSource.MayReadAhead(ExtentOfClip());
    this->WalkClip(
        this->OnSurface(dst), sx, sy, [&](GrRange xRange, GrRange yRange, int sourceX, int sourceY) {
            unsigned char* row = this->RowAddress(yRange.r1);
            for (int y = 0; y < yRange.r2 - yRange.r1; ++y, row += this->Stride()) {
                int const rowY = Moved(sourceY, y);
                if (!readAhead) {
                    for (int x = 0; x < xRange.r2 - xRange.r1; ++x)
                        this->WritePixel(
                            row, xRange.r1 + x, Colors::ToPixel(source->GetPixel(Moved(sourceX, x), rowY)));
                    continue;
                }
                if constexpr (S::kPacked) {
                    GrColor room[1024];
                    for (int x = xRange.r1, count; x < xRange.r2; x += count) {
                        count = std::min(xRange.r2 - x, static_cast<int>(std::size(room)));
                        GrColor const* const colors =
                            colorSource.Read(Moved(sourceX, x - xRange.r1), rowY, count, room);
                        WriteColors<typename S::Width, Colors>(this->PixelAddress(row, x), count, colors);
                    }
                }
            }
        });
}

#include <memory>

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
void GrGenericContext<S, Colors>::CopyFromContext(GrRect const& dst, GrContext* source, int sx, int sy)
{
    this->WalkClip(
        this->OnSurface(dst), sx, sy, [&](GrRange xRange, GrRange yRange, int sourceX, int sourceY) {
            unsigned char* row = this->RowAddress(yRange.r1);
            for (int y = 0; y < yRange.r2 - yRange.r1; ++y, row += this->Stride())
                for (int x = 0; x < xRange.r2 - xRange.r1; ++x)
                    this->WritePixel(row, xRange.r1 + x,
                        Colors::ToPixel(source->GetPixel(Moved(sourceX, x), Moved(sourceY, y))));
        });
}

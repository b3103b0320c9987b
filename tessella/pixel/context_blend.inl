template <typename S>
void GrGenericContextBase<S>::FillRegionAlpha(GrRegion const& region, std::uint8_t alpha)
{
    GrRect outer;
    region.GetOuterRect(outer);
    this->DrawImageAlpha(outer, nullptr, 0, 0, {true, true, true, alpha});
}

template <typename S, GrColorsPolicy Colors>
void GrGenericContext<S, Colors>::DrawImageAlpha(
    GrRect const& dst, GrImage const* image, int sx, int sy, GrBlendParams const& params)
{
    if (!GR_ASSERT(!image || image->isTrueColor())) return;
    this->WalkClip(this->OnSurface(dst), sx, sy, [&](GrRange xRange, GrRange yRange, int imageX, int imageY) {
        BlendRange(xRange, yRange, image, imageX, imageY, params);
    });
}

template <typename S, GrColorsPolicy Colors>
void GrGenericContext<S, Colors>::DrawImageAlphaDirect(
    GrRect const& dst, GrImage const* image, int sx, int sy, GrBlendParams const& params)
{
    if (this->HasPixelsIn(dst)) BlendRange({dst.x1, dst.x2}, {dst.y1, dst.y2}, image, sx, sy, params);
}

template <typename S, GrColorsPolicy Colors>
void GrGenericContext<S, Colors>::BlendRange(
    GrRange xRange, GrRange yRange, GrImage const* image, int sx, int sy, GrBlendParams const& params) const
{
    unsigned char* const row = this->RowAddress(yRange.r1);
    GrBlend blend{{row, this->Stride(), xRange.r2 - xRange.r1, yRange.r2 - yRange.r1}, nullptr, nullptr, 0,
        params.alpha, params.overDestination, this->foreColor, this->backColor,
        params.dither && Colors::kDithers ? this->ErrorRows() : nullptr};
    if (image) {
        std::ptrdiff_t const first = std::ptrdiff_t{sy} * image->width + sx;
        if (image->pixels) blend.colors = image->pixels + first * std::ptrdiff_t{sizeof(GrColor)};
        if (image->alphaPlane && !params.uniformAlpha) blend.alphas = image->alphaPlane + first;
        blend.sourceWidth = image->width;
    }
    if (!blend.alphas && !params.uniformAlpha) return;
    if constexpr (S::kPacked) {
        blend.target.address = this->PixelAddress(row, xRange.r1);
        BlendRows<typename S::Width, Colors>(blend);
    } else {
        // What is there cannot be read, so all of it is over the back colour.
        blend.overDestination = false;
        BlendEach<Colors>(blend, S::ReadPixel, [left = xRange.r1](unsigned char* target, int x, auto pixel) {
            S::WritePixel(target, left + x, pixel);
        });
    }
}

template <typename Base, GrSurfacePolicy Surface>
void GrGenericSurface<Base, Surface>::PatternPixel(
    unsigned char* row, int x, std::uint8_t patternByte, bool transparent, std::uint32_t mode) const
{
    bool const set = patternByte >> (x & 7) & 1;
    if (!set && transparent) return;
    if (mode == GrRasterModeCopy)
        WritePixel(row, x, set ? foreColor : backColor);
    else
        WritePixel(row, x, static_cast<Pixel>(~ReadPixel(row, x)));
}

template <typename Base, GrSurfacePolicy Surface>
void GrGenericSurface<Base, Surface>::PatternSpan(unsigned char* row, int x, int count,
    std::uint8_t patternByte, bool transparent, std::uint32_t mode) const
{
    if (mode != GrRasterModeCopy && (!transparent || patternByte == 0xFF)) {
        InvertRows({PixelAddress(row, x), 0, count, 1}, kBytes);
    } else if (mode == GrRasterModeCopy && patternByte == 0xFF) {
        FillPixels(PixelAddress(row, x), foreColor, count);
    } else if (mode == GrRasterModeCopy && patternByte == 0) {
        if (!transparent) FillPixels(PixelAddress(row, x), backColor, count);
    } else {
        int const end = x + count;
        do {
            PatternPixel(row, x, patternByte, transparent, mode);
        } while (++x != end);
    }
}

template <typename Base, GrSurfacePolicy Surface>
bool GrGenericSurface<Base, Surface>::IsSolid() const
{
    std::uint64_t rows;
    std::memcpy(&rows, this->pattern, sizeof rows);
    return rasterMode == GrRasterModeCopy && rows == ~std::uint64_t{0};
}

template <typename Base, GrSurfacePolicy Surface>
void GrGenericSurface<Base, Surface>::PatternColumn(
    int x, int y, int count, Pixel setPixel, Pixel clearPixel) const
{
    std::uint8_t const mask = static_cast<std::uint8_t>(1u << (x & 7));
    unsigned char* row = RowAddress(y);
    std::uint64_t columns;
    std::memcpy(&columns, this->pattern, sizeof columns);
    std::uint64_t const masks = mask * 0x0101010101010101u;
    if ((columns & masks) == masks) {
        StepPixels(PixelAddress(row, x), this->Stride(), static_cast<unsigned>(count), setPixel);
        return;
    }
    for (int const end = y + count; y < end; ++y, row += this->Stride()) {
        bool const set = this->pattern[y & 7] & mask;
        if (set || !this->patternTransparent) WritePixel(row, x, set ? setPixel : clearPixel);
    }
}

template <typename Base, GrSurfacePolicy Surface>
void GrGenericSurface<Base, Surface>::InvertColumn(int x, int y, int count) const
{
    unsigned char* row = RowAddress(y);
    for (int const end = y + count; y < end; ++y, row += this->Stride())
        PatternPixel(row, x, this->pattern[y & 7], this->patternTransparent, this->rasterMode);
}

template <typename Base, GrSurfacePolicy Surface>
void GrGenericSurface<Base, Surface>::CopyRowsIn(
    GrRange xRange, GrRange yRange, GrImage const& image, int sx, int sy) const
{
    if (!image.pixels) return;
    std::ptrdiff_t const imageStride = std::ptrdiff_t{image.width} * kBytes;
    std::size_t const length = static_cast<std::size_t>(xRange.r2 - xRange.r1) * kBytes;
    unsigned char const* source = image.pixels + sy * imageStride + std::ptrdiff_t{sx} * kBytes;
    unsigned char* target = PixelAddress(RowAddress(yRange.r1), xRange.r1);
    for (int y = yRange.r1; y < yRange.r2; ++y, source += imageStride, target += this->Stride())
        std::memcpy(target, source, length);
}

template <typename Base, GrSurfacePolicy Surface>
void GrGenericSurface<Base, Surface>::CopyRowsOut(
    GrRange xRange, GrRange yRange, GrImage& image, int dx, int dy) const
{
    if (!image.pixels) return;
    std::ptrdiff_t const imageStride = std::ptrdiff_t{image.width} * kBytes;
    std::size_t const length = static_cast<std::size_t>(xRange.r2 - xRange.r1) * kBytes;
    unsigned char* target = image.pixels + dy * imageStride + std::ptrdiff_t{dx} * kBytes;
    unsigned char const* source = PixelAddress(RowAddress(yRange.r1), xRange.r1);
    for (int y = yRange.r1; y < yRange.r2; ++y, source += this->Stride(), target += imageStride)
        std::memcpy(target, source, length);
}

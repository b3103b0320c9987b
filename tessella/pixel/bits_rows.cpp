#include <tessella/pixel/bits_rows.h>

#include <tessella/pixel/wide_rows.h>

template <GrSurfacePolicy Surface>
void PaintBits(GrBitsBox const& box)
{
    switch (WideLanes()) {
    case 16: return GrWideBits<16, Surface>::Paint(box);
    case 8: return GrWideBits<8, Surface>::Paint(box);
    default: return GrWideBits<4, Surface>::Paint(box);
    }
}

template void PaintBits<GrSurface8>(GrBitsBox const& box);
template void PaintBits<GrSurface16>(GrBitsBox const& box);
template void PaintBits<GrSurface24>(GrBitsBox const& box);
template void PaintBits<GrSurface32>(GrBitsBox const& box);

#pragma once

#include <tessella/pixel/bits.h>
#include <tessella/pixel/wide_format.h>

namespace wide {

/// Paints the first columns of a box, as many as there are lanes. Those beyond its right edge are masked out
/// like clear bits, so that narrow boxes cost no more than one store a row. Several of their rows are read at
/// once.
template <typename W, GrSurfacePolicy Surface, bool kTransparent>
GR_INLINE void PaintBitsWide(GrBitsBox const& box, GrBitsReader const& reader, std::size_t first)
{
    using Words = typename W::Words;
    Words const fore = W::Splat(box.fore), back = W::Splat(box.back);
    unsigned const inside = W::FirstLanes(box.target.width);
    auto const width = static_cast<unsigned>(std::min(box.target.width, W::kLanes));
    int const most = static_cast<int>((GrBitsReader::kMost - width) / reader.pitch) + 1;
    unsigned char* to = box.target.address;
    for (int left = box.target.height; left > 0;) {
        int const rows = std::min(left, most);
        std::uint64_t bits = reader.Read(first);
        first += static_cast<unsigned>(rows) * reader.pitch;
        left -= rows;
        for (int y = rows;;) {
            auto lanes = static_cast<unsigned>(bits) & inside;
            if constexpr (!kTransparent) lanes = inside;
            if constexpr (Surface::kBytes == 3) {
                for (; lanes != 0; lanes &= lanes - 1) {
                    int const lane = __builtin_ctz(lanes);
                    Surface::WritePixel(to, lane, bits >> lane & 1 ? box.fore : box.back);
                }
            } else {
                Words pixels = fore;
                if constexpr (!kTransparent) pixels = W::Named(static_cast<unsigned>(bits)) ? fore : back;
                W::template StoreSome<typename Surface::Pixel>(to, lanes, pixels);
            }
            to += box.target.stride;
            if (--y == 0) break;
            bits >>= reader.pitch;
        }
    }
}

template <typename W, GrSurfacePolicy Surface>
GR_INLINE void PaintBitsOf(GrBitsBox const& given)
{
    GrBitsBox box = given;  // a copy: no store can change it
    GrBitsReader const reader(box.bits);
    std::size_t first = static_cast<unsigned>(box.row) * reader.pitch + static_cast<unsigned>(box.column);
    for (; box.target.width > 0; box.target.width -= W::kLanes, first += W::kLanes) {
        if (box.transparent)
            PaintBitsWide<W, Surface, true>(box, reader, first);
        else
            PaintBitsWide<W, Surface, false>(box, reader, first);
        box.target.address += std::ptrdiff_t{W::kLanes} * Surface::kBytes;
    }
}

}

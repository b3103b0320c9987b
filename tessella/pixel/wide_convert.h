#pragma once

#include <tessella/pixel/wide_format.h>

namespace wide {

template <typename Format>
GR_INLINE void ReadWide(unsigned char const* pixels, int count, GrColor* colors)
{
    using W = typename Format::Wide;
    for (int next = 0; next < count; next += W::kLanes) {
        int const x = W::Start(next, 0, count);
        auto const some = Format::Load(pixels + std::ptrdiff_t{x} * Format::kBytes, count - x);
        W::template Store<std::uint32_t>(
            reinterpret_cast<unsigned char*>(colors + x), count - x, Format::FromPixels(some));
    }
}

template <typename Format>
GR_INLINE void WriteWide(unsigned char* pixels, int count, GrColor const* colors)
{
    using W = typename Format::Wide;
    for (int next = 0; next < count; next += W::kLanes) {
        int const x = W::Start(next, 0, count);
        auto const some =
            W::template Load<std::uint32_t>(reinterpret_cast<unsigned char const*>(colors + x), count - x);
        Format::Store(pixels + std::ptrdiff_t{x} * Format::kBytes, count - x, Format::ToPixels(some));
    }
}

}

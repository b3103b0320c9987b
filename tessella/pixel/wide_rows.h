#pragma once

#include <tessella/pixel/bits.h>
#include <tessella/pixel/blend.h>

#include <type_traits>

/// The loops over rows of one format, for processors with registers for `kLanes` words: 16, 8 or 4. Any
/// thread.
template <int kLanes, GrSurfacePolicy Surface, GrColorsPolicy Colors>
struct GrWideRows {
    /// As `BlendPixels`. Error rows are room for its own purposes.
    static void Blend(GrBlend const& blend);
    /// As `ReadColors` and `WriteColors`.
    static void Read(unsigned char const* pixels, int count, GrColor* colors);
    static void Write(unsigned char* pixels, int count, GrColor const* colors);
};

/// The same for bits, on one surface.
template <int kLanes, GrSurfacePolicy Surface>
struct GrWideBits {
    /// As `PaintBits`.
    static void Paint(GrBitsBox const& box);
};

/// There are no rows for 16 colours, which are looked up one by one, and for premultiplied colours, which are
/// divided.
template <typename Colors>
constexpr bool kHasWideRows = !std::is_same_v<Colors, GrColors4> && !std::is_same_v<Colors, GrColorsRGBA>;

/// The most lanes that the processor has registers for, and for which there are rows.
inline int WideLanes()
{
    if (__builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
        __builtin_cpu_supports("avx512dq") && __builtin_cpu_supports("avx512vl"))
        return 16;
    if (__builtin_cpu_supports("avx2")) return 8;
    return 4;
}

/// Calls `work` with the rows to use.
template <GrSurfacePolicy Surface, GrColorsPolicy Colors, typename Work>
void RunWide(Work const& work)
{
    switch (WideLanes()) {
    case 16: return work(GrWideRows<16, Surface, Colors>{});
    case 8: return work(GrWideRows<8, Surface, Colors>{});
    default: return work(GrWideRows<4, Surface, Colors>{});
    }
}

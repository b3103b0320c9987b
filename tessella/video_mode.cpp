#include <tessella/video_mode.h>

#include <tessella/pixel/image_contexts.h>
#include <tessella/pixel/screen_contexts.h>

namespace {

template <typename Surface, typename Colors>
constexpr GrVideoMode Row(unsigned bits, unsigned colorBits, unsigned depth)
{
    return {bits, colorBits, depth, Surface::kBytes, CreateScreenContext<Surface, Colors>,
        CreateImageContext<Surface, Colors>};
}

constexpr GrVideoMode kModes[] = {
    {4, GrVideoMode::kAnyColorBits, 4, 1, CreatePlanarScreenContext,
        CreateImageContext<GrSurface8, GrColors4>},
    Row<GrSurface8, GrColors8>(8, GrVideoMode::kAnyColorBits, 8),
    Row<GrSurface16, GrColors15>(16, 15, 15),
    Row<GrSurface16, GrColors16>(16, 16, 16),
    Row<GrSurface24, GrColors24>(24, 24, 24),
    Row<GrSurface32, GrColors24>(32, 24, 24),
};

}

GrVideoMode const* FindVideoMode(unsigned bits, unsigned colorBits)
{
    for (auto const& mode : kModes)
        if (mode.bits == bits &&
            (mode.colorBits == colorBits || mode.colorBits == GrVideoMode::kAnyColorBits))
            return &mode;
    return nullptr;
}

GrColorMap MakeColorMap()
{
    GrColorMap map{};
    for (unsigned blue = 0; blue < 6; ++blue)
        for (unsigned green = 0; green < 6; ++green)
            for (unsigned red = 0; red < 6; ++red) {
                unsigned const entry = 20 + 36 * blue + 6 * green + red;
                map.red[entry] = static_cast<std::uint16_t>(red * 51 << 8);
                map.green[entry] = static_cast<std::uint16_t>(green * 51 << 8);
                map.blue[entry] = static_cast<std::uint16_t>(blue * 51 << 8);
            }
    map.red[255] = map.green[255] = map.blue[255] = 0x003F;
    return map;
}

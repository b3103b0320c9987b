#include <tessella/pixel/colors.h>

// clang-format off
GrColor const GrColors4::palette[16] = {
    0x000000, 0xAA0000, 0x00AA00, 0xAAAA00, 0x0000AA, 0xAA00AA, 0x0055AA, 0xAAAAAA,
    0x555555, 0xFF5555, 0x55FF55, 0xFFFF55, 0x5555FF, 0xFF55FF, 0x55FFFF, 0xFFFFFF,
};
// clang-format on

std::atomic<GrColors4::Pixel> GrColors4::colorCube[512];

namespace {

int SquaredDistance(GrColor a, GrColor b)
{
    int const red = GrRed(a) - GrRed(b);
    int const green = GrGreen(a) - GrGreen(b);
    int const blue = GrBlue(a) - GrBlue(b);
    return red * red + green * green + blue * blue;
}

}

int NearestPaletteIndex(GrColor color)
{
    int best = 0;
    int bestDistance = SquaredDistance(color, GrColors4::palette[0]);
    for (int i = 1; i < 16; ++i) {
        int const distance = SquaredDistance(color, GrColors4::palette[i]);
        if (distance < bestDistance) {
            best = i;
            bestDistance = distance;
        }
    }
    return best;
}

void GrColors4::BuildColorCube()
{
    // Each cell stands for its low corner, not its centre: the bias towards dark is wanted.
    for (unsigned i = 0; i < 512; ++i) {
        GrColor const corner = (i & 7) * 32 | (i >> 3 & 7) * 32 << 8 | (i >> 6 & 7) * 32 << 16;
        colorCube[i].store(static_cast<Pixel>(NearestPaletteIndex(corner)), std::memory_order_relaxed);
    }
}

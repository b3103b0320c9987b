// Fills the framebuffer, past the library, with every pixel value of up to 16 bits, or a spread of the wider
// ones: in each format two consoles must show the same colour for the same bytes. What the driver tells of
// the screen goes to the standard output first, since consoles must agree on that as well.
//
//   framebuffer_pattern [--hold]    --hold: says "ready" when the picture stands, ends after a line of input

#include <fcntl.h>
#include <linux/fb.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <array>
#include <cstdint>
#include <cstdio>
#include <cstring>

namespace {

void Tell(fb_fix_screeninfo const& fixed, fb_var_screeninfo const& variable)
{
    std::printf("memory %u, line %u, type %u, visual %u\n", fixed.smem_len, fixed.line_length, fixed.type,
        fixed.visual);
    std::printf("%ux%u of %ux%u, %u bits\n", variable.xres, variable.yres, variable.xres_virtual,
        variable.yres_virtual, variable.bits_per_pixel);
    for (auto const& field : {variable.red, variable.green, variable.blue, variable.transp})
        std::printf("%u bits at %u\n", field.length, field.offset);
}

/// High and low byte of an entry differ, and so do the three channels: the screen tells which were taken.
bool LoadColourMap(int device)
{
    std::array<std::uint16_t, 256> red{};
    std::array<std::uint16_t, 256> green{};
    std::array<std::uint16_t, 256> blue{};
    for (unsigned i = 0; i < 256; ++i) {
        red[i] = static_cast<std::uint16_t>(i << 8 | 0xFF);
        green[i] = static_cast<std::uint16_t>((255 - i) << 8);
        blue[i] = static_cast<std::uint16_t>((i ^ 0x5A) << 8 | i);
    }
    fb_cmap map{0, 256, red.data(), green.data(), blue.data(), nullptr};
    return ioctl(device, FBIOPUTCMAP, &map) == 0;
}

void Fill(unsigned char* memory, unsigned stride, fb_var_screeninfo const& screen)
{
    unsigned const bytesPerPixel = screen.bits_per_pixel / 8;
    // Spreads the counter over all 32 bits; 16 bits need no spreading to be all there.
    std::uint32_t const factor = bytesPerPixel <= 2 ? 1 : 0x9E3779B1;
    std::uint32_t counter = 0;
    for (unsigned y = 0; y < screen.yres; ++y) {
        unsigned char* pixel = memory + std::size_t{y} * stride;
        for (unsigned x = 0; x < screen.xres; ++x, pixel += bytesPerPixel) {
            std::uint32_t const value = counter++ * factor;
            std::memcpy(pixel, &value, bytesPerPixel);
        }
    }
}

}

int main(int argc, char** argv)
{
    int const device = open("/dev/fb0", O_RDWR);
    fb_fix_screeninfo fixed{};
    fb_var_screeninfo variable{};
    if (device == -1 || ioctl(device, FBIOGET_FSCREENINFO, &fixed) == -1 ||
        ioctl(device, FBIOGET_VSCREENINFO, &variable) == -1) {
        std::perror("/dev/fb0");
        return 1;
    }
    Tell(fixed, variable);
    if (variable.bits_per_pixel == 8 && !LoadColourMap(device)) {
        std::perror("loading the colour map");
        return 1;
    }
    void* const memory = mmap(nullptr, fixed.smem_len, PROT_READ | PROT_WRITE, MAP_SHARED, device, 0);
    if (memory == MAP_FAILED) {
        std::perror("mapping /dev/fb0");
        return 1;
    }
    Fill(static_cast<unsigned char*>(memory), fixed.line_length, variable);
    if (argc > 1 && std::strcmp(argv[1], "--hold") == 0) {
        std::puts("ready");
        std::fflush(stdout);
        std::getchar();
    }
    return 0;
}

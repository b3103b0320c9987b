// Fills the framebuffer, past the library, with every pixel value of up to 16 bits, or a spread of the wider
// ones: in each format two consoles must show the same colour for the same bytes. With 4 planes, everything
// that a program can tell the graphics controller comes in random order. What the driver tells of the screen
// goes to the standard output first, since consoles must agree on that as well.
//
//   framebuffer_pattern [--hold]     --hold: says "ready" when the picture stands, ends after a line of input
//   framebuffer_pattern --reset      only resets the graphics controller

#include <fcntl.h>
#include <linux/fb.h>
#include <sys/io.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <array>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <random>

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

void ResetController(unsigned char const volatile* blackByte)
{
    for (unsigned short const word : {0x0000, 0x0001, 0x0002, 0x0003, 0x0004, 0x0005, 0x0F07, 0xFF08})
        outw(word, 0x3CE);
    static_cast<void>(*blackByte);
}

void FillPlanes(unsigned char volatile* memory, unsigned visible)
{
    static constexpr std::array kRegisters = {0, 1, 2, 3, 4, 5, 7, 8};
    std::mt19937 random;
    unsigned loaded = 0;
    for (int i = 0; i < 80000; ++i) {
        unsigned const chosen = random() % 8, offset = random() % visible, byte = random() & 0xFF;
        if (chosen == 0)
            loaded = loaded * 31 + memory[offset];
        else if (chosen >= 3)
            memory[offset] = static_cast<unsigned char>(byte);
        else {
            unsigned const index = kRegisters[random() % kRegisters.size()];
            outw(static_cast<unsigned short>((index == 5 ? byte & 0x0B : byte) << 8 | index), 0x3CE);
        }
    }
    std::printf("loaded %08x\n", loaded);
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
    char const* const option = argc > 1 ? argv[1] : "";
    bool const isReset = std::strcmp(option, "--reset") == 0;
    if (!isReset) Tell(fixed, variable);
    if (variable.bits_per_pixel == 8 && !LoadColourMap(device)) {
        std::perror("loading the colour map");
        return 1;
    }
    void* const memory = mmap(nullptr, fixed.smem_len, PROT_READ | PROT_WRITE, MAP_SHARED, device, 0);
    if (memory == MAP_FAILED) {
        std::perror("mapping /dev/fb0");
        return 1;
    }
    auto* const bytes = static_cast<unsigned char*>(memory);
    unsigned char const* const last = bytes + fixed.smem_len - 1;  // nobody stores there
    if (variable.bits_per_pixel == 4 && ioperm(0x3CE, 2, 1) == 0) {
        ResetController(last);
        if (!isReset) FillPlanes(bytes, fixed.line_length * variable.yres);
    } else if (!isReset) {
        Fill(bytes, fixed.line_length, variable);
    }
    if (std::strcmp(option, "--hold") == 0) {
        std::puts("ready");
        std::fflush(stdout);
        std::getchar();
    }
    return 0;
}

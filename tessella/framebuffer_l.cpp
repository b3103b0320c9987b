#include <tessella/framebuffer_l.h>

#include <tessella/mouse.h>
#include <tessella/screen.h>
#include <tessella/screen_guard.h>
#include <tessella/session_state.h>
#include <tessella/vga_l.h>
#include <tessella/video_mode.h>
#include <tessella/whole_screen.h>
#include <tessella/window.h>

#include <fcntl.h>
#include <linux/fb.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <atomic>
#include <cstdio>

namespace {

constexpr char const* kDevices[] = {"/dev/fb0", "/dev/fb/0", "/devfs/fb/0"};

bool ReadFixedInformation(fb_fix_screeninfo& fixed)
{
    if (ioctl(GrScreen.fbFd, FBIOGET_FSCREENINFO, &fixed) != -1) return true;
    perror("reading /dev/fb0");
    fputs("TESSELLA: Error reading fixed information\n", stderr);
    return false;
}

bool ReadVariableInformation(fb_var_screeninfo& variable)
{
    if (ioctl(GrScreen.fbFd, FBIOGET_VSCREENINFO, &variable) != -1) return true;
    perror("reading /dev/fb0 ");  // the blank tells this site from the one above
    fputs("TESSELLA: Error reading variable information\n", stderr);
    return false;
}

/// A refused mapping is reported and then lived with: nothing is painted while `fbMemory` is MAP_FAILED.
void MapFramebuffer()
{
    void* const memory =
        mmap(nullptr, GrScreen.fbLength, PROT_READ | PROT_WRITE, MAP_SHARED, GrScreen.fbFd, 0);
    if (memory == MAP_FAILED) {
        perror("mapping /dev/fb0");
        fputs("TESSELLA: filed to map frambuffer device to memory.\n", stderr);
    }
    GrScreen.fbMemory = static_cast<unsigned char*>(memory);
}

/// There may be no mapping after a failed change of mode, and unmapping at address 0 could hit the program.
void UnmapFramebuffer()
{
    if (GrScreen.fbMemory && GrScreen.fbMemory != MAP_FAILED) munmap(GrScreen.fbMemory, GrScreen.fbLength);
    GrScreen.fbMemory = nullptr;
}

/// A driver that refuses the map shows other colours; there is nothing more to be done about it.
void LoadColorMap()
{
    GrColorMap map = MakeColorMap();
    fb_cmap request{};
    request.start = 0;
    request.len = 256;
    request.red = map.red.data();
    request.green = map.green.data();
    request.blue = map.blue.data();
    ioctl(GrScreen.fbFd, FBIOPUTCMAP, &request);
}

}

bool OpenFramebuffer()
{
    for (auto const* device : kDevices) {
        if (GrScreen.fbFd >= 0) break;
        GrScreen.fbFd = open(device, O_RDWR);
    }
    return GrScreen.fbFd >= 0;
}

bool GrSetVideoMode(unsigned& width, unsigned& height, unsigned& depth, unsigned)
{
    GrScreenGuard const guard(WholeScreen());
    if (initialized) {
        DeleteScreenContext();
        UnmapFramebuffer();
    }

    fb_fix_screeninfo fixed{};
    if (!ReadFixedInformation(fixed)) return false;
    fb_var_screeninfo variable{};
    if (!ReadVariableInformation(variable)) return false;
    unsigned const bits = variable.bits_per_pixel;
    GrScreen.bytesPerPixel = bits / 8;
    GrScreen.stride = fixed.line_length;
    GrScreen.fbLength = fixed.smem_len;
    // The mouse's thread keeps the pointer within these.
    std::atomic_ref(GrScreen.width).store(variable.xres, std::memory_order_relaxed);
    std::atomic_ref(GrScreen.height).store(variable.yres, std::memory_order_relaxed);
    MapFramebuffer();

    unsigned const colorBits = variable.red.length + variable.green.length + variable.blue.length;
    GrScreen.depth = colorBits;
    auto const* const mode = FindVideoMode(bits, colorBits);
    if (!mode) {
        fprintf(stderr, "TESSELLA: unsupported video mode %dx%dx%d(%d).\n", static_cast<int>(GrScreen.width),
            static_cast<int>(GrScreen.height), static_cast<int>(bits), static_cast<int>(colorBits));
        return false;
    }
    GrScreen.depth = mode->depth;
    GrScreen.bytesPerPixel = mode->bytesPerPixel;
    GrScreen.createScreenContext = mode->createScreenContext;
    GrScreen.createImageContext = mode->createImageContext;
    if (mode->depth == 4) GrScreen.stride = GrScreen.width >> 3;
    if (mode->depth == 8) LoadColorMap();

    GrScreen.context = GrScreen.createScreenContext(WholeScreen(), 0, 0);
    if (GrScreen.bytesPerPixel <= 2) GrScreen.ditherLine = new std::int32_t[std::size_t{GrScreen.width} * 3];
    if (mode->depth == 4)
        for (unsigned const word : {GrVgaEnableSetReset, GrVgaReplace, GrVgaWritePixels})
            WriteVgaPort(word);

    width = GrScreen.width;
    height = GrScreen.height;
    depth = GrScreen.depth;
    GrWindow::OnVideoModeChanged();
    GrMouseRecentre();
    return true;
}

void CloseFramebuffer()
{
    UnmapFramebuffer();
    close(GrScreen.fbFd);
}

#include <care/finding.h>
#include <care/framebuffer_devices.h>

#include <cerrno>
#include <cstdint>
#include <cstring>

#include <fcntl.h>
#include <linux/fb.h>
#include <sys/io.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <unistd.h>

namespace care {

namespace {

constexpr char kPart[] = "screen";
constexpr char kNoDevice[] = "Load the kernel's driver for the graphics adapter (modprobe with i915, amdgpu, "
                             "nouveau, bochs, virtio-gpu, ...), "
                             "or start the kernel with the parameter vga=0x344 on a machine with a BIOS.";
constexpr char kOtherMode[] = "Choose another video mode: with the kernel's parameter vga= (0x305 is "
                              "1024x768 with 8 bits a pixel, 0x317 with "
                              "16, 0x344 with 32) or video=, or with fbset -depth.";

/// A pixel that the library can draw: its bits, those of its colours, and where each colour begins.
struct Drawable {
    unsigned bits, colourBits;
    unsigned red, green, blue;
};

constexpr Drawable kDrawables[] = {
    {16, 15, 10, 5, 0}, {16, 16, 11, 5, 0}, {24, 24, 16, 8, 0}, {32, 24, 16, 8, 0}};

std::string Describe(char const* device, fb_var_screeninfo const& mode)
{
    return std::string(device) + ", " + std::to_string(mode.xres) + "x" + std::to_string(mode.yres) + ", " +
        std::to_string(mode.bits_per_pixel) + " bits a pixel";
}

void CheckPlanes(Findings& findings)
{
    // What is allowed here stays allowed in this process alone.
    if (ioperm(0x3CE, 2, 1) == 0) {
        ioperm(0x3CE, 2, 0);
        return;
    }
    findings.push_back({kPart, Severity::Unusable,
        std::string("the ports of the VGA can't be used: ") + std::strerror(errno),
        "Run the program as root, or with the capability CAP_SYS_RAWIO: sixteen colours need the ports."});
}

void CheckPixels(Findings& findings, fb_var_screeninfo const& mode)
{
    if (mode.bits_per_pixel == 4) return CheckPlanes(findings);
    if (mode.bits_per_pixel == 8) return;
    unsigned const colourBits = mode.red.length + mode.green.length + mode.blue.length;
    for (auto const& drawable : kDrawables) {
        if (drawable.bits != mode.bits_per_pixel || drawable.colourBits != colourBits) continue;
        if (drawable.red != mode.red.offset || drawable.green != mode.green.offset ||
            drawable.blue != mode.blue.offset)
            findings.push_back({kPart, Severity::Limits,
                "the colours lie in another order in a pixel than the library draws them: red and blue would "
                "be "
                "mistaken for each other",
                kOtherMode});
        return;
    }
    findings.push_back({kPart, Severity::Unusable,
        "pixels of " + std::to_string(mode.bits_per_pixel) + " bits with " + std::to_string(colourBits) +
            " bits of colour aren't supported",
        kOtherMode});
}

void CheckMemory(Findings& findings, int fd, fb_fix_screeninfo const& fixed, fb_var_screeninfo const& mode)
{
    if (std::uint64_t{fixed.line_length} * mode.yres > fixed.smem_len)
        findings.push_back({kPart, Severity::Unusable,
            "the driver tells of less memory than the screen has pixels: programs would die while they draw",
            kOtherMode});
    void* const memory = mmap(nullptr, fixed.smem_len, PROT_READ | PROT_WRITE, MAP_SHARED, fd, 0);
    if (memory != MAP_FAILED) {
        munmap(memory, fixed.smem_len);
        return;
    }
    findings.push_back({kPart, Severity::Unusable,
        std::string("the framebuffer's memory can't be mapped: ") + std::strerror(errno) +
            "; programs would run and show nothing",
        kNoDevice});
}

void CheckDevice(Findings& findings, char const* device, int fd)
{
    fb_fix_screeninfo fixed{};
    fb_var_screeninfo mode{};
    if (ioctl(fd, FBIOGET_FSCREENINFO, &fixed) != 0 || ioctl(fd, FBIOGET_VSCREENINFO, &mode) != 0) {
        findings.push_back({kPart, Severity::Unusable,
            std::string(device) + " doesn't tell its mode: " + std::strerror(errno), kNoDevice});
        return;
    }
    std::size_t const before = findings.size();
    CheckPixels(findings, mode);
    CheckMemory(findings, fd, fixed, mode);
    if (findings.size() == before) findings.push_back({kPart, Severity::Fine, Describe(device, mode), {}});
}

}

void CheckScreen(Findings& findings)
{
    // The first that opens counts; the first is also the one to speak of if none does.
    int reason = 0;
    for (char const* const device : kFramebufferDevices) {
        int const fd = open(device, O_RDWR | O_CLOEXEC);
        if (fd != -1) {
            CheckDevice(findings, device, fd);
            close(fd);
            return;
        }
        if (reason == 0) reason = errno;
    }
    findings.push_back({kPart, Severity::Unusable, CannotOpen(kFramebufferDevices[0], reason),
        MendOpening(kFramebufferDevices[0], reason, kNoDevice)});
}

}

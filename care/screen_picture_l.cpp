#include <care/screen_picture_l.h>

#include <care/framebuffer_devices.h>

#include <array>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <span>

#include <fcntl.h>
#include <linux/fb.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <unistd.h>

namespace care {

namespace {

std::string Failed(char const* what) { return std::string(what) + ": " + std::strerror(errno); }

/// The framebuffer, open and mapped.
struct Framebuffer {
    int fd = -1;
    fb_fix_screeninfo fixed{};
    fb_var_screeninfo variable{};
    void* memory = MAP_FAILED;

    Framebuffer() = default;
    Framebuffer(Framebuffer const&) = delete;
    Framebuffer& operator=(Framebuffer const&) = delete;
    ~Framebuffer()
    {
        if (memory != MAP_FAILED) munmap(memory, fixed.smem_len);
        if (fd != -1) close(fd);
    }

    /// Empty, or what failed.
    std::string Open();
};

std::string Framebuffer::Open()
{
    for (char const* const device : kFramebufferDevices)
        if (fd == -1) fd = open(device, O_RDONLY | O_CLOEXEC);
    if (fd == -1) return Failed("the framebuffer's device can't be opened");
    if (ioctl(fd, FBIOGET_FSCREENINFO, &fixed) != 0 || ioctl(fd, FBIOGET_VSCREENINFO, &variable) != 0)
        return Failed("the framebuffer's driver doesn't tell its mode");
    unsigned const bits = variable.bits_per_pixel;
    if (fixed.type != FB_TYPE_PACKED_PIXELS || bits % 8 != 0 || bits == 0 || bits > 32)
        return "a screen with " + std::to_string(bits) + " bits a pixel" +
            (fixed.type == FB_TYPE_PACKED_PIXELS ? "" : " in planes") + " can't be read";
    std::uint64_t const rows = std::uint64_t{variable.yoffset} + variable.yres;
    std::uint64_t const row = (std::uint64_t{variable.xoffset} + variable.xres) * (bits / 8);
    if (row > fixed.line_length || rows * fixed.line_length > fixed.smem_len)
        return "the framebuffer's driver tells of more pixels than it has memory for";
    memory = mmap(nullptr, fixed.smem_len, PROT_READ, MAP_SHARED, fd, 0);
    return memory != MAP_FAILED ? std::string() : Failed("the framebuffer's memory can't be mapped");
}

/// A pixel's field in eight bits: its upper bits are repeated below it, so that white is full white.
std::uint8_t Widened(std::uint32_t pixel, fb_bitfield const& field)
{
    if (field.length == 0 || field.length > 8 || field.offset > 31) return 0;
    std::uint32_t const value = pixel >> field.offset & ((1U << field.length) - 1);
    std::uint32_t wide = 0;
    for (int shift = 8 - static_cast<int>(field.length); shift > -static_cast<int>(field.length);
         shift -= static_cast<int>(field.length))
        wide |= shift >= 0 ? value << shift : value >> -shift;
    return static_cast<std::uint8_t>(wide);
}

/// What the bytes of a pixel are shown as.
class Colours {
public:
    explicit Colours(Framebuffer const& from)
        : variable(from.variable), mapped(from.fixed.visual != FB_VISUAL_TRUECOLOR)
    {
        if (!mapped) return;
        fb_cmap request{};
        request.len = static_cast<std::uint32_t>(red.size());
        request.red = red.data();
        request.green = green.data();
        request.blue = blue.data();
        whole = ioctl(from.fd, FBIOGETCMAP, &request) == 0;
    }
    /// False if the colour map can't be learned.
    bool IsWhole() const { return whole; }

    std::array<std::uint8_t, 3> Of(std::uint32_t pixel) const
    {
        if (!mapped)
            return {
                Widened(pixel, variable.red), Widened(pixel, variable.green), Widened(pixel, variable.blue)};
        return {Upper(red, pixel, variable.red), Upper(green, pixel, variable.green),
            Upper(blue, pixel, variable.blue)};
    }

private:
    using Map = std::array<std::uint16_t, 256>;

    /// The map's components have 16 bits. With direct colours each field of the pixel is an index of its own.
    static std::uint8_t Upper(Map const& map, std::uint32_t pixel, fb_bitfield const& field)
    {
        std::uint32_t const index =
            field.length < 32 ? pixel >> (field.offset & 31) & ((1U << field.length) - 1) : 0;
        return static_cast<std::uint8_t>(map[index & 0xFF] >> 8);
    }

    fb_var_screeninfo const& variable;
    bool const mapped;
    bool whole = true;
    Map red{}, green{}, blue{};
};

}

std::variant<console::Picture, std::string> TakeScreenPicture()
{
    Framebuffer screen;
    if (std::string problem = screen.Open(); !problem.empty()) return problem;
    Colours const colours(screen);
    if (!colours.IsWhole()) return Failed("the colour map can't be learned");

    auto const& mode = screen.variable;
    console::Picture picture{mode.xres, mode.yres, {}};
    picture.bytes.reserve(std::size_t{mode.xres} * mode.yres * 3);
    unsigned const step = mode.bits_per_pixel / 8;
    auto const* const memory = static_cast<unsigned char const*>(screen.memory);
    for (std::size_t y = 0; y < mode.yres; ++y) {
        unsigned char const* bytes =
            memory + (y + mode.yoffset) * screen.fixed.line_length + std::size_t{mode.xoffset} * step;
        for (unsigned x = 0; x < mode.xres; ++x, bytes += step) {
            std::uint32_t pixel = 0;
            std::memcpy(&pixel, bytes, step);
            auto const shown = colours.Of(pixel);
            picture.bytes.insert(picture.bytes.end(), shown.begin(), shown.end());
        }
    }
    return picture;
}

}

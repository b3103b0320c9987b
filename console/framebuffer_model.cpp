#include <console/framebuffer_model.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>

#include <unistd.h>

namespace console {

namespace {

constexpr unsigned long kVgaWindow = 0xA0000;
constexpr unsigned long kPhysicalAddress = 0xFD000000;  // nothing maps it; where adapters tend to lie

fb_bitfield BitField(ColourField field) { return {field.offset, field.length, 0}; }

/// 0 if the map has room for its entries, which the adapter has.
int CheckMap(fb_cmap const& map)
{
    std::size_t const entries = ColourMap().red.size();
    if (map.start >= entries || map.len > entries - map.start) return EINVAL;
    return map.red != nullptr && map.green != nullptr && map.blue != nullptr ? 0 : EFAULT;
}

}

std::size_t FramebufferModel::MemoryLength(DisplayMode const& mode)
{
    return mode.depth == 4 ? VgaModel::kWindow : std::size_t{2} * mode.pitch * mode.height;
}

fb_fix_screeninfo FramebufferModel::FixedInfo() const
{
    fb_fix_screeninfo info{};
    if (state.mode.depth == 4) return PlanarFixedInfo();
    std::strcpy(info.id, "VESA VGA");
    info.smem_start = kPhysicalAddress;
    info.smem_len = static_cast<unsigned>(MemoryLength(state.mode));
    info.type = FB_TYPE_PACKED_PIXELS;
    info.visual = state.format.bits <= 8 ? FB_VISUAL_PSEUDOCOLOR : FB_VISUAL_TRUECOLOR;
    info.line_length = state.mode.pitch;
    info.accel = FB_ACCEL_NONE;
    return info;
}

/// As the kernel's driver for the 16-colour modes tells it.
fb_fix_screeninfo FramebufferModel::PlanarFixedInfo() const
{
    fb_fix_screeninfo info{};
    std::strcpy(info.id, "VGA16 VGA");
    info.smem_start = kVgaWindow;
    info.smem_len = VgaModel::kWindow;
    info.type = FB_TYPE_VGA_PLANES;
    info.type_aux = FB_AUX_VGA_PLANES_VGA4;
    info.visual = FB_VISUAL_PSEUDOCOLOR;
    info.xpanstep = 8;
    info.ypanstep = 1;
    info.line_length = state.mode.pitch;
    info.accel = FB_ACCEL_NONE;
    return info;
}

fb_var_screeninfo FramebufferModel::VariableInfo() const
{
    fb_var_screeninfo info{};
    info.xres = info.xres_virtual = state.mode.width;
    info.yres = info.yres_virtual = state.mode.height;
    info.bits_per_pixel = state.format.bits;
    info.red = BitField(state.format.red);
    info.green = BitField(state.format.green);
    info.blue = BitField(state.format.blue);
    info.transp = BitField(state.format.transparency);
    info.activate = FB_ACTIVATE_NOW;
    info.height = info.width = ~0U;  // in millimetres: unknown
    info.vmode = FB_VMODE_NONINTERLACED;
    return info;
}

int FramebufferModel::PutColourMap(fb_cmap const& map)
{
    auto& own = state.colourMap;
    if (int const error = CheckMap(map)) return error;
    for (unsigned i = 0; i < map.len; ++i) {
        own.red[map.start + i] = map.red[i];
        own.green[map.start + i] = map.green[i];
        own.blue[map.start + i] = map.blue[i];
    }
    return 0;
}

void FramebufferModel::ShowConsole(int console) const
{
    FileIdentity identity;
    if (!Identify(state.framebufferFd, identity) || identity != state.framebuffer) return;
    std::array<unsigned char, 4096> colour{};
    colour.fill(static_cast<unsigned char>(0x55 + console));
    bool const isPlanar = state.mode.depth == 4;
    if (isPlanar) state.vga.latches = 0;  // its black has gone through them
    std::size_t const begin = isPlanar ? kVgaPlanesOffset : 0;
    std::size_t const end = begin + std::size_t{state.mode.pitch} * state.mode.height * (isPlanar ? 4 : 1);
    for (std::size_t at = begin; at < end; at += colour.size())
        if (pwrite(state.framebufferFd, colour.data(), std::min(colour.size(), end - at),
                static_cast<off_t>(at)) == -1)
            return;
}

int FramebufferModel::GetColourMap(fb_cmap const& map) const
{
    auto const& own = state.colourMap;
    if (int const error = CheckMap(map)) return error;
    for (unsigned i = 0; i < map.len; ++i) {
        map.red[i] = own.red[map.start + i];
        map.green[i] = own.green[map.start + i];
        map.blue[i] = own.blue[map.start + i];
    }
    return 0;
}

int FramebufferModel::Answer(Request request, void* argument)
{
    if (argument == nullptr) return EFAULT;
    switch (request) {
    case Request::GetFixedInfo: *static_cast<fb_fix_screeninfo*>(argument) = FixedInfo(); return 0;
    case Request::GetVariableInfo: *static_cast<fb_var_screeninfo*>(argument) = VariableInfo(); return 0;
    case Request::PutColourMap: return PutColourMap(*static_cast<fb_cmap const*>(argument));
    case Request::GetColourMap: return GetColourMap(*static_cast<fb_cmap const*>(argument));
    default: return ENOTTY;
    }
}

}

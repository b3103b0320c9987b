#include <console/viewer_keys.h>

#include <array>
#include <memory>

#include <xkbcommon/xkbcommon.h>

namespace console {

namespace {

constexpr std::uint32_t kFirstConsoleKeysym = 0x1008FE01;  // XF86Switch_VT_1
constexpr unsigned kConsoleKeys = 12;
constexpr std::uint32_t kLastCode = 127;
constexpr xkb_keycode_t kXkbOffset = 8;  // from the kernel's key codes to those of X

struct Place {
    std::uint8_t scanCode, code;
};

/// The keys whose codes differ, those with 0xE0 before them in the second list. The others up to F12 have
/// the code of their place.
constexpr std::uint8_t kLastEqual = 0x58;
constexpr Place kPlaces[] = {{0x54, 99}, {0x59, 117}, {0x5C, 95}, {0x70, 93}, {0x71, 123}, {0x72, 122},
    {0x73, 89}, {0x79, 92}, {0x7B, 94}, {0x7D, 124}, {0x7E, 121}};
constexpr Place kExtendedPlaces[] = {{0x1C, 96}, {0x1D, 97}, {0x20, 113}, {0x2E, 114}, {0x30, 115},
    {0x35, 98}, {0x37, 99}, {0x38, 100}, {0x46, 119}, {0x47, 102}, {0x48, 103}, {0x49, 104}, {0x4B, 105},
    {0x4D, 106}, {0x4F, 107}, {0x50, 108}, {0x51, 109}, {0x52, 110}, {0x53, 111}, {0x5B, 125}, {0x5C, 126},
    {0x5D, 127}, {0x5E, 116}};

template <std::size_t count>
std::optional<unsigned char> Find(Place const (&places)[count], std::uint32_t scanCode)
{
    for (auto const& place : places)
        if (place.scanCode == scanCode) return place.code;
    return std::nullopt;
}

}

std::optional<unsigned char> CodeOfScanCode(std::uint32_t scanCode)
{
    if (scanCode > 0xFF) return std::nullopt;
    if ((scanCode & 0x80) != 0) return Find(kExtendedPlaces, scanCode & 0x7F);
    if (auto const code = Find(kPlaces, scanCode)) return code;
    if (scanCode == 0 || scanCode > kLastEqual || scanCode == 0x55) return std::nullopt;
    return static_cast<unsigned char>(scanCode);
}

KeysymTable::KeysymTable()
{
    std::unique_ptr<xkb_context, decltype(&xkb_context_unref)> const context(
        xkb_context_new(XKB_CONTEXT_NO_ENVIRONMENT_NAMES), xkb_context_unref);
    if (!context) return;
    xkb_context_set_log_level(context.get(), XKB_LOG_LEVEL_CRITICAL);
    xkb_rule_names const names{"evdev", "pc105", "us", "", ""};
    std::unique_ptr<xkb_keymap, decltype(&xkb_keymap_unref)> const keymap(
        xkb_keymap_new_from_names(context.get(), &names, XKB_KEYMAP_COMPILE_NO_FLAGS), xkb_keymap_unref);
    if (!keymap) return;
    for (std::uint32_t code = 1; code <= kLastCode; ++code) {
        auto const levels = xkb_keymap_num_levels_for_key(keymap.get(), code + kXkbOffset, 0);
        for (xkb_level_index_t level = 0; level < levels; ++level) {
            xkb_keysym_t const* keysyms = nullptr;
            int const count =
                xkb_keymap_key_get_syms_by_level(keymap.get(), code + kXkbOffset, 0, level, &keysyms);
            for (int i = 0; i < count; ++i)
                codes.emplace(keysyms[i], static_cast<unsigned char>(code));
        }
    }
}

std::optional<unsigned char> KeysymTable::CodeOf(std::uint32_t keysym) const
{
    auto const found = codes.find(keysym);
    if (found == codes.end()) return std::nullopt;
    return found->second;
}

std::optional<unsigned> ConsoleOfKeysym(std::uint32_t keysym)
{
    if (keysym < kFirstConsoleKeysym || keysym >= kFirstConsoleKeysym + kConsoleKeys) return std::nullopt;
    return keysym - kFirstConsoleKeysym + 1;
}

}

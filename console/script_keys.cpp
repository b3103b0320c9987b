#include <console/script_keys.h>

#include <console/script.h>

#include <algorithm>
#include <array>

namespace console {

namespace {

/// By key code; each line ends with its first. The names are those of QEMU's `sendkey`.
constexpr std::array<std::string_view, 128> kKeyNames = {
    // clang-format off
    "", "esc", "1", "2", "3", "4", "5", "6", "7", "8", "9", "0", "minus", "equal", "backspace",  // 0
    "tab", "q", "w", "e", "r", "t", "y", "u", "i", "o", "p", "bracket_left", "bracket_right", "ret",  // 15
    "ctrl", "a", "s", "d", "f", "g", "h", "j", "k", "l", "semicolon", "apostrophe", "grave_accent",  // 29
    "shift", "backslash", "z", "x", "c", "v", "b", "n", "m", "comma", "dot", "slash", "shift_r",  // 42
    "kp_multiply", "alt", "spc", "caps_lock",  // 55
    "f1", "f2", "f3", "f4", "f5", "f6", "f7", "f8", "f9", "f10", "num_lock", "scroll_lock",  // 59
    "kp_7", "kp_8", "kp_9", "kp_subtract", "kp_4", "kp_5", "kp_6", "kp_add", "kp_1", "kp_2", "kp_3",  // 71
    "kp_0", "kp_decimal", "", "", "less", "f11", "f12", "", "", "", "", "", "", "",  // 82
    "kp_enter", "ctrl_r", "kp_divide", "print", "alt_r", "",  // 96
    "home", "up", "pgup", "left", "right", "end", "down", "pgdn", "insert", "delete",  // 102
    "", "", "", "", "", "", "", "pause", "", "", "", "", "", "meta_l", "meta_r", "compose",  // 112
    // clang-format on
};
static_assert(kKeyNames[55] == "kp_multiply" && kKeyNames[96] == "kp_enter" && kKeyNames[127] == "compose");

std::optional<unsigned char> CodeOf(std::string_view name)
{
    auto const found = std::find(kKeyNames.begin(), kKeyNames.end(), name);
    if (name.empty() || found == kKeyNames.end()) return std::nullopt;
    return static_cast<unsigned char>(found - kKeyNames.begin());
}

}

std::optional<std::vector<unsigned char>> BytesOfChord(std::string_view chord)
{
    std::vector<unsigned char> bytes;
    for (std::size_t from = 0, end = 0; end != std::string_view::npos; from = end + 1) {
        end = chord.find('-', from);
        auto const code = CodeOf(chord.substr(from, end - from));
        if (!code) return std::nullopt;
        bytes.push_back(*code);
    }
    for (std::size_t i = bytes.size(); i-- > 0;)
        bytes.push_back(bytes[i] | KeyByte::kReleased);
    return bytes;
}

}

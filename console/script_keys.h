#pragma once

#include <optional>
#include <string_view>
#include <vector>

namespace console {

/// The bytes of keys that are pressed together: "ctrl-alt-f2" presses the named keys in this order and lets
/// them go in the opposite one. Nothing if a name isn't known.
std::optional<std::vector<unsigned char>> BytesOfChord(std::string_view chord);

}

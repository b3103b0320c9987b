#pragma once

#include <cstdint>
#include <optional>
#include <unordered_map>

namespace console {

/// The key code, as in medium raw mode, of a key that a viewer names by its place: by the scan code of an XT
/// keyboard, with 0x80 added if 0xE0 comes before it. Nothing for keys that the console's keyboard lacks, or
/// whose codes need more than a byte.
std::optional<unsigned char> CodeOfScanCode(std::uint32_t scanCode);

/// The keys of those viewers that tell characters only: where a US keyboard has them.
class KeysymTable {
public:
    /// Empty if the system's description of the keyboard cannot be read.
    KeysymTable();

    std::optional<unsigned char> CodeOf(std::uint32_t keysym) const;

private:
    std::unordered_map<std::uint32_t, unsigned char> codes;
};

/// The console that a viewer asks for with one of the keys meant for that, 1 to 12. Nothing for other keys.
std::optional<unsigned> ConsoleOfKeysym(std::uint32_t keysym);

}

#pragma once

#include <tessella/key_layout_file.h>

#include <array>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <vector>

namespace tools {

/// A key layout as its text describes it. The text's format stands in docs/key-layouts.md.
struct Layout {
    struct DeadKey {
        std::uint16_t character;
        std::vector<GrDeadKeyPair> pairs;
    };

    std::u16string name;
    std::array<GrKeyRow, GrKeyLayoutRecord::kRowCount> rows{};  ///< by Linux key code
    std::vector<DeadKey> deadKeys;
};

/// A text that describes no layout, or cannot be read. Says where: the file, and the line if it is one line.
class LayoutError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// Reads the layout of a text file, and the layout that it is based on from the same folder. Throws
/// `LayoutError`.
Layout ReadLayout(std::filesystem::path const& file);

}

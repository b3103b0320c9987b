#pragma once

#include <span>
#include <string_view>

namespace specimen {

struct Language {
    std::u16string_view code;       ///< as in the library's table of languages
    std::u16string_view name;       ///< in the language itself
    bool isAlphabetic;              ///< then the scalable face covers its script
    std::u16string_view paragraph;  ///< says the same in all languages
};

/// All that the library knows, in the order of its table.
std::span<Language const> Languages();

}

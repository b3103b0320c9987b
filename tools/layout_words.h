#pragma once

#include <cstdint>
#include <stdexcept>
#include <string>
#include <string_view>

namespace tools {

/// A line that does not say what it should; the text tells why.
class WordError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// The words of one line of a layout's text, without the comment at its end. Words that are not there, or
/// not what is asked for, are a `WordError`.
class Words {
public:
    /// `line` must outlive the words.
    explicit Words(std::string_view line);

    bool IsAtEnd() const { return rest.empty(); }
    std::string Peek() const;
    std::string Next();

    unsigned NextNumber();          ///< decimal
    std::uint16_t NextCharacter();  ///< itself in UTF-8, U+ and hexadecimal digits, or none
    std::uint16_t NextVk();         ///< an ASCII character, or 0x and hexadecimal digits

private:
    void SkipBlanks();

    std::string_view rest;  ///< begins with the next word
};

}

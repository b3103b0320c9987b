#include <tools/layout_words.h>

#include <algorithm>
#include <charconv>
#include <optional>
#include <system_error>

namespace tools {

namespace {

constexpr std::string_view kBlanks = " \t\r";

std::optional<unsigned> ParseNumber(std::string_view digits, int base)
{
    unsigned value = 0;
    auto const [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), value, base);
    if (error != std::errc() || end != digits.data() + digits.size()) return {};
    return value;
}

/// The one character that `word` is in UTF-8, if it is one of those with a single UTF-16 unit.
std::optional<std::uint16_t> DecodeOne(std::string_view word)
{
    auto const byte = [&](std::size_t i) { return static_cast<unsigned char>(word[i]); };
    auto const follows = [&](std::size_t i) { return (byte(i) & 0xC0) == 0x80; };
    unsigned code = 0;
    if (word.size() == 1 && byte(0) < 0x80) {
        return byte(0);
    }
    if (word.size() == 2 && (byte(0) & 0xE0) == 0xC0 && follows(1)) {
        code = (byte(0) & 0x1Fu) << 6 | (byte(1) & 0x3Fu);
        if (code >= 0x80) return static_cast<std::uint16_t>(code);
    }
    if (word.size() == 3 && (byte(0) & 0xF0) == 0xE0 && follows(1) && follows(2)) {
        code = (byte(0) & 0x0Fu) << 12 | (byte(1) & 0x3Fu) << 6 | (byte(2) & 0x3Fu);
        if (code >= 0x800 && (code < 0xD800 || code > 0xDFFF)) return static_cast<std::uint16_t>(code);
    }
    return {};
}

}

Words::Words(std::string_view line) : rest(line) { SkipBlanks(); }

void Words::SkipBlanks()
{
    rest.remove_prefix(std::min(rest.find_first_not_of(kBlanks), rest.size()));
    if (rest.starts_with("//")) rest = {};
}

std::string Words::Peek() const { return std::string(rest.substr(0, rest.find_first_of(kBlanks))); }

std::string Words::Next()
{
    if (IsAtEnd()) throw WordError("the line ends too early");
    auto word = Peek();
    rest.remove_prefix(word.size());
    SkipBlanks();
    return word;
}

unsigned Words::NextNumber()
{
    auto const word = Next();
    if (auto const number = ParseNumber(word, 10)) return *number;
    throw WordError("'" + word + "' is no number");
}

std::uint16_t Words::NextCharacter()
{
    auto const word = Next();
    if (word == "none") return 0;
    if (auto const character = DecodeOne(word)) return *character;
    if (word.starts_with("U+")) {
        auto const code = ParseNumber(std::string_view(word).substr(2), 16);
        if (code && *code <= 0xFFFF) return static_cast<std::uint16_t>(*code);
    }
    throw WordError("'" + word + "' is no character of one UTF-16 unit, U+XXXX or none");
}

std::uint16_t Words::NextVk()
{
    auto const word = Next();
    if (word.size() == 1) {
        if (auto const character = DecodeOne(word)) return *character;
    }
    if (word.starts_with("0x")) {
        auto const code = ParseNumber(std::string_view(word).substr(2), 16);
        if (code && *code <= 0xFFFF) return static_cast<std::uint16_t>(*code);
    }
    throw WordError("'" + word + "' is no virtual key code; those are an ASCII character and 0xXXXX");
}

}

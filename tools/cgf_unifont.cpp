#include <tools/cgf_unifont.h>

#include <charconv>
#include <fstream>
#include <stdexcept>
#include <string_view>

namespace tools {

namespace {

constexpr unsigned kRows = 16;
constexpr int kAscent = 14;

/// The number that the whole text is. Throws if it is none.
template <typename Number>
Number ToNumber(std::string_view text, int base)
{
    Number number{};
    auto const* const end = text.data() + text.size();
    auto const [behind, error] = std::from_chars(text.data(), end, number, base);
    if (error != std::errc{} || behind != end)
        throw std::runtime_error("'" + std::string(text) + "' is no number");
    return number;
}

Glyph ReadCell(std::string_view digits)
{
    std::size_t const rowDigits = digits.size() / kRows;
    if (digits.size() % kRows != 0 || (rowDigits != 2 && rowDigits != 4))
        throw std::runtime_error("a glyph is 8 or 16 pixels wide");
    auto const width = static_cast<unsigned>(rowDigits * 4);
    Glyph glyph{0, kAscent, width, width, kRows, {}};
    for (; !digits.empty(); digits.remove_prefix(rowDigits)) {
        auto const row = ToNumber<unsigned>(digits.substr(0, rowDigits), 16);
        for (unsigned x = 0; x < width; ++x)
            glyph.ink.push_back(row >> (width - 1 - x) & 1);
    }
    return glyph;
}

/// What the lines of the file say of characters. Each is a code in hexadecimal digits, a colon, and a text
/// that `read` takes.
template <typename Read>
auto ReadLines(std::string const& path, Read read)
{
    std::map<char16_t, decltype(read(std::string_view{}))> lines;
    std::ifstream file(path);
    if (!file) throw std::runtime_error(path + ": cannot be opened");
    std::string text;
    for (unsigned number = 1; std::getline(file, text); ++number) {
        try {
            std::string_view const line = text;
            auto const colon = line.find(':');
            if (colon == line.npos) throw std::runtime_error("there is no colon");
            auto const code = ToNumber<std::uint16_t>(line.substr(0, colon), 16);
            lines[code] = read(line.substr(colon + 1));
        } catch (std::runtime_error const& error) {
            throw std::runtime_error(path + ":" + std::to_string(number) + ": " + error.what());
        }
    }
    if (file.bad()) throw std::runtime_error(path + ": cannot be read");
    return lines;
}

}

Glyphs ReadUnifont(std::string const& path) { return ReadLines(path, ReadCell); }

std::map<char16_t, int> ReadUnifontOffsets(std::string const& path)
{
    return ReadLines(path, [](std::string_view text) { return ToNumber<int>(text, 10); });
}

}

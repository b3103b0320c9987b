#include <xml/strict_utf8.h>

namespace {

/// The characters that begin with a byte of one range. Further bytes are 80 to BF, the second maybe fewer.
struct Lead {
    unsigned char first, last;
    unsigned char length;
    unsigned char secondFirst = 0x80, secondLast = 0xBF;
};

constexpr Lead kLeads[] = {{0x20, 0x7F, 1}, {0xC2, 0xDF, 2}, {0xE0, 0xE0, 3, 0xA0, 0xBF}, {0xE1, 0xEC, 3},
    {0xED, 0xED, 3, 0x80, 0x9F}, {0xEE, 0xEF, 3}, {0xF0, 0xF0, 4, 0x90, 0xBF}, {0xF1, 0xF3, 4},
    {0xF4, 0xF4, 4, 0x80, 0x8F}};

/// The length of the character that `bytes` begin with; 0 if they begin with none.
unsigned LengthOfFirst(std::string_view bytes)
{
    auto const byte = [bytes](unsigned i) { return static_cast<unsigned char>(bytes[i]); };
    for (Lead const& lead : kLeads) {
        if (byte(0) < lead.first || byte(0) > lead.last) continue;
        if (bytes.size() < lead.length) return 0;
        if (lead.length > 1 && (byte(1) < lead.secondFirst || byte(1) > lead.secondLast)) return 0;
        for (unsigned i = 2; i < lead.length; ++i) {
            if ((byte(i) & 0xC0) != 0x80) return 0;
        }
        return lead.length;
    }
    return 0;
}

}

std::size_t DecodeStrictUtf8(std::u16string& out, std::string_view bytes)
{
    std::size_t good = 0;
    while (good < bytes.size()) {
        unsigned const length = LengthOfFirst(bytes.substr(good));
        if (length == 0) break;
        char32_t character = static_cast<unsigned char>(bytes[good]) & (length == 1 ? 0x7F : 0x7F >> length);
        for (char const byte : bytes.substr(good + 1, length - 1))
            character = character << 6 | (byte & 0x3F);
        if (character == 0xFFFE || character == 0xFFFF) break;
        AppendUtf16(out, character);
        good += length;
    }
    return good;
}

void AppendUtf16(std::u16string& out, char32_t character)
{
    if (character < 0x10000) {
        out += static_cast<char16_t>(character);
    } else {
        out += static_cast<char16_t>(0xD7C0 + (character >> 10));
        out += static_cast<char16_t>(0xDC00 | (character & 0x3FF));
    }
}

#include <common/utf8.h>

#include <cstdint>
#include <cstring>
#include <string_view>

namespace {

constexpr char16_t kReplacement = 0xFFFD;

/// How a character of several bytes begins.
struct Lead {
    unsigned char first, last;
    unsigned length;
    std::uint32_t shortest;  // smaller values have a shorter form
};

constexpr Lead kLeads[] = {{0xC0, 0xDF, 2, 0x80}, {0xE0, 0xEF, 3, 0x800}, {0xF0, 0xF7, 4, 0x10000}};

/// Null if `bytes` does not begin with a lead and all its continuation bytes.
Lead const* FindLead(std::string_view bytes)
{
    auto const first = static_cast<unsigned char>(bytes[0]);
    for (Lead const& lead : kLeads) {
        if (first < lead.first || first > lead.last) continue;
        if (bytes.size() < lead.length) return nullptr;
        for (char const byte : bytes.substr(1, lead.length - 1)) {
            if ((byte & 0xC0) != 0x80) return nullptr;
        }
        return &lead;
    }
    return nullptr;
}

std::uint32_t DecodeCharacter(std::string_view bytes, Lead const& lead)
{
    std::uint32_t character = static_cast<unsigned char>(bytes[0]) & (0x7F >> lead.length);
    for (char const byte : bytes.substr(1, lead.length - 1))
        character = character << 6 | (byte & 0x3F);
    return character;
}

}

bool Common::DecodeUtf8(std::u16string& out, char const* bytes, std::size_t size)
{
    out.clear();
    bool valid = true;
    for (std::string_view rest(bytes, strnlen(bytes, size)); !rest.empty();) {
        if ((rest[0] & 0x80) == 0) {
            out += static_cast<char16_t>(rest[0]);
            rest.remove_prefix(1);
            continue;
        }
        Lead const* const lead = FindLead(rest);
        if (lead == nullptr) {
            valid = false;
            out += kReplacement;
            rest.remove_prefix(1);
            continue;
        }
        std::uint32_t const character = DecodeCharacter(rest, *lead);
        rest.remove_prefix(lead->length);
        if (character < lead->shortest) valid = false;
        if (character < 0x10000) {
            out += static_cast<char16_t>(character);
        } else if (character <= 0x10FFFF) {
            out += static_cast<char16_t>(0xD7C0 + (character >> 10));
            out += static_cast<char16_t>(0xDC00 | (character & 0x3FF));
        } else {
            valid = false;
            out += kReplacement;
        }
    }
    return valid;
}

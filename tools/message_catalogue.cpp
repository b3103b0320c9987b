#include <tools/message_catalogue.h>

namespace tools {

namespace {

void AppendWord(std::string& bytes, std::size_t word)
{
    for (int shift = 0; shift < 32; shift += 8)
        bytes += static_cast<char>(word >> shift);
}

}

std::string MakeCatalogue(Messages const& messages)
{
    std::string slots;
    std::string texts;
    for (std::u16string const& message : messages) {
        AppendWord(slots, messages.size() * sizeof(std::uint32_t) - slots.size() + texts.size());
        for (char16_t const unit : message + u'\0') {
            texts += static_cast<char>(unit);
            texts += static_cast<char>(unit >> 8);
        }
    }
    std::string bytes;
    AppendWord(bytes, sizeof(MessageCatalogue) + slots.size() + texts.size());
    AppendWord(bytes, messages.size());
    return bytes + slots + texts;
}

}

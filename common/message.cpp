#include <common/message.h>

#include <common/message_table.h>

#include <functional>

namespace {

MessageCatalogue const& CatalogueInForce() { return BuiltInMessages(); }

unsigned char const* BytesOf(MessageCatalogue const& catalogue)
{
    return reinterpret_cast<unsigned char const*>(&catalogue);
}

}

unsigned short const* GetMessage(unsigned key)
{
    unsigned char const* const slot =
        BytesOf(CatalogueInForce()) + sizeof(MessageCatalogue) + key * sizeof(std::uint32_t);
    return reinterpret_cast<unsigned short const*>(slot + *reinterpret_cast<std::uint32_t const*>(slot));
}

bool IsInCatalogue(unsigned short const* text)
{
    MessageCatalogue const& catalogue = CatalogueInForce();
    auto const* const bytes = reinterpret_cast<unsigned char const*>(text);
    return !std::less<>()(bytes, BytesOf(catalogue)) &&
        std::less<>()(bytes, BytesOf(catalogue) + catalogue.size);
}

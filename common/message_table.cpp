#include <common/message_table.h>

#include <common/message.h>

#include <array>
#include <cstddef>
#include <string_view>

namespace {

struct Text {
    unsigned key;
    std::u16string_view text;
};

/// Keys that nothing looks up have empty texts: they are there for the numbering's sake.
constexpr Text kEnglish[] = {
    {MessageAccessDenied, u"Access to the file is denied."},
    {MessageFileExists, u"The file (folder) already exists."},
    {MessageBackupFailed, u"Error occurred while backing up."},
    {MessageCanceled, u"Canceled."},
    {MessageFileCorrupted, u"The file is corrupted."},
    {MessageCreateFailed, u"Error occurred while creating the file."},
    {MessageDiskFull, u"The disk is full."},
    {MessageEndOfFile, u"The end of the file has been reached."},
    {MessageLockFailed, u"Failed to lock the file."},
    {MessageNoSuchFile, u"The specified file does not exist."},
    {MessageDriveNotReady, u"The drive is not ready."},
    {MessageOpenFailed, u"Error occurred while opening the file."},
    {MessageOutOfMemory, u"Not enough memory to complete the operation."},
    {MessageFileReadOnly, u"The file is read-only."},
    {MessageReadFailed, u"Error occurred while reading the file."},
    {MessageDeleteFailed, u"Error occurred while deleting the file."},
    {MessageRenameFailed, u"Error occurred while renaming the file."},
    {MessageWriteDenied, u"Security error occurred while opening the file for writing."},
    {MessageSeekFailed, u"Error occurred while searching in the file."},
    {MessageNotSupported, u"The operation is not supported."},
    {MessageWriteFailed, u"Error occurred while writing to the file."},
};

constexpr std::size_t kUnits = [] {
    std::size_t units = kMessageCount;  // the zeros at the ends
    for (Text const& entry : kEnglish)
        units += entry.text.size();
    return units;
}();

constexpr std::size_t kCatalogueSize =
    sizeof(MessageCatalogue) + kMessageCount * sizeof(std::uint32_t) + kUnits * sizeof(unsigned short);

struct EnglishTable {
    std::uint32_t keySet;  ///< ahead of the catalogue: which set of keys it has, told by their number
    MessageCatalogue head;
    std::array<std::uint32_t, kMessageCount> slots;
    std::array<unsigned short, kUnits> texts;
};

consteval EnglishTable MakeEnglishTable()
{
    EnglishTable table = {kMessageCount, {kCatalogueSize, kMessageCount}, {}, {}};
    std::size_t unit = 0;
    for (std::uint32_t key = 0; key < kMessageCount; ++key) {
        table.slots[key] = (kMessageCount - key) * sizeof(std::uint32_t) +
            static_cast<std::uint32_t>(unit * sizeof(unsigned short));
        for (Text const& entry : kEnglish) {
            if (entry.key != key) continue;
            for (char16_t const letter : entry.text)
                table.texts[unit++] = letter;
        }
        ++unit;
    }
    return table;
}

constexpr EnglishTable kEnglishTable = MakeEnglishTable();
static_assert(offsetof(EnglishTable, texts) - offsetof(EnglishTable, head) ==
    sizeof(MessageCatalogue) + sizeof(EnglishTable::slots));

}

MessageCatalogue const& BuiltInMessages() { return kEnglishTable.head; }

MessageCatalogue const* ReadCatalogue(unsigned char const* bytes, std::size_t size)
{
    auto const* const catalogue = reinterpret_cast<MessageCatalogue const*>(bytes);
    if (bytes == nullptr || size < sizeof *catalogue || catalogue->size != size ||
        catalogue->entryCount != kEnglishTable.keySet)
        return nullptr;
    // Look-ups check nothing. A text that begins before the zero at the end ends there at the latest.
    std::size_t const texts = sizeof *catalogue + kMessageCount * sizeof(std::uint32_t);
    std::size_t const last = size - sizeof(unsigned short);
    if (size % sizeof(unsigned short) != 0 || last < texts || bytes[last] != 0 || bytes[last + 1] != 0)
        return nullptr;
    for (std::size_t slot = sizeof *catalogue; slot < texts; slot += sizeof(std::uint32_t)) {
        std::size_t const start = slot + *reinterpret_cast<std::uint32_t const*>(bytes + slot);
        if (start % sizeof(unsigned short) != 0 || start > last) return nullptr;
    }
    return catalogue;
}

unsigned short const* TextOf(MessageCatalogue const& catalogue, unsigned key)
{
    unsigned char const* const slot =
        reinterpret_cast<unsigned char const*>(&catalogue + 1) + key * sizeof(std::uint32_t);
    return reinterpret_cast<unsigned short const*>(slot + *reinterpret_cast<std::uint32_t const*>(slot));
}

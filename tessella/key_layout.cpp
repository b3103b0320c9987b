#include <tessella/key_layout.h>

#include <tessella/event.h>

#include <algorithm>
#include <cstring>
#include <iterator>

namespace {

/// A record of the file that may stand at any address.
template <typename Record>
Record Load(unsigned char const* bytes)
{
    Record record;
    std::memcpy(&record, bytes, sizeof(Record));
    return record;
}

}

std::unique_ptr<GrSmartKeyLayout> GrSmartKeyLayout::Create(
    std::span<unsigned char const> file, std::size_t offset)
{
    if (offset > file.size() || file.size() - offset < sizeof(GrKeyLayoutRecord)) return nullptr;
    std::unique_ptr<GrSmartKeyLayout> layout(
        new GrSmartKeyLayout(reinterpret_cast<GrKeyLayoutRecord const*>(file.data() + offset)));
    return layout->FindDeadKeys(file) ? std::move(layout) : nullptr;
}

bool GrSmartKeyLayout::FindDeadKeys(std::span<unsigned char const> file)
{
    if (table->deadKeyCount > std::size(deadTables)) return false;
    if (table->deadKeyCount == 0) return true;
    if (table->deadKeyOffset > file.size()) return false;
    auto rest = file.subspan(table->deadKeyOffset);
    for (unsigned i = 0; i < table->deadKeyCount; ++i) {
        if (rest.size() < sizeof(GrDeadKeyRecord)) return false;
        auto const deadKey = Load<GrDeadKeyRecord>(rest.data());
        if (deadKey.size < sizeof(GrDeadKeyRecord) || deadKey.size > rest.size()) return false;
        if (deadKey.pairCount > (deadKey.size - sizeof(GrDeadKeyRecord)) / sizeof(GrDeadKeyPair))
            return false;
        deadTables[i] = rest.data();
        rest = rest.subspan(deadKey.size);
    }
    return true;
}

// A name that fills its field ends at the latest in the upper half of the number of dead keys, which is 0.
char16_t const* GrSmartKeyLayout::GetName() const { return table->name; }

unsigned GrSmartKeyLayout::Translate(unsigned scan, unsigned& flags, unsigned short* ch) const
{
    if (scan >= std::size(table->rows)) return 0;
    auto const& row = table->rows[scan];
    if (ch == nullptr) return row.vk;

    bool const shift = (flags & GrModShift) != 0;
    bool const caps = (flags & GrModCapsLock) != 0;
    if ((flags & GrModNumLock) != 0 && (row.flags & GrKeyRow::kPad) != 0) {
        if (!shift) {
            *ch = row.alternates[0];
            return row.alternates[1];
        }
        flags &= ~std::uint32_t{GrModShift};
        *ch = row.characters[0];
        return row.vk;
    }
    constexpr unsigned kControlAlt = GrModControl | GrModAlt;
    if ((flags & GrModRightAlt) != 0 || (flags & kControlAlt) == kControlAlt) {
        bool const swapped = caps && (row.alternateFlags & GrKeyRow::kAltCaps) != 0;
        *ch = row.alternates[shift != swapped];
        if (*ch != 0) flags &= ~(kControlAlt | GrModRightAlt);
        return row.vk;
    }
    *ch = row.characters[(caps ? 2 : 0) + (shift ? 1 : 0)];
    return row.vk;
}

unsigned GrSmartKeyLayout::FindVkForChar(unsigned ch) const
{
    // On a key of the pad the second alternate is no character, but it is compared all the same.
    for (auto const& row : std::span(table->rows).first(std::size(table->rows) - 1)) {
        if (std::ranges::find(row.characters, ch) != std::end(row.characters) ||
            std::ranges::find(row.alternates, ch) != std::end(row.alternates))
            return row.vk;
    }
    return 0;
}

unsigned GrSmartKeyLayout::FindDeadKey(unsigned ch) const
{
    for (unsigned i = 0; i < table->deadKeyCount; ++i) {
        if (Load<GrDeadKeyRecord>(deadTables[i]).character == ch) return i;
    }
    return kNoDeadKey;
}

bool GrSmartKeyLayout::ApplyDeadKey(unsigned index, unsigned& ch) const
{
    // The number may be of another layout, if that was the active one when the dead key was pressed.
    if (index >= table->deadKeyCount) return false;
    unsigned char const* const deadKey = deadTables[index];
    unsigned char const* at = deadKey + sizeof(GrDeadKeyRecord);
    for (auto left = Load<GrDeadKeyRecord>(deadKey).pairCount; left > 0;
         --left, at += sizeof(GrDeadKeyPair)) {
        auto const pair = Load<GrDeadKeyPair>(at);
        if (pair.character != ch) continue;
        ch = pair.composed;
        return true;
    }
    return false;
}

std::optional<std::vector<std::unique_ptr<GrSmartKeyLayout>>> ReadKeyLayouts(
    std::span<unsigned char const> file)
{
    // One layout is the least, even for a file that says it has none.
    if (file.size() < kLeastLayoutFile) return std::nullopt;
    std::vector<std::unique_ptr<GrSmartKeyLayout>> layouts;
    std::size_t offset = sizeof(GrKeyLayoutFile);
    for (auto left = Load<GrKeyLayoutFile>(file.data()).layoutCount; left > 0; --left) {
        layouts.push_back(GrSmartKeyLayout::Create(file, offset));
        if (!layouts.back()) return std::nullopt;
        offset += sizeof(GrKeyLayoutRecord);
    }
    return layouts;
}

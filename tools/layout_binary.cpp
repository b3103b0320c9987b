#include <tools/layout_binary.h>

#include <algorithm>

namespace tools {

namespace {

template <typename Record>
void Append(std::string& bytes, Record const& record)
{
    bytes.append(reinterpret_cast<char const*>(&record), sizeof(record));
}

std::string MakeDeadKeys(Layout const& layout)
{
    std::string bytes;
    for (auto const& [character, pairs] : layout.deadKeys) {
        auto const count = static_cast<std::uint32_t>(pairs.size());
        auto const size = static_cast<std::uint32_t>(sizeof(GrDeadKeyRecord) + count * sizeof(GrDeadKeyPair));
        Append(bytes, GrDeadKeyRecord{size, character, 0, count});
        for (auto const& pair : pairs)
            Append(bytes, pair);
    }
    return bytes;
}

}

std::string MakeLayoutFile(std::span<Layout const> layouts)
{
    std::string records;
    std::string deadKeys;
    Append(records, GrKeyLayoutFile{static_cast<std::uint16_t>(layouts.size()), 0});
    auto const behindRecords = records.size() + layouts.size() * sizeof(GrKeyLayoutRecord);
    for (auto const& layout : layouts) {
        GrKeyLayoutRecord record{};
        std::ranges::copy(layout.name, record.name);
        std::ranges::copy(layout.rows, record.rows);
        record.deadKeyCount = static_cast<std::uint32_t>(layout.deadKeys.size());
        if (record.deadKeyCount != 0)
            record.deadKeyOffset = static_cast<std::uint32_t>(behindRecords + deadKeys.size());
        Append(records, record);
        deadKeys += MakeDeadKeys(layout);
    }
    return records + deadKeys;
}

}

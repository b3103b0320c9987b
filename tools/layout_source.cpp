#include <tools/layout_source.h>

#include <tools/layout_words.h>

#include <algorithm>
#include <bitset>
#include <fstream>

namespace tools {

namespace {

/// One text on its way into a layout, a line at a time.
class Reader {
public:
    /// A text that is the base of another must have none itself.
    enum class Role { Layout, Base };

    Reader(std::filesystem::path path, Role itsRole) : file(std::move(path)), role(itsRole) {}
    Layout Read();

private:
    void ReadLine(Words& words);
    void ReadName(Words& words);
    void ReadBase(Words& words);
    void ReadKey(Words& words);
    void ReadDeadKey(Words& words);

    std::filesystem::path file;
    Role role;
    Layout layout;
    std::bitset<GrKeyLayoutRecord::kRowCount> keysRead;
    bool hasBase = false;
};

Layout Reader::Read()
{
    std::ifstream text(file);
    if (!text) throw LayoutError(file.string() + ": cannot be opened");
    std::string line;
    for (unsigned number = 1; std::getline(text, line); ++number) {
        try {
            Words words(line);
            if (words.IsAtEnd()) continue;
            ReadLine(words);
            if (!words.IsAtEnd()) throw WordError("'" + words.Next() + "' is one word too many");
        } catch (WordError const& error) {
            throw LayoutError(file.string() + ":" + std::to_string(number) + ": " + error.what());
        }
    }
    if (text.bad()) throw LayoutError(file.string() + ": cannot be read");
    if (layout.name.empty()) throw LayoutError(file.string() + ": the layout has no name");
    return std::move(layout);
}

void Reader::ReadLine(Words& words)
{
    auto const word = words.Next();
    if (word == "name") return ReadName(words);
    if (word == "base") return ReadBase(words);
    if (word == "key") return ReadKey(words);
    if (word == "dead") return ReadDeadKey(words);
    throw WordError("'" + word + "' begins no line; name, base, key and dead do");
}

void Reader::ReadName(Words& words)
{
    if (!layout.name.empty()) throw WordError("the layout has a name already");
    auto const word = words.Next();
    for (char const c : word) {
        if (c <= ' ' || c > '~') throw WordError("a name is made of ASCII characters");
        layout.name.push_back(static_cast<char16_t>(c));
    }
    if (layout.name.size() >= GrKeyLayoutRecord::kNameLength)
        throw WordError("a name has 7 characters at most");
}

void Reader::ReadBase(Words& words)
{
    if (role == Role::Base) throw WordError("the base of another layout has no base itself");
    if (hasBase || keysRead.any()) throw WordError("the base stands before the keys, and once");
    hasBase = true;
    layout.rows = Reader(file.parent_path() / words.Next(), Role::Base).Read().rows;
}

void Reader::ReadKey(Words& words)
{
    auto const code = words.NextNumber();
    if (code >= layout.rows.size()) throw WordError("key codes end at 127");
    if (keysRead[code]) throw WordError("key " + std::to_string(code) + " is here already");
    keysRead.set(code);

    auto& row = layout.rows[code];
    row = {};
    row.vk = words.NextVk();
    if (words.IsAtEnd()) return;
    auto& [plain, shift, caps, capsShift] = row.characters;
    auto const kind = words.Next();
    if (kind == "pad") {
        row.flags = GrKeyRow::kPad;
        row.alternates[0] = words.NextCharacter();
        row.alternates[1] = words.NextVk();
        return;
    }
    plain = words.NextCharacter();
    if (kind == "always") {
        shift = caps = capsShift = plain;
        row.flags = GrKeyRow::kLetter;
    } else if (kind == "sign") {
        caps = plain;
        capsShift = shift = words.NextCharacter();
    } else if (kind == "letter") {
        capsShift = plain;
        caps = shift = words.NextCharacter();
        row.flags = GrKeyRow::kLetter;
    } else if (kind == "caps") {
        shift = words.NextCharacter();
        caps = words.NextCharacter();
        capsShift = words.NextCharacter();
        row.flags = GrKeyRow::kLetter;
    } else {
        throw WordError("'" + kind + "' is no kind of key; sign, letter, caps, always and pad are");
    }
    if (words.IsAtEnd()) return;

    auto const alternate = words.Next();
    if (alternate != "altgr" && alternate != "altgr-caps")
        throw WordError("'" + alternate + "' is not altgr or altgr-caps");
    row.alternates[0] = words.NextCharacter();
    if (!words.IsAtEnd()) row.alternates[1] = words.NextCharacter();
    if (alternate == "altgr-caps") row.alternateFlags = GrKeyRow::kAltCaps;
}

void Reader::ReadDeadKey(Words& words)
{
    auto const character = words.NextCharacter();
    auto deadKey = std::ranges::find(layout.deadKeys, character, &Layout::DeadKey::character);
    if (deadKey == layout.deadKeys.end()) {
        if (layout.deadKeys.size() == GrKeyLayoutRecord::kMostDeadKeys)
            throw WordError("a layout has 127 dead keys at most");
        deadKey = layout.deadKeys.insert(deadKey, {character, {}});
    }
    while (!words.IsAtEnd()) {
        auto const shown = words.Peek();
        GrDeadKeyPair pair{};
        pair.character = words.NextCharacter();
        pair.composed = words.NextCharacter();
        if (std::ranges::count(deadKey->pairs, pair.character, &GrDeadKeyPair::character) != 0)
            throw WordError("the dead key has a pair for '" + shown + "' already");
        deadKey->pairs.push_back(pair);
    }
}

}

Layout ReadLayout(std::filesystem::path const& file) { return Reader(file, Reader::Role::Layout).Read(); }

}

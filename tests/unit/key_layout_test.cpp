#include <support/layout_file.h>
#include <tessella/event.h>
#include <tessella/keyboard.h>

#include <gtest/gtest.h>

#include <array>
#include <cstring>

namespace {

constexpr unsigned kShift = GrModShift, kCaps = GrModCapsLock, kNum = GrModNumLock;
constexpr unsigned kRight = GrModAlt | GrModRightAlt, kRightShift = GrModShift | GrModRightShift;

Bytes const kRoot = ReadBytes(RESOURCES "keyboard.kbd");
Bytes const kGerman = ReadBytes(RESOURCES "de/keyboard.kbd");

TEST(KeyLayout, ModifiersChooseTheCharacterAndAreUsedUp)
{
    LayoutFile const file(kGerman);
    auto const& german = *file.layouts.value().front();
    EXPECT_EQ(std::u16string(german.GetName()), u"DE");
    struct {
        unsigned scan, modifiers, vk, character, left;
    } const cases[] = {{21, 0, 'y', 'z', 0}, {21, kRightShift, 'y', 'Z', kRightShift},
        {21, kCaps | kNum, 'y', 'Z', kCaps | kNum}, {21, kCaps | kShift, 'y', 'z', kCaps | kShift},
        {3, kCaps | kShift, '2', '"', kCaps | kShift}, {16, kRight, 'q', '@', 0},
        {16, GrModControl | GrModAlt | kNum, 'q', '@', kNum}, {16, GrModAlt, 'q', 'q', GrModAlt},
        {16, GrModControl, 'q', 'q', GrModControl},
        // Without a character the modifiers stay. Caps lock swaps the two.
        {17, kRight, 'w', 0, kRight}, {16, kRight | kShift, 'q', 0, kRight | kShift},
        {16, kRight | kCaps, 'q', 0, kRight | kCaps}, {16, kRight | kCaps | kShift, 'q', '@', kCaps | kShift},
        // On the pad num lock goes before right alt, which takes the other code for a character.
        {71, 0, GrVkPadHome, 0, 0}, {71, kShift, GrVkPadHome, 0, kShift}, {71, kNum, 0x7FB7, '7', kNum},
        {71, kNum | kRight, 0x7FB7, '7', kNum | kRight},
        {71, kNum | kRightShift, GrVkPadHome, 0, kNum | GrModRightShift},
        {71, kRight | kShift, GrVkPadHome, 0x7FB7, kShift},
        // Keys that do nothing, the last one, and none.
        {85, kNum, 0, 0, kNum}, {127, 0, GrVkMenu, 0, 0}, {128, kShift, 0, 0xFFFF, kShift}};
    for (auto const& c : cases) {
        unsigned left = c.modifiers;
        unsigned short character = 0xFFFF;
        EXPECT_EQ(german.Translate(c.scan, left, &character), c.vk) << c.scan << " with " << c.modifiers;
        EXPECT_EQ(character, c.character) << c.scan << " with " << c.modifiers;
        EXPECT_EQ(left, c.left) << c.scan << " with " << c.modifiers;
    }
    unsigned modifiers = kNum | kShift;
    EXPECT_EQ(german.Translate(71, modifiers, nullptr), GrVkPadHome);
    EXPECT_EQ(modifiers, kNum | kShift);
}

TEST(KeyLayout, FirstKeyWithTheCharacterIsFoundAndDeadKeysByNumber)
{
    LayoutFile file(kGerman);
    auto const& german = *file.layouts.value().front();
    for (auto const& [character, vk] :
        {std::pair{'@' + 0u, 'q' + 0u}, {'7', '7'}, {'Z', 'y'}, {'*', GrVkRightBracket},
            {0x7FB7, GrVkPadHome}, {0x13, GrVkPadEnter}, {0x411, 0}, {0, 0}, {0x10000 + 'q', 0}})
        EXPECT_EQ(german.FindVkForChar(character), vk) << character;
    // The last key is not looked at.
    std::memcpy(file.bytes.data() + 20 + 127 * 18 + 2, "\x11\x04", 2);
    EXPECT_EQ(german.FindVkForChar(0x411), 0u);
    std::memcpy(file.bytes.data() + 20 + 126 * 18 + 12, "\x11\x04", 2);
    EXPECT_EQ(german.FindVkForChar(0x411), GrVkRightLogo);

    for (auto const& [index, character, composed] : {std::array{0u, 'e' + 0u, 0xEAu}, {1, 'O', 0xD2},
             {2, 'Y', 0xDD}, {2, 'x', 0}, {2, 0x10000 + 'a', 0}, {3, 'a', 0}, {~0u, 'a', 0}}) {
        unsigned ch = character;
        EXPECT_EQ(german.ApplyDeadKey(index, ch), composed != 0);
        EXPECT_EQ(ch, composed != 0 ? composed : character);
    }
    EXPECT_EQ(german.FindDeadKey(0xB4), 2u);
    EXPECT_EQ(german.FindDeadKey(0x100B4), GrKeyLayout::kNoDeadKey);
    EXPECT_EQ(file.layouts->back()->FindDeadKey(0xB4), GrKeyLayout::kNoDeadKey);
}

TEST(KeyLayout, FilesThatAreNotWholeAreRefused)
{
    auto const changed = [](Bytes bytes, std::size_t at, std::uint32_t word) {
        std::memcpy(bytes.data() + at, &word, sizeof(word));
        return LayoutFile(bytes).layouts.has_value();
    };
    EXPECT_TRUE(changed(kRoot, 0, 1) && changed(kRoot, 0, 0));
    EXPECT_FALSE(LayoutFile(Bytes(kRoot.begin(), kRoot.end() - 1)).layouts);

    auto const size = static_cast<std::uint32_t>(kGerman.size());
    constexpr std::size_t kCount = 2324, kOffset = 2328, kFirst = 4660, kLast = kFirst + 52 + 52;
    EXPECT_TRUE(
        changed(kGerman, kCount, 2) && changed(kGerman, kLast + 8, 11) && changed(kGerman, kCount, 0));
    for (auto const& [at, word] :
        {std::pair{0 * kCount, 4u}, {kCount, 4}, {kCount, 128}, {kOffset, size - 11}, {kOffset, size + 1},
            {kFirst, 0}, {kLast, 61}, {kFirst + 8, 11}, {kLast + 8, 0x4000000C}})
        EXPECT_FALSE(changed(kGerman, at, word)) << at << ": " << word;
}

}

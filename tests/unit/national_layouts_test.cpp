#include <support/layout_file.h>
#include <tessella/event.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <map>

#include <xkbcommon/xkbcommon-compose.h>

namespace {

/// A file of ours, the national layout in it, and what xkb-data calls that.
struct Nation {
    char const *file, *name, *layout, *variant = "";
};
constexpr Nation kNations[] = {{"", "EN", "us"}, {"cs/", "CS", "cz"}, {"de/", "DE", "de"},
    {"es_ES/", "ES", "es"}, {"fr/", "FR", "fr"}, {"it/", "IT", "it"}, {"nl/", "BE", "be"},
    {"pl/", "PL", "pl", "qwertz"}, {"pt/", "PT", "pt"}, {"pt_BR/", "PT", "pt"}, {"ru/", "RU", "ru"}};

constexpr unsigned kAny = ~0u;
constexpr unsigned kShift = GrModShift, kCaps = GrModCapsLock, kNum = GrModNumLock;

/// What a key types in the layouts of this name (in all for "") for reasons of our own.
struct Own {
    std::string_view name;
    unsigned key, modifiers, character;
};
constexpr Own kOwn[] = {
    // Keys that edit, and send no character; the pad's enter differs from the other one by its character.
    {"", 14, kAny, 0}, {"", 28, kAny, 0}, {"", 111, kAny, 0}, {"", 96, kAny, 0x13},
    // Tab is a character with shift, too. In DE it is none, nor is the pad's division.
    {"DE", 15, kAny, 0}, {"DE", 98, kAny, 0}, {"", 15, kAny, '\t'},
    // Keys of terminals and of other pads. American keyboards lack key 86, but xkb-data has it there.
    {"", 101, kAny, 0}, {"", 117, kAny, 0}, {"", 118, kAny, 0}, {"", 121, kAny, 0}, {"EN", 86, kAny, 0},
    // In EN and DE caps lock shifts some signs. It makes no capitals of sharp s and micro anywhere.
    {"EN", 26, kCaps, '{'}, {"EN", 26, kCaps | kShift, '['}, {"EN", 27, kCaps, '}'},
    {"EN", 27, kCaps | kShift, ']'}, {"DE", 27, kCaps, '*'}, {"DE", 27, kCaps | kShift, '+'},
    {"DE", 41, kCaps, 0xB0}, {"DE", 41, kCaps | kShift, '^'}, {"DE", 43, kCaps, '\''},
    {"DE", 43, kCaps | kShift, '#'}, {"DE", 12, kCaps, 0xDF}, {"BE", 43, kCaps, 0xB5},
    {"FR", 43, kCaps | kShift, 0xB5},
    // DE has EN's pad, with a point.
    {"DE", 83, kNum, '.'}};

std::map<unsigned, xkb_keysym_t> const kDeadKeys = {{0x5E, XKB_KEY_dead_circumflex},
    {0x60, XKB_KEY_dead_grave}, {0x7E, XKB_KEY_dead_tilde}, {0xA8, XKB_KEY_dead_diaeresis},
    {0xB0, XKB_KEY_dead_abovering}, {0xB4, XKB_KEY_dead_acute}, {0xB7, XKB_KEY_dead_abovedot},
    {0xB8, XKB_KEY_dead_cedilla}, {0x2C7, XKB_KEY_dead_caron}, {0x2D8, XKB_KEY_dead_breve},
    {0x2D9, XKB_KEY_dead_abovedot}, {0x2DB, XKB_KEY_dead_ogonek}, {0x2DD, XKB_KEY_dead_doubleacute}};

class NationalLayout : public testing::TestWithParam<Nation> {
protected:
    void SetUp() override
    {
        auto const& [path, name, theirName, variant] = GetParam();
        for (auto const& entry : file.layouts.value())
            if (std::ranges::equal(std::string_view(name), std::span(entry->GetName(), 2)))
                layout = entry.get();
        ASSERT_NE(layout, nullptr);
        xkb_rule_names const names{"evdev", "pc105", theirName, variant, ""};
        keymap = {
            xkb_keymap_new_from_names(context.get(), &names, XKB_KEYMAP_COMPILE_NO_FLAGS), xkb_keymap_unref};
        state = {xkb_state_new(keymap.get()), xkb_state_unref};
    }

    bool Is(std::string_view name) const { return name == GetParam().name; }
    bool IsDead(unsigned character) const
    {
        return layout->FindDeadKey(character) != GrKeyLayout::kNoDeadKey;
    }

    static unsigned Typed(GrKeyLayout const& by, unsigned key, unsigned modifiers)
    {
        unsigned short character = 0xFFFF;
        by.Translate(key, modifiers, &character);
        return character;
    }

    /// A dead key of theirs is our character for it: for the dot above, the one that the layout has.
    unsigned Character(xkb_keysym_t symbol) const
    {
        for (auto const& [character, dead] : kDeadKeys)
            if (dead == symbol && (character != 0xB7 || IsDead(character))) return character;
        return xkb_keysym_to_utf32(symbol);
    }

    unsigned Theirs(unsigned key, unsigned modifiers) const
    {
        auto const bit = [&](unsigned flag, char const* name) {
            return (modifiers & flag) != 0 ? 1u << xkb_keymap_mod_get_index(keymap.get(), name) : 0;
        };
        auto const locked = bit(kCaps, XKB_MOD_NAME_CAPS) | bit(kNum, XKB_MOD_NAME_NUM);
        auto const held = bit(kShift, XKB_MOD_NAME_SHIFT) | bit(GrModRightAlt, "Mod5");
        xkb_state_update_mask(state.get(), held, 0, locked, 0, 0, 0);
        return Character(xkb_state_key_get_one_sym(state.get(), key + 8));
    }

    LayoutFile file{ReadBytes(RESOURCES + std::string(GetParam().file) + "keyboard.kbd")};
    GrKeyLayout const* layout = nullptr;
    std::shared_ptr<xkb_context> context{xkb_context_new(XKB_CONTEXT_NO_FLAGS), xkb_context_unref};
    std::shared_ptr<xkb_keymap> keymap;
    std::shared_ptr<xkb_state> state;
};

TEST_P(NationalLayout, TypesWhatXkbTypesWithShiftAndLocks)
{
    for (unsigned key = 1; key < 128; ++key) {
        for (unsigned const modifiers : {0u, kShift, kCaps, kCaps | kShift, kNum, kNum | kShift}) {
            auto const* const own = std::ranges::find_if(kOwn, [&](Own const& entry) {
                return (entry.name.empty() || Is(entry.name)) && entry.key == key &&
                    (entry.modifiers == kAny || entry.modifiers == modifiers);
            });
            auto const expected = own != std::end(kOwn) ? own->character : Theirs(key, modifiers);
            EXPECT_EQ(Typed(*layout, key, modifiers), expected) << key << " with " << modifiers;
        }
    }
}

TEST_P(NationalLayout, TypesWithAltGrWhatXkbTypesAndMissesNoSignDeadKeyOrEuro)
{
    LayoutFile const english(ReadBytes(RESOURCES "keyboard.kbd"));
    for (unsigned key = 1; key < 128; ++key) {
        if (key >= 71 && key <= 83)
            continue;  // the pad is EN's in all layouts, and AltGr means nothing there
        for (unsigned const shift : {0u, kShift}) {
            auto const ours = Typed(*layout, key, GrModRightAlt | shift);
            auto const theirs = Theirs(key, GrModRightAlt | shift);
            // RU's AltGr is our own: it types the signs of EN that Cyrillic has displaced.
            bool const isSignOfEnglish = Is("RU") && ours == Typed(*english.layouts->front(), key, shift);
            EXPECT_TRUE(ours == 0 || ours == theirs || isSignOfEnglish) << key << ", shift " << shift;

            // DE is older than its euro, and EN has no AltGr.
            bool const isSign = (theirs > ' ' && theirs <= '~') || theirs == 0x20AC || IsDead(theirs);
            bool const needed = isSign && theirs != Theirs(key, shift) && !Is("DE") && !Is("EN");
            EXPECT_TRUE(ours == theirs || !needed) << key << ", shift " << shift;
        }
    }
}

TEST_P(NationalLayout, ComposesWhatXkbComposes)
{
    std::shared_ptr<xkb_compose_table> const table(
        xkb_compose_table_new_from_locale(context.get(), "en_US.UTF-8", XKB_COMPOSE_COMPILE_NO_FLAGS),
        xkb_compose_table_unref);
    std::shared_ptr<xkb_compose_state> const compose(
        xkb_compose_state_new(table.get(), XKB_COMPOSE_STATE_NO_FLAGS), xkb_compose_state_unref);
    for (auto const& [dead, symbol] : kDeadKeys) {
        bool hasPairs = false;
        for (unsigned character = 1; character < 0x10000; ++character) {
            unsigned composed = character;
            if (!layout->ApplyDeadKey(layout->FindDeadKey(dead), composed)) continue;
            hasPairs = true;
            xkb_compose_state_reset(compose.get());
            xkb_compose_state_feed(compose.get(), symbol);
            xkb_compose_state_feed(compose.get(), xkb_utf32_to_keysym(character));
            auto expected = xkb_keysym_to_utf32(xkb_compose_state_get_one_sym(compose.get()));
            // An old habit of these two, which programs know.
            if (dead == 0xA8 && character == 'e' && (Is("ES") || Is("FR"))) expected = 0xE4;
            EXPECT_EQ(composed, expected) << dead << " and " << character;
        }
        EXPECT_EQ(hasPairs, IsDead(dead)) << dead;
    }
}

INSTANTIATE_TEST_SUITE_P(, NationalLayout, testing::ValuesIn(kNations));

}

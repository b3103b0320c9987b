#pragma once

#include <string_view>

namespace desktop {

/// All that is to be read, by what it means.
enum class Word {
    Windows,
    Language,
    Console,
    Quit,
    Picture,
    Drawing,
    Note,
    Pointers,
    Hexagon,
    SwitchTo,
    TypeHere,
    ChordHint,
    DeadKeyWaits,
    Dusk,
    Mosaic,
    Spheres,
    Clear,
    Count
};

/// The languages that the desktop speaks, in the order of the menu.
struct Language {
    char const* code;
    std::u16string_view name;
};
constexpr Language kLanguages[] = {
    {"en", u"English"}, {"de", u"Deutsch"}, {"fr", u"Français"}, {"ru", u"Русский"}};
constexpr int kLanguageCount = 4;

/// The text of a word in the language in force.
std::u16string_view Say(Word word);
/// Which of the languages that is.
int LanguageInForce();
/// Puts a language in force, for the library's messages and resources, too. Whoever listens is told.
void SpeakLanguage(int language);
/// Has `changed` called at each change of language from now on, and once at once.
void ListenToLanguage(void (*changed)());
void IgnoreLanguage(void (*changed)());

}

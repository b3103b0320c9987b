#include "words.h"

#include <cstdlib>
#include <initializer_list>

// Of libbundle.so, which the library brings along. Documented there.
namespace BundleApi {
__attribute__((visibility("default"))) void SubscribeLanguageEvents(void (*callback)());
__attribute__((visibility("default"))) void UnsubscribeLanguageEvents(void (*callback)());
__attribute__((visibility("default"))) void SetLanguage(char const* language);
}

namespace desktop {

namespace {

constexpr std::u16string_view kTexts[kLanguageCount][static_cast<int>(Word::Count)] = {
    {u"Windows", u"Language", u"Console", u"Quit", u"Picture", u"Drawing", u"Note", u"Pointers", u"Hexagon",
        u"Switch to console ", u"Type here", u"Ctrl and Shift change the layout",
        u"A dead key waits for its letter", u"Lake at dusk", u"Mosaic", u"Spheres", u"Clear"},
    {u"Fenster", u"Sprache", u"Konsole", u"Beenden", u"Bild", u"Zeichnung", u"Notiz", u"Zeiger", u"Sechseck",
        u"Wechseln zu Konsole ", u"Hier schreiben", u"Strg und Umschalt wechseln die Belegung",
        u"Eine tote Taste wartet auf ihren Buchstaben", u"See am Abend", u"Mosaik", u"Kugeln", u"Leeren"},
    {u"Fenêtres", u"Langue", u"Console", u"Quitter", u"Image", u"Dessin", u"Note", u"Pointeurs", u"Hexagone",
        u"Passer à la console ", u"Écrivez ici", u"Ctrl et Maj changent la disposition",
        u"Une touche morte attend sa lettre", u"Lac au crépuscule", u"Mosaïque", u"Sphères", u"Effacer"},
    {u"Окна", u"Язык", u"Консоль", u"Выход", u"Картина", u"Рисунок", u"Заметка", u"Указатели",
        u"Шестиугольник", u"Перейти на консоль ", u"Пишите здесь", u"Ctrl и Shift меняют раскладку",
        u"Мёртвая клавиша ждёт букву", u"Озеро в сумерках", u"Мозаика", u"Шары", u"Очистить"}};

int FromEnvironment()
{
    for (char const* const name : {"LC_ALL", "LC_MESSAGES", "LANG"}) {
        char const* const value = std::getenv(name);
        if (!value || !*value) continue;
        for (int i = 0; i < kLanguageCount; ++i)
            if (std::string_view(value).starts_with(kLanguages[i].code)) return i;
        break;
    }
    return 0;
}

int& InForce()
{
    static int language = FromEnvironment();
    return language;
}

}

std::u16string_view Say(Word word) { return kTexts[InForce()][static_cast<int>(word)]; }

int LanguageInForce() { return InForce(); }

void SpeakLanguage(int language)
{
    InForce() = language;
    BundleApi::SetLanguage(kLanguages[language].code);
}

void ListenToLanguage(void (*changed)()) { BundleApi::SubscribeLanguageEvents(changed); }

void IgnoreLanguage(void (*changed)()) { BundleApi::UnsubscribeLanguageEvents(changed); }

}

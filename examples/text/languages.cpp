#include "languages.h"

namespace specimen {

std::span<Language const> Languages()
{
    // The first article of the Universal Declaration of Human Rights.
    static constexpr Language kLanguages[] = {
        {u"en", u"English", true,
            u"All human beings are born free and equal in dignity and rights. They are endowed with reason "
            u"and conscience and should act towards one another in a spirit of brotherhood."},
        {u"cs", u"Čeština", true,
            u"Všichni lidé rodí se svobodní a sobě rovní co do důstojnosti a práv. Jsou nadáni rozumem "
            u"a svědomím a mají spolu jednat v duchu bratrství."},
        {u"da", u"Dansk", true,
            u"Alle mennesker er født frie og lige i værdighed og rettigheder. De er udstyret med fornuft og "
            u"samvittighed, og de bør handle mod hverandre i en broderskabets ånd."},
        {u"de", u"Deutsch", true,
            u"Alle Menschen sind frei und gleich an Würde und Rechten geboren. Sie sind mit Vernunft und "
            u"Gewissen begabt und sollen einander im Geist der Brüderlichkeit begegnen."},
        {u"es_ES", u"Español", true,
            u"Todos los seres humanos nacen libres e iguales en dignidad y derechos y, dotados como están "
            u"de razón y conciencia, deben comportarse fraternalmente los unos con los otros."},
        {u"fr", u"Français", true,
            u"Tous les êtres humains naissent libres et égaux en dignité et en droits. Ils sont doués de "
            u"raison et de conscience et doivent agir les uns envers les autres dans un esprit de "
            u"fraternité."},
        {u"ko", u"한국어", false,
            u"모든 인간은 태어날 때부터 자유로우며 그 존엄과 권리에 있어 동등하다. 인간은 천부적으로 이성과 "
            u"양심을 부여받았으며 서로 형제애의 정신으로 행동하여야 한다."},
        {u"it", u"Italiano", true,
            u"Tutti gli esseri umani nascono liberi ed eguali in dignità e diritti. Essi sono dotati di "
            u"ragione e di coscienza e devono agire gli uni verso gli altri in spirito di fratellanza."},
        {u"hu", u"Magyar", true,
            u"Minden emberi lény szabadon születik és egyenlő méltósága és joga van. Az emberek, ésszel és "
            u"lelkiismerettel bírván, egymással szemben testvéri szellemben kell hogy viseltessenek."},
        {u"nl", u"Nederlands", true,
            u"Alle mensen worden vrij en gelijk in waardigheid en rechten geboren. Zij zijn begiftigd met "
            u"verstand en geweten, en behoren zich jegens elkander in een geest van broederschap te "
            u"gedragen."},
        {u"ja", u"日本語", false,
            u"すべての人間は、生まれながらにして自由であり、かつ、尊厳と権利とについて平等である。人間は、"
            u"理性と良心とを授けられており、互いに同胞の精神をもって行動しなければならない。"},
        {u"pl", u"Polski", true,
            u"Wszyscy ludzie rodzą się wolni i równi pod względem swej godności i swych praw. Są oni "
            u"obdarzeni rozumem i sumieniem i powinni postępować wobec innych w duchu braterstwa."},
        {u"pt", u"Português", true,
            u"Todos os seres humanos nascem livres e iguais em dignidade e em direitos. Dotados de razão "
            u"e de consciência, devem agir uns para com os outros em espírito de fraternidade."},
        {u"pt_BR", u"Português do Brasil", true,
            u"Todas as pessoas nascem livres e iguais em dignidade e direitos. São dotadas de razão e "
            u"consciência e devem agir em relação umas às outras com espírito de fraternidade."},
        {u"ru", u"Русский", true,
            u"Все люди рождаются свободными и равными в своём достоинстве и правах. Они наделены разумом "
            u"и совестью и должны поступать в отношении друг друга в духе братства."},
        {u"tr", u"Türkçe", true,
            u"Bütün insanlar hür, haysiyet ve haklar bakımından eşit doğarlar. Akıl ve vicdana sahiptirler "
            u"ve birbirlerine karşı kardeşlik zihniyeti ile hareket etmelidirler."},
        {u"zh", u"简体中文", false,
            u"人人生而自由，在尊严和权利上一律平等。他们赋有理性和良心，并应以兄弟关系的精神相对待。"},
        {u"zh_TW", u"繁體中文", false,
            u"人人生而自由，在尊嚴和權利上一律平等。他們賦有理性和良心，並應以兄弟關係的精神相對待。"}};
    return kLanguages;
}

}

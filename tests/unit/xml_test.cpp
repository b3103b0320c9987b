#include <common/utf8.h>
#include <support/seed.h>
#include <support/xml_document.h>
#include <xml/strict_utf8.h>

#include <gtest/gtest.h>
#include <numeric>

using namespace std::string_literals;

namespace {

std::string Plain(std::u16string const& text)
{
    std::string out;
    for (char16_t const c : text)
        out += c < 0x7F ? std::string(1, static_cast<char>(c)) : '#' + std::to_string(c);
    return out;
}

/// The tree, as far as it is not too deep to be looked at.
std::string Describe(xml_parser::tag const& element, int depth = 0)
{
    std::string out = element.Name + '(';
    for (auto const& [name, value] : element.Attributes)
        out += name + '=' + Plain(value) + '|';
    for (std::size_t i = 0; i < element.Text.size() && depth < 9; ++i) {
        out += '|' + Plain(element.Text[i]);
        if (i == element.Children.size()) return out + ')';
        auto const& child = *element.Children[i];
        out += child.Parent == &element ? Describe(child, depth + 1) : "lost";
    }
    return out;
}

/// The result, where it ended, and the tree.
using Parsed = std::tuple<bool, unsigned, unsigned, std::string>;

Parsed Parse(std::string const& bytes, unsigned most = 0, bool fails = false)
{
    XmlFile file(bytes, most, fails);
    auto* root = new xml_parser::tag("old");
    unsigned line, column;
    bool const good = xml_parser::Parse(&root, &file, line, column);
    std::unique_ptr<xml_parser::tag> const owner(root);
    return {good, line, column, root ? Describe(*root) : "none"};
}

Parsed EndOf(std::string const& text, bool good, std::string tree)
{
    unsigned column = 0;
    for (char const c : text.substr(text.rfind('\n') + 1))
        column = c == '\t' ? (column / 8 + 1) * 8 : column + 1;
    return {good, 1 + std::count(text.begin(), text.end(), '\n'), column + 1, std::move(tree)};
}

}

TEST(Xml, RandomTextsAndTheFirstByteThatMustNotBeThere)
{
    unsigned seed = NewSeed();
    for (unsigned i = 0; i < 1000; ++i, ++seed) {
        XmlDocument document(seed);
        auto const upTo = [&tokens = document.tokens](std::size_t count) {
            return std::accumulate(tokens.begin(), tokens.begin() + static_cast<std::ptrdiff_t>(count), ""s);
        };
        std::string const text = upTo(document.tokens.size()), tree = Describe(document.root);
        SCOPED_TRACE("seed " + std::to_string(seed) + ":\n" + text);
        unsigned const most = i % 1500;
        ASSERT_EQ(Parse(text, most), EndOf(text, true, tree));
        ASSERT_FALSE(std::get<bool>(Parse(text, most, true)));

        std::string const before = upTo(document.random() % (document.tokens.size() + 1));
        Parsed damaged = Parse(before + '\1' + text.substr(before.size()), most);
        std::get<std::string>(damaged) = tree;
        ASSERT_EQ(damaged, EndOf(before, false, tree)) << before;
    }
}

TEST(Xml, OddTexts)
{
    std::pair<std::string, Parsed> const cases[] = {{"", {false, 1, 1, "none"}},
        {"BXM<x/>", {false, 1, 1, "none"}}, {"\xEF\xBB\xBF\x42XML\2\0\0"s, {false, 1, 4, "none"}},
        {"<x a='1' a='2'/>", {false, 1, 10, "x(a=1||)"}},
        {"<x>a <y>\xC3\xA4&bad;", {false, 1, 11, "x(|a y(|#228)|)"}},
        {"<x a='<'/>", {false, 1, 7, "x(a=||)"}}, {"<x></y>", {false, 1, 4, "x(|)"}},
        {"<x></x/>", {false, 1, 7, "x(|)"}}, {"<x></x> <x/>", {false, 1, 9, "x(|)"}},
        {"<x>\xC3\xA4\xEF\xBF\xBF</x>", {false, 1, 6, "x(|)"}},
        {"<x>&#0;&#1114111;&#1114112;</x>", {false, 1, 18, "x(|\0#56319#57343)"s}},
        {"<x>&#99999999999999999999;</x>", {false, 1, 4, "x(|)"}},
        // It counts as the end where only more bytes are missing.
        {"<x/>\0"s, {false, 1, 5, "x(|)"}}, {"<x/><!-- \n\0"s, {true, 2, 2, "x(|)"}},
        {"<x/>&#", {true, 1, 5, "x(|)"}}, {"<x/>&#;", {false, 1, 5, "x(|)"}},
        {"<x/><![CDATA", {true, 1, 5, "x(|)"}}, {"<x/>\xC3", {false, 1, 5, "x(|)"}}};
    for (auto const& [text, parsed] : cases)
        EXPECT_EQ(Parse(text), parsed) << text;
}

TEST(Xml, OnlyCharactersInTheirShortestForm)
{
    char const second[] = "\x7F\x80\x8F\x90\x9F\xA0\xBF\xC0", third[] = "\x7F\x80\xBE\xBF\xC0";
    for (unsigned i = ' ' * 200; i < 256 * 200; ++i) {
        std::string const bytes = {
            static_cast<char>(i / 200), second[i / 25 % 8], third[i / 5 % 5], third[i % 5]};
        std::u16string text, expected;
        std::size_t size = 4;
        while (!Common::DecodeUtf8(expected, bytes.data(), size) ||
            expected.find_first_of(u"\xFFFE\xFFFF") != expected.npos ||
            (bytes[0] == '\xED' && bytes[1] >= '\xA0' && size > 2))
            --size;
        ASSERT_EQ(DecodeStrictUtf8(text, bytes), size) << std::hex << i / 200 << ' ' << i % 200;
        ASSERT_EQ(text, expected);
    }
}

TEST(Xml, BinaryFilesAreWholeOrRefused)
{
    // More bits than 32 are lost, which makes a name of number 0. The first of two values stays.
    std::string const old = "BXML\1\7\x80\x80\x80\x80\x70\1x\2\1\1a\1\x31\1\1\x32\2\2\xC3\xA4\0\0\1\1y\1z"s;
    std::string const recent = "BXML\2\7\1\1x\2\1a\2\x31\2\2\x32\0\4\xC3\xA4\1\0\3r\0\2z\0"s;
    EXPECT_EQ(Parse(old), Parsed(true, 1, 1, "x(a=1||#228x(|y)|z)"));
    EXPECT_EQ(Parse(recent), Parsed(true, 1, 1, "x(a=1||#228x(|)|z)"));
    for (std::string const& whole : {old, recent})
        for (std::size_t size = 4; size < whole.size(); ++size)
            EXPECT_FALSE(std::get<bool>(Parse(whole.substr(0, size)))) << size;
    EXPECT_EQ(Parse("BXML\2\7\0behind the end"s), Parsed(true, 1, 1, "none"));
    EXPECT_EQ(Parse("BXML\3\7\1\1x\0\1\0"s), Parsed(false, 1, 1, "none"));
    EXPECT_EQ(Parse("BXML\2\7\1\1x\0\xFE\xFF\xFF\xFF\x0Fz"s), Parsed(false, 1, 1, "x(|z)"));

    testing::internal::CaptureStderr();
    EXPECT_EQ(Parse("BXML\1\0\1\1x\0\0"s), Parsed(true, 1, 1, "x(|)"));
    EXPECT_FALSE(std::get<bool>(Parse("BXML\1\0\1\1x\0"s)));
    EXPECT_EQ(Parse("BXML\2\0\1\1x\2\1a\3z\0\0\0"s), Parsed(true, 1, 1, "x(a=z||)"));
    std::string const words = testing::internal::GetCapturedStderr();
    std::string const noText = "textCount, file " TESSELLA_BUILD_FOLDER "xml/simple_reader.cpp, line 142";
    EXPECT_NE(words.find(noText), words.rfind(noText));
    EXPECT_NE(
        words.find("(textLength & 1) == 0, file " TESSELLA_BUILD_FOLDER "xml/simple_reader.cpp, line 201"),
        words.npos);
}

TEST(Xml, ElementsMayBeNestedDeeperThanTheStack)
{
    for (auto [text, nested] :
        {std::pair{""s, "<x>"s}, {"BXML\1\0\1\1x\0\2\0"s, "\1\0\2\0"s}, {"BXML\2\0\1\1x\0\0"s, "\1\0\0"s}}) {
        for (int i = 0; i < 100000; ++i)
            text += nested;
        EXPECT_FALSE(std::get<bool>(Parse(text)));
    }
}

#pragma once

#include <file/file.h>
#include <xml/parser.h>

#include <algorithm>
#include <random>

/// A file in memory that may come in pieces of random sizes up to `most`, and may fail at its end.
struct XmlFile final : i_file {
    explicit XmlFile(std::string text, unsigned mostBytes = 0, bool failing = false)
        : bytes(std::move(text)), most(mostBytes), fails(failing)
    {}
    void Read(void* buffer, std::uint64_t size, std::uint64_t& count) override
    {
        if (most != 0) size = std::min<std::uint64_t>(size, 1 + random() % most);
        at += count = bytes.copy(static_cast<char*>(buffer), size, at);
        if (count == 0 && fails && !error) error = Common::Error(Common::ErrorReadFailed, {});
    }
    std::string const bytes;
    unsigned const most;
    bool const fails;
    std::size_t at = 0;
    std::minstd_rand random;
};

/// A random document that knows its tree: whitespace leaves marks, which are dealt with at a text's end.
class XmlDocument {
public:
    explicit XmlDocument(unsigned seed) : random(seed)
    {
        Put({Choose({"", "\xEF\xBB\xBF", "<?xml?>"}), Gap()});
        Element(root, 0);
        Put({Gap(), Choose({"", "<!-- \n -->"})});
    }

    xml_parser::tag root{"root"};
    std::vector<std::string> tokens;  ///< a byte that must not be there is found between any two of them
    std::mt19937 random;

private:
    static constexpr char16_t kSpace = 0xE000, kNothing = 0xE001;

    void Put(std::vector<std::string> const& all) { tokens.insert(tokens.end(), all.begin(), all.end()); }
    std::string Choose(std::initializer_list<char const*> all) { return all.begin()[random() % all.size()]; }
    std::string Gap() { return Choose({"", " ", "\t", "\n", " \r\n"}); }

    enum Where { InCData = 5, InValue = 18, InContent = 21 };
    void Pieces(std::u16string& text, Where where)
    {
        static std::pair<std::string, std::u16string> const kPieces[InContent] = {{"\t\n ", u"\t\n "},
            {"\r", u""}, {"]]", u"]]"}, {"<&", u"<&"}, {"\xF4\x8F\xBF\xBD", u"\xDBFF\xDFFD"}, {" ", {kSpace}},
            {"\r\n\t", {kSpace}}, {"\n", {kSpace}}, {"&amp;", u"&"}, {"&lt;", u"<"}, {"&gt;", u">"},
            {"&apos;", u"'"}, {"&quot;", u"\""}, {"&#032;", u" "}, {"&#x1f60A;", u"\xD83D\xDE0A"},
            {"\xC3\xA4=/>", u"\u00E4=/>"}, {"]]>\x7F", u"]]>\x7F"},
            {std::string(700, 'n'), std::u16string(700, u'n')}, {"<!-->\t-->", u""}, {"<?b\n?>", u""},
            {"<![CDATA[", {kNothing}}};
        for (unsigned left = random() % 6, first = where == InCData ? 0 : InCData; left > 0; --left) {
            auto const& [bytes, meaning] = kPieces[first + random() % (where - first)];
            Put({bytes});
            text += meaning;
            if (meaning[0] != kNothing) continue;
            Pieces(text, InCData);
            Put({"]]>"});
        }
    }

    static void Settle(std::u16string& text, bool dropFirst, bool dropLast)
    {
        for (std::size_t two; (two = text.find(std::u16string(2, kSpace))) != text.npos;)
            text.erase(two, 1);
        if (dropFirst && text.starts_with(kSpace)) text.erase(0, 1);
        if (dropLast && text.ends_with(kSpace)) text.pop_back();
        std::erase(text, kNothing);
        std::replace(text.begin(), text.end(), kSpace, u' ');
    }

    void Element(xml_parser::tag& element, unsigned depth)
    {
        Put({'<' + element.Name});
        for (char const* const name : {"b", ":-.9"}) {
            if (random() % 3 > 0) continue;
            std::string const quote = Choose({"'", "\""});
            Put({" ", name, Gap(), Choose({"=", "= \t\r\n"}) + quote});
            Pieces(element.Attributes[name], InValue);
            Settle(element.Attributes[name], true, true);
            Put({quote});
        }
        if (random() % 4 == 0) return Put({Gap(), "/>"});
        Put({Gap(), ">"});
        Pieces(element.Text.back(), InContent);
        for (unsigned left = random() % 4; left > 0 && depth < 5; --left) {
            Settle(element.Text.back(), element.Children.empty(), false);
            Element(element.AddChild(Choose({"a", "_", "Font"})), depth + 1);
            Pieces(element.Text.back(), InContent);
        }
        Settle(element.Text.back(), element.Children.empty(), true);
        Put({"</" + element.Name, Gap(), ">"});
    }
};

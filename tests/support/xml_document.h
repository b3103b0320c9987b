#pragma once

#include <xml/tag.h>

#include <algorithm>
#include <filesystem>
#include <random>

/// A random document that knows its tree: whitespace leaves marks, which are dealt with where a text is
/// complete.
class XmlDocument {
public:
    explicit XmlDocument(unsigned seed) : random(seed)
    {
        Put(Choose({"", "\xEF\xBB\xBF", "<?xml?>"}));
        Gap();
        Element(root, 0);
        Gap();
        Put(Choose({"", "<!-- \n -->"}));
    }

    xml_parser::tag root{"root"};
    std::vector<std::string> tokens;  ///< a byte that must not be there is found between any two of them
    std::mt19937 random;

private:
    static constexpr char16_t kSpace = 0xE000, kNothing = 0xE001;

    void Put(std::string token) { tokens.push_back(std::move(token)); }
    std::string Choose(std::initializer_list<char const*> all) { return all.begin()[random() % all.size()]; }
    void Gap() { Put(Choose({"", " ", "\t", "\n", " \r\n"})); }

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
            Put(bytes);
            text += meaning;
            if (meaning[0] != kNothing) continue;
            Pieces(text, InCData);
            Put("]]>");
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
        Put('<' + element.Name);
        for (char const* const name : {"b", ":-.9"}) {
            if (random() % 3 > 0) continue;
            std::string const quote = Choose({"'", "\""});
            for (auto const& token :
                {std::string(" "), std::string(name), Choose({"", "\n"}), Choose({"=", "= \t\r\n"}) + quote})
                Put(token);
            Pieces(element.Attributes[name], InValue);
            Settle(element.Attributes[name], true, true);
            Put(quote);
        }
        Gap();
        if (random() % 4 == 0) return Put("/>");
        Put(">");
        Pieces(element.Text.back(), InContent);
        for (unsigned left = random() % 4; left > 0 && depth < 5; --left) {
            Settle(element.Text.back(), element.Children.empty(), false);
            Element(element.AddChild(Choose({"a", "_", "Font"})), depth + 1);
            Pieces(element.Text.back(), InContent);
        }
        Settle(element.Text.back(), element.Children.empty(), true);
        Put("</" + element.Name);
        Gap();
        Put(">");
    }
};

/// A tree in one of the binary forms.
class BinaryXml {
public:
    BinaryXml(xml_parser::tag const& root, bool newForm)
        : bytes(newForm ? "BXML\2z" : "BXML\1z"), isNew(newForm)
    {
        Element(root);
    }
    std::string bytes;

private:
    void Number(std::size_t number)
    {
        for (; number > 0x7F; number >>= 7)
            bytes += static_cast<char>(number | 0x80);
        bytes += static_cast<char>(number);
    }
    void Text(std::u16string const& text)
    {
        std::string const utf8 = std::filesystem::path(text).string();
        Number(utf8.size() << isNew);
        bytes += utf8;
    }
    void Name(std::string const& name)
    {
        auto const [entry, isFirst] = ids.try_emplace(name, 100 * ids.size() + isNew);
        Number(entry->second);
        if (!isFirst) return;
        Number(name.size());
        bytes += name;
    }
    void Element(xml_parser::tag const& element)
    {
        Name(element.Name);
        if (!isNew) Number(element.Attributes.size());
        for (auto const& [name, value] : element.Attributes) {
            Name(name);
            Text(value);
        }
        Number(isNew ? 0 : element.Text.size());
        for (std::size_t i = 0; i < element.Text.size(); ++i) {
            Text(element.Text[i]);
            if (i < element.Children.size()) Element(*element.Children[i]);
        }
        if (isNew) Number(0);
    }

    bool const isNew;
    std::map<std::string, std::size_t> ids;
};

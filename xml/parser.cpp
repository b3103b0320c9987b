#include <xml/parser.h>

#include <file/file.h>
#include <xml/binary.h>
#include <xml/scanner.h>
#include <xml/simple_reader.h>

#include <utility>

using Token = xml_scanner::Token;
using xml_parser::tag;

namespace {

/// From its name on, to behind its value.
bool ParseAttribute(xml_scanner& scanner, tag& element)
{
    auto const [attribute, isNew] = element.Attributes.try_emplace(scanner.name);
    if (!isNew) return false;
    scanner.Next();
    if (scanner.token != Token::Equals) return false;
    for (scanner.Next(); scanner.token == Token::Text; scanner.Next())
        attribute->second += scanner.text;
    return true;
}

bool ParseEndTag(xml_scanner& scanner, tag const& element)
{
    if (scanner.name != element.Name) return false;
    scanner.Next();
    return scanner.token == Token::TagEnd;
}

/// From behind the root's name to behind its end. The scanner sees to it that what belongs into a tag is not
/// found outside of one. Without recursion, as elements may be nested deeper than the stack reaches.
bool ParseElement(xml_scanner& scanner, tag& root)
{
    for (tag* open = &root; open != nullptr;) {
        switch (scanner.token) {
        case Token::Attribute:
            if (!ParseAttribute(scanner, *open)) return false;
            continue;
        case Token::TagEnd: break;
        case Token::Text: open->Text.back() += scanner.text; break;
        case Token::StartTag: open = &open->AddChild(scanner.name); break;
        case Token::EndTag:
            if (!ParseEndTag(scanner, *open)) return false;
            [[fallthrough]];
        case Token::EmptyEnd: open = open->Parent; break;
        default: return false;
        }
        scanner.Next();
    }
    return true;
}

bool ParseDocument(xml_scanner& scanner, tag*& root, i_file& file)
{
    if (scanner.token == Token::Magic) {
        binary_reader reader(root);
        return DecodeBinaryXml(file, reader);
    }
    if (scanner.token != Token::StartTag) return false;
    root = new tag(scanner.name);
    scanner.Next();
    return ParseElement(scanner, *root) && scanner.token == Token::End && !file.error;
}

}

bool xml_parser::Parse(tag** root, i_file* file, unsigned& line, unsigned& column)
{
    delete std::exchange(*root, nullptr);
    xml_scanner scanner(*file);
    bool const good = ParseDocument(scanner, *root, *file);
    line = scanner.line;
    column = scanner.column + 1;
    return good;
}

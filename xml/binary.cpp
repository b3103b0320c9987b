#include <xml/binary.h>

#include <common/assert.h>

static constexpr char kSource[] = GR_SOURCE("xml/binary");

void binary_reader::StartDocument() { tagStack.clear(); }

void binary_reader::EndDocument() { GR_ASSERT_LINE(tagStack.empty(), "!tagStack.size()", 298); }

void binary_reader::StartElement(std::string const& name)
{
    if (tagStack.empty()) {
        delete root;
        root = new xml_parser::tag(name);
        tagStack.push_back(root);
    } else {
        tagStack.push_back(&tagStack.back()->AddChild(name));
    }
}

void binary_reader::EndElement()
{
    if (!tagStack.empty()) tagStack.pop_back();
}

void binary_reader::Attribute(std::string const& name, std::u16string const& value)
{
    if (!GR_ASSERT_LINE(!tagStack.empty(), "tagStack.size()", 317)) return;
    tagStack.back()->Attributes.try_emplace(name, value);
}

void binary_reader::Text(std::u16string const& value)
{
    if (!GR_ASSERT_LINE(!tagStack.empty(), "tagStack.size()", 323)) return;
    if (!GR_ASSERT_LINE(!tagStack.back()->Text.empty(), "tagStack.back()->Text.size()", 324)) return;
    tagStack.back()->Text.back() = value;
}

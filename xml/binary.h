#pragma once

#include <xml/simple_reader.h>
#include <xml/tag.h>

#include <vector>

/// Makes a tree of what a decoder tells. The tree belongs to whoever owns `treeRoot`.
class binary_reader final : public xml_reader_interface {
public:
    explicit binary_reader(xml_parser::tag*& treeRoot) : root(treeRoot) {}

    void StartDocument() override;
    void EndDocument() override;
    void StartElement(std::string const& name) override;
    void EndElement() override;
    void Attribute(std::string const& name, std::u16string const& value) override;
    void Text(std::u16string const& value) override;

private:
    xml_parser::tag*& root;
    std::vector<xml_parser::tag*> tagStack;  // those that are open, from the root on
};

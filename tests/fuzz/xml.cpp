// Any bytes behind XML_HEAD, which tells the form of the file, make a tree with all its texts.
#include <support/xml_document.h>

#include <cstdlib>

extern "C" int LLVMFuzzerTestOneInput(unsigned char const* data, std::size_t size)
{
    setenv("VELLUM_SAFE_ASSERT", "none", 1);
    XmlFile file(XML_HEAD + std::string(data, data + size), size % 8);
    xml_parser::tag* root = nullptr;
    unsigned line, column;
    xml_parser::Parse(&root, &file, line, column);
    std::unique_ptr<xml_parser::tag> const owner(root);
    if (line == 0 || column == 0) __builtin_trap();
    for (auto const* tag = root; tag != nullptr;
         tag = tag->Children.empty() ? nullptr : tag->Children[0].get())
        if (tag->Text.size() != tag->Children.size() + 1) __builtin_trap();
    return 0;
}

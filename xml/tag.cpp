#include <xml/tag.h>

// One after another, as elements may be nested deeper than the stack reaches.
xml_parser::tag::~tag()
{
    auto doomed = std::move(Children);
    while (!doomed.empty()) {
        std::unique_ptr<tag> const last = std::move(doomed.back());
        doomed.pop_back();
        for (auto& child : last->Children)
            doomed.push_back(std::move(child));
        last->Children.clear();
    }
}

xml_parser::tag& xml_parser::tag::AddChild(std::string name)
{
    tag& child = *Children.emplace_back(std::make_unique<tag>(std::move(name)));
    child.Parent = this;
    Text.emplace_back();
    return child;
}

#pragma once

#include <map>
#include <memory>
#include <string>
#include <vector>

namespace xml_parser {

/// One element, with what is inside it.
class tag {
public:
    explicit tag(std::string name) : Name(std::move(name)) {}
    tag(tag const&) = delete;
    tag& operator=(tag const&) = delete;
    ~tag();

    /// Adds an element behind all that is inside this one. It stays this one's.
    tag& AddChild(std::string name);

    std::string Name;
    std::map<std::string, std::u16string> Attributes;
    std::vector<std::unique_ptr<tag>> Children;
    /// One more than children: each child has the text before it, and the last text stands behind them all.
    std::vector<std::u16string> Text{1};
    tag* Parent = nullptr;  ///< null at the root
};

}

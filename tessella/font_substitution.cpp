#include <tessella/font_substitution.h>

#include <common/assert.h>
#include <file/file.h>
#include <tessella/font_file.h>
#include <xml/parser.h>

#include <cstdio>
#include <cstdlib>
#include <new>
#include <optional>
#include <span>

using xml_parser::tag;

static constexpr char kSource[] = GR_SOURCE("tessella/font");

namespace {

constexpr std::uint32_t kRegular = 400, kBold = 700;
constexpr std::uint32_t kFirstBold = 601;  // of those that requests have

std::unique_ptr<tag> fontTable;  // null if there is none

/// Unit by unit.
std::string Narrow(std::u16string const& wide)
{
    std::string narrow;
    for (char16_t const unit : wide)
        narrow += static_cast<char>(unit);
    return narrow;
}

/// Empty if there is none.
std::string AttributeOf(tag const& element, char const* name)
{
    auto const found = element.Attributes.find(name);
    return found != element.Attributes.end() ? Narrow(found->second) : std::string();
}

tag const* FirstChild(tag const& parent, std::string_view name)
{
    for (auto const& child : parent.Children) {
        if (child->Name == name) return child.get();
    }
    return nullptr;
}

void ApplyAttribute(GrFontDesc& resolved, std::string_view name, std::u16string const& value)
{
    if (name == "face") resolved.face = Narrow(value);
    if (name == "file") resolved.file = Narrow(value);
    if (name == "metrics") resolved.metrics = Narrow(value);
    if (name == "size")
        resolved.size = static_cast<std::int32_t>(std::strtol(Narrow(value).c_str(), nullptr, 10));
    if (name == "weight") resolved.weight = value == u"bold" ? kBold : kRegular;
    if (name == "type" && value == u"ft") resolved.type = GrFontTypeFreeType;
    if (name == "type" && value == u"cgf") resolved.type = GrFontTypeCgf;
}

/// Null if nothing is chosen.
tag const* ChooseCase(tag const& choice, GrFontDesc const& request)
{
    std::string const by = AttributeOf(choice, "by");
    std::optional<std::string> wanted;  // nothing, which no case has, if it is not known what to choose by
    if (by == "size") wanted = std::to_string(request.size);
    if (by == "weight") wanted = request.weight < kFirstBold ? "regular" : "bold";
    for (auto const& child : choice.Children) {
        if (child->Name == "default" || wanted == AttributeOf(*child, "value")) return child.get();
    }
    return nullptr;
}

/// Fonts lie inside fonts, maybe deeper than the stack reaches. `request` may be the same as `resolved`:
/// choices then see what has been set so far.
void ApplyFont(GrFontDesc& resolved, tag const& outermost, GrFontDesc const& request)
{
    std::vector<std::span<std::unique_ptr<tag> const>>
        rest;  // of each open font, the children not looked at yet
    auto const open = [&](tag const& font) {
        if (!GR_ASSERT_LINE(font.Name == "font", "tag->Name==\"font\"", 103)) return;
        for (auto const& [name, value] : font.Attributes)
            ApplyAttribute(resolved, name, value);
        rest.emplace_back(font.Children);
    };
    open(outermost);
    while (!rest.empty()) {
        auto& children = rest.back();
        if (children.empty()) {
            rest.pop_back();
            continue;
        }
        tag const& child = *children.front();
        children = children.subspan(1);
        tag const* const chosen = child.Name == "switch" ? ChooseCase(child, request) : nullptr;
        tag const* const font = chosen ? FirstChild(*chosen, "font") : nullptr;
        if (font) open(*font);
    }
}

/// Null if there is none for this face.
tag const* FindRule(std::string const& face)
{
    tag const* const rules = FirstChild(*fontTable, "substitute");
    if (!rules) return nullptr;
    for (auto const& rule : rules->Children) {
        if (rule->Name != "font") continue;
        std::string const itsFace = AttributeOf(*rule, "face");
        if (itsFace.empty() || itsFace == face) return rule.get();
    }
    return nullptr;
}

/// Null if there is none for this face.
tag const* FindEntry(std::string const& face)
{
    for (auto const& entry : fontTable->Children) {
        if (entry->Name == "font" && AttributeOf(*entry, "face") == face) return entry.get();
    }
    return nullptr;
}

}

void ReadFontTable()
{
    fontTable.reset();
    auto const file = OpenFontFile("fonts.xml");
    if (!file) return;
    tag* root = nullptr;
    unsigned line = 0, column = 0;
    bool good = false;
    try {
        good = xml_parser::Parse(&root, file.get(), line, column);
    } catch (std::bad_alloc const&) {
        // What has been read counts, as it does of a table that is not whole.
    }
    fontTable.reset(root);
    if (!good)
        std::fprintf(stderr, "TESSELLA: filed to parse substitutes line:%d column:%d\n",
            static_cast<int>(line), static_cast<int>(column));
}

bool HasFontTable() { return fontTable != nullptr; }

bool ResolveFace(GrFontDesc& resolved, GrFontDesc const& request)
{
    tag const* const rule = fontTable ? FindRule(request.face) : nullptr;
    if (rule) ApplyFont(resolved, *rule, request);
    tag const* const entry = fontTable ? FindEntry(resolved.face) : nullptr;
    if (entry)
        ApplyFont(resolved, *entry, resolved);
    else
        std::fprintf(stderr, "TESSELLA: Warning! Face \"%s\" is not found\r\n", resolved.face.c_str());
    return entry != nullptr;
}

void ReleaseFontTable() { fontTable.reset(); }

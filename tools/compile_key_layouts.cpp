// compile_key_layouts: makes a file keyboard.kbd of the texts that describe its layouts.

#include <tools/layout_binary.h>
#include <tools/output_file.h>

#include <cstdio>
#include <limits>
#include <string_view>

namespace {

constexpr int kFailed = 1;
constexpr int kWrongUsage = 2;

constexpr char kHelp[] = R"(Usage: compile_key_layouts --output FILE LAYOUT...
       compile_key_layouts --help | --version

Compiles texts that describe key layouts into one binary file, as the archive has it for each language. The
first layout is the one that is active at the start; there may be 65535. What the texts look like stands in
docs/key-layouts.md.

The exit status is 0, 1 if a text is wrong or a file cannot be read or written, 2 for wrong usage.
)";

int Complain(std::string const& problem, int status)
{
    std::fprintf(stderr, "compile_key_layouts: %s\n", problem.c_str());
    return status;
}

int WrongUsage(std::string const& problem) { return Complain(problem + " (--help tells more)", kWrongUsage); }

int Compile(std::string const& output, std::span<char const*> texts)
{
    std::vector<tools::Layout> layouts;
    for (char const* const text : texts)
        layouts.push_back(tools::ReadLayout(text));
    tools::WriteFile(output, tools::MakeLayoutFile(layouts));
    return 0;
}

int Follow(std::span<char*> words)
{
    std::string output;
    std::vector<char const*> texts;
    while (!words.empty()) {
        char const* const text = words.front();
        std::string_view const word = text;
        words = words.subspan(1);
        if (word == "--help" || word == "--version") {
            std::fputs(word == "--help" ? kHelp : "compile_key_layouts " TESSELLA_VERSION "\n", stdout);
            return 0;
        }
        if (word == "--output") {
            if (words.empty()) return WrongUsage("--output needs the name of a file");
            output = words.front();
            words = words.subspan(1);
        } else if (word.starts_with("-")) {
            return WrongUsage("unknown option '" + std::string(word) + "'");
        } else {
            texts.push_back(text);
        }
    }
    if (output.empty()) return WrongUsage("--output is missing");
    if (texts.empty()) return WrongUsage("no layout is given");
    if (texts.size() > std::numeric_limits<std::uint16_t>::max()) return WrongUsage("too many layouts");
    return Compile(output, texts);
}

}

int main(int count, char** words)
{
    try {
        return Follow({words + 1, static_cast<std::size_t>(count - 1)});
    } catch (tools::LayoutError const& error) {
        std::fprintf(stderr, "%s\n", error.what());  // begins with the file, as compilers' messages do
        return kFailed;
    } catch (std::exception const& error) {
        return Complain(error.what(), kFailed);
    }
}

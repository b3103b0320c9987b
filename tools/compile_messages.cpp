// compile_messages: makes a file tessella.msg of a language's translations.

#include <tools/message_catalogue.h>
#include <tools/output_file.h>

#include <cstdio>
#include <exception>
#include <span>
#include <string_view>

/// The parser never frees contexts, of which the address sanitizer would complain.
// NOLINTNEXTLINE(bugprone-reserved-identifier): the sanitizer's name
extern "C" __attribute__((visibility("default"))) char const* __lsan_default_suppressions()
{
    return "leak:libgettextpo\n";
}

namespace {

constexpr int kFailed = 1;
constexpr int kWrongUsage = 2;

constexpr char kHelp[] = R"(Usage: compile_messages --output FILE TRANSLATIONS
       compile_messages --help | --version

Compiles a language's translations, a PO file in UTF-8, into the binary catalogue that the archive has for
that language. The context of each entry is the key of its message, the original is the English text. All
messages must be translated.

The exit status is 0, 1 if the translations are wrong or a file cannot be read or written, 2 for wrong usage.
)";

int Complain(std::string const& problem, int status)
{
    std::fprintf(stderr, "compile_messages: %s\n", problem.c_str());
    return status;
}

int WrongUsage(std::string const& problem) { return Complain(problem + " (--help tells more)", kWrongUsage); }

int Follow(std::span<char*> words)
{
    std::string output;
    std::string translations;
    while (!words.empty()) {
        std::string const word = words.front();
        words = words.subspan(1);
        if (word == "--help" || word == "--version") {
            std::fputs(word == "--help" ? kHelp : "compile_messages " TESSELLA_VERSION "\n", stdout);
            return 0;
        }
        if (word == "--output") {
            if (words.empty()) return WrongUsage("--output needs the name of a file");
            output = words.front();
            words = words.subspan(1);
        } else if (word.starts_with("-")) {
            return WrongUsage("unknown option '" + word + "'");
        } else if (!translations.empty()) {
            return WrongUsage("a catalogue has one language: '" + word + "' is one file too many");
        } else {
            translations = word;
        }
    }
    if (output.empty()) return WrongUsage("--output is missing");
    if (translations.empty()) return WrongUsage("no translations are given");
    tools::WriteFile(output, tools::MakeCatalogue(tools::ReadTranslations(translations)));
    return 0;
}

}

int main(int count, char** words)
{
    try {
        return Follow({words + 1, static_cast<std::size_t>(count - 1)});
    } catch (tools::MessageError const& error) {
        std::fprintf(stderr, "%s\n", error.what());  // begins with the file, as compilers' messages do
        return kFailed;
    } catch (std::exception const& error) {
        return Complain(error.what(), kFailed);
    }
}

// tessella-cgf: lists, checks and shows what is in a file of bitmap glyphs.

#include <tools/cgf_font.h>
#include <tools/cgf_inspect.h>
#include <tools/cgf_picture.h>

#include <common/utf8.h>

#include <charconv>
#include <cstdio>
#include <fstream>
#include <span>
#include <stdexcept>
#include <variant>

namespace {

constexpr int kFailed = 1;
constexpr int kWrongUsage = 2;

constexpr char kHelp[] = R"(Usage: tessella-cgf list FILE
  or:  tessella-cgf check FILE
  or:  tessella-cgf render [OPTION]... FILE PICTURE.png
  or:  tessella-cgf --help | --version

Tells about a file of bitmap glyphs, as the library's built-in font glyphset.cgf is one.

  list          tells of the file and of each of its fonts and sets of glyphs, in the order of the file
  check         tells what is wrong with the file
  render        paints glyphs: what the options --text and --set say, one below the other

Options of render:
  --text TEXT   paint lines of text, in UTF-8; a character without a glyph shows as the default character
  --set NUMBER  paint all characters of a set; the number is the first two hexadecimal digits of their codes
  --font ID     with the font of this number, 1 if not given
  --scale N     enlarge each pixel N times, 1 to 16
  --boxes       tint the room that each glyph takes on its line, and the baseline

The exit status is 0, 1 if something is wrong with the file or a file cannot be read or written, 2 for wrong
usage.
)";

int Complain(std::string const& problem, int status = kFailed)
{
    std::fprintf(stderr, "tessella-cgf: %s\n", problem.c_str());
    return status;
}

/// What is wrong with the command line.
class UsageError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// What is to be painted, and how.
struct Painting {
    std::vector<std::variant<std::u16string, unsigned>> parts;  ///< texts and sets
    std::uint8_t font = 1;
    unsigned scale = 1;
    tools::GlyphPicture::Boxes boxes = tools::GlyphPicture::Boxes::No;
};

std::vector<unsigned char> ReadFile(std::string const& path)
{
    std::ifstream file(path, std::ios::binary);
    std::vector<unsigned char> bytes;
    for (char byte; file.get(byte);)
        bytes.push_back(static_cast<unsigned char>(byte));
    if (!file.eof()) throw std::runtime_error(path + ": cannot be read");
    return bytes;
}

int List(std::string const& path)
{
    auto const inspection = tools::InspectCgf(ReadFile(path));
    for (auto const& line : inspection.contents)
        std::puts(line.c_str());
    if (inspection.problems.empty()) return 0;
    return Complain(path + ": something is wrong with it (tessella-cgf check tells what)");
}

int Check(std::string const& path)
{
    auto const inspection = tools::InspectCgf(ReadFile(path));
    for (auto const& problem : inspection.problems)
        std::printf("%s: %s\n", path.c_str(), problem.c_str());
    return inspection.problems.empty() ? 0 : kFailed;
}

int Render(Painting const& painting, std::string const& path, std::string const& picturePath)
{
    CGF_Container container;
    if (!container.Parse(ReadFile(path)))
        return Complain(path + ": something is wrong with it (tessella-cgf check tells what)");
    auto const* const font = container.FindFontById(painting.font);
    if (font == nullptr || font->bitsPerPixel != 1)
        return Complain(path + ": has no font " + std::to_string(painting.font) + " in black and white");
    auto const glyphs = tools::TakeFont(*font);
    tools::GlyphPicture picture(glyphs, painting.boxes);
    for (auto const& part : painting.parts) {
        if (auto const* const text = std::get_if<std::u16string>(&part))
            picture.AddText(*text);
        else
            picture.AddSet(std::get<unsigned>(part));
    }
    auto const problem = picture.Save(picturePath, painting.scale);
    return problem.empty() ? 0 : Complain(picturePath + ": cannot be written: " + problem);
}

std::string Next(std::span<char*>& words, std::string const& what)
{
    if (words.empty()) throw UsageError(what + " is missing");
    std::string word = words.front();
    words = words.subspan(1);
    return word;
}

unsigned ToNumber(std::string const& text, int base, unsigned least, unsigned most)
{
    unsigned number = 0;
    auto const* const end = text.data() + text.size();
    auto const [behind, error] = std::from_chars(text.data(), end, number, base);
    if (error != std::errc{} || behind != end || number < least || number > most)
        throw UsageError("'" + text + "' is no number that goes there");
    return number;
}

std::u16string ToUtf16(std::string const& text)
{
    std::u16string converted;
    if (!Common::DecodeUtf8(converted, text.data(), text.size())) throw UsageError("the text is no UTF-8");
    return converted;
}

/// Takes the options that come before other words.
Painting ReadPainting(std::span<char*>& words)
{
    Painting painting;
    while (!words.empty() && std::string_view(words.front()).starts_with("-")) {
        auto const option = Next(words, "");
        if (option == "--boxes")
            painting.boxes = tools::GlyphPicture::Boxes::Yes;
        else if (option == "--text")
            painting.parts.emplace_back(ToUtf16(Next(words, "the text")));
        else if (option == "--set")
            painting.parts.emplace_back(ToNumber(Next(words, "the set's number"), 16, 0, 255));
        else if (option == "--font")
            painting.font = static_cast<std::uint8_t>(ToNumber(Next(words, "the font's number"), 10, 1, 255));
        else if (option == "--scale")
            painting.scale = ToNumber(Next(words, "the scale"), 10, 1, 16);
        else
            throw UsageError("unknown option '" + option + "'");
    }
    if (painting.parts.empty()) throw UsageError("neither --text nor --set tells what to render");
    return painting;
}

int Follow(std::span<char*> words)
{
    auto const command = Next(words, "the command");
    if (command == "--help" || command == "--version") {
        std::fputs(command == "--help" ? kHelp : "tessella-cgf " TESSELLA_VERSION "\n", stdout);
        return 0;
    }
    bool const rendering = command == "render";
    if (!rendering && command != "list" && command != "check")
        throw UsageError("unknown command '" + command + "'");
    auto const painting = rendering ? ReadPainting(words) : Painting{};
    auto const path = Next(words, "the file's name");
    if (path.starts_with("-")) throw UsageError("unknown option '" + path + "'");
    auto const picturePath = rendering ? Next(words, "the picture's name") : "";
    if (!words.empty()) throw UsageError("'" + std::string(words.front()) + "' is one word too many");
    if (rendering) return Render(painting, path, picturePath);
    return command == "list" ? List(path) : Check(path);
}

}

int main(int count, char** words)
{
    try {
        return Follow({words + 1, static_cast<std::size_t>(count - 1)});
    } catch (UsageError const& error) {
        return Complain(std::string(error.what()) + " (--help tells more)", kWrongUsage);
    } catch (std::exception const& error) {
        return Complain(error.what());
    }
}

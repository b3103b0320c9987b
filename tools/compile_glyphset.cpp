#include <tools/cgf_compose.h>
#include <tools/cgf_writer.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <stdexcept>
#include <string_view>

namespace {

constexpr char kHelp[] = R"(Usage: compile_glyphset OUTPUT BITMAPS OUTLINES CELLS OFFSETS
       compile_glyphset --help | --version

Makes the file glyphset.cgf, the library's own font, of the fonts that it is put together from.

The exit status is 0, 1 if a file cannot be read or written, 2 for wrong usage.
)";

constexpr std::u16string_view kFace = u"Helvetica";

CGF_FontHeader Describe()
{
    CGF_FontHeader font;
    font.id = 1;
    font.height = 17;
    font.ascent = 14;
    font.weight = 400;
    font.defaultCharacter = u'?';
    std::memcpy(font.face, kFace.data(), kFace.size() * sizeof(char16_t));
    return font;
}

void Write(char const* path, std::string const& bytes)
{
    std::FILE* const file = std::fopen(path, "wb");
    bool written = file != nullptr && std::fwrite(bytes.data(), 1, bytes.size(), file) == bytes.size();
    if (file != nullptr && std::fclose(file) != 0) written = false;
    if (!written)
        throw std::runtime_error(std::string(path) + ": cannot be written: " + std::strerror(errno));
}

}

int main(int count, char** words)
{
    std::string_view const word = count > 1 ? words[1] : "";
    if (word == "--help" || word == "--version")
        return std::fputs(word == "--help" ? kHelp : "compile_glyphset " TESSELLA_VERSION "\n", stdout), 0;
    if (count != 6) {
        std::fputs(
            "compile_glyphset: an output and four sources must be given (--help tells more)\n", stderr);
        return 2;
    }
    try {
        Write(words[1],
            tools::MakeCgf(Describe(), tools::ComposeGlyphs({words[2], words[3], words[4], words[5]})));
    } catch (std::exception const& error) {
        std::fprintf(stderr, "compile_glyphset: %s\n", error.what());
        return 1;
    }
}

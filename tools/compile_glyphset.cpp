// compile_glyphset: makes the file glyphset.cgf, the library's own font, of the fonts that it is put together
// from.

#include <tools/cgf_compose.h>
#include <tools/cgf_writer.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <stdexcept>
#include <string_view>

namespace {

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
    if (count != 6) {
        std::fputs("usage: compile_glyphset OUTPUT BITMAPS OUTLINES CELLS OFFSETS\n", stderr);
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

// Any bytes of a font file, read as the built-in font is: every glyph's bits lie in what was read.
#include <file/file.h>
#include <tessella/font_cgf.h>

#include <cstdlib>
#include <cstring>

namespace {

struct MemoryFile : si_file {
    std::span<unsigned char const> all, rest = all;
    explicit MemoryFile(std::span<unsigned char const> bytes) : all(bytes) {}
    void Read(void* buffer, std::uint64_t size, std::uint64_t& count) override
    {
        count = std::min<std::uint64_t>(size, rest.size());
        if (count > 0) std::memcpy(buffer, rest.data(), count);
        rest = rest.subspan(count);
    }
    void Rewind() override { rest = all; }
    std::uint64_t Size() override { return all.size(); }
};

}

extern "C" int LLVMFuzzerTestOneInput(unsigned char const* data, std::size_t size)
{
    setenv("VELLUM_SAFE_ASSERT", "none", 1);  // short files are reported, at length
    MemoryFile file({data, size});
    CGF_Container container;
    ReadContainer(file, container);
    auto const* const font = container.FindFontById(1);
    unsigned ink = 0;
    for (unsigned code = 0; font && code < 0x10000; ++code)
        if (auto const* const glyph = font->GetGlyph(code)) {
            unsigned const pixels = glyph->rows * glyph->width;
            for (unsigned i = 0; i < (font->bitsPerPixel == 1 ? (pixels + 7) / 8 : pixels); ++i)
                ink += glyph->bits[i];
        }
    return ink == UINT_MAX;  // never, but the bits are read
}

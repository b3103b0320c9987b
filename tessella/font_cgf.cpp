#include <tessella/font_cgf.h>

#include <common/assert.h>
#include <common/zipopen.h>
#include <file/file.h>

#include <algorithm>
#include <cstring>
#include <new>

static constexpr char kSource[] = GR_SOURCE("tessella/font_cgf");

namespace {

constexpr std::uint8_t kBuiltInFont = 1;
constexpr std::uint8_t kItalic = 8;

unsigned shareCount = 0;
std::unique_ptr<CGF_Container> shared;  // while there are shares

}

void ReadContainer(si_file& file, CGF_Container& container)
{
    unsigned char head[sizeof(CGF_Header)] = {};
    std::uint64_t headCount = 0;
    file.Read(head, sizeof head, headCount);
    CGF_Header header;
    std::memcpy(&header, head, sizeof header);
    // Never more than the file can fill, whatever size it claims to have.
    std::uint64_t const size = std::min<std::uint64_t>(header.size, file.Size());
    std::uint64_t restCount = 0;
    std::unique_ptr<unsigned char[]> bytes;
    if (size >= sizeof head) {
        bytes.reset(new unsigned char[size]);  // not cleared: it is filled at once
        std::memcpy(bytes.get(), head, sizeof head);
        file.Read(bytes.get() + sizeof head, size - sizeof head, restCount);
    }
    GR_ASSERT_LINE(restCount + sizeof head == header.size, "rs==(h.size-sz)", 52);
    if (bytes) container.Parse({bytes.get(), headCount + restCount});
}

GrFontCGFDevice::Share::Share()
{
    if (shareCount == 0) {
        shared = std::make_unique<CGF_Container>();
        std::unique_ptr<si_file> const file(ZipOpen("glyphset.cgf"));
        try {
            if (GR_ASSERT_LINE(file != nullptr, "file != 0", 42)) ReadContainer(*file, *shared);
        } catch (std::bad_alloc const&) {
            shared = std::make_unique<CGF_Container>();  // of no use in parts
        }
    }
    ++shareCount;
}

GrFontCGFDevice::Share::~Share()
{
    if (--shareCount == 0) shared.reset();
}

GrFontCGFDevice::GrFontCGFDevice(GrFontDesc const& desc) : GrFontBase(desc.flags.smooth, desc.weight)
{
    font = shared->FindFontById(kBuiltInFont);
    if (!font) return;
    CGF_Container::Key const key{desc.flags.italic ? kItalic : std::uint8_t{0},
        static_cast<std::uint16_t>(desc.flags.italic ? 0 : desc.weight)};
    if (auto const* const matching = shared->FindFont(key)) font = matching;
    height = font->height;
    weight = font->weight;
    ascent = font->ascent;
    valid = true;
}

bool GrFontCGFDevice::GetGlyph(unsigned code, GrGlyphInfo& info)
{
    CGF_Glyph const* const glyph = font->GetGlyph(code);
    if (!glyph) return false;
    info = {glyph->top, glyph->left, glyph->advance, glyph->width, glyph->rows, 0, font->bitsPerPixel,
        glyph->bits};
    return true;
}

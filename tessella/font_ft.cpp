#include <tessella/font_ft.h>

#include <common/assert.h>
#include <file/file.h>
#include <tessella/font_factory.h>
#include <tessella/font_file.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <ft2build.h>
#include <new>
#include <vector>
#include FT_FREETYPE_H
#include FT_GLYPH_H

static constexpr char kSource[] = GR_SOURCE("tessella/font_ft");

namespace {

constexpr FT_Int32 kSmoothFlags = FT_LOAD_RENDER | FT_LOAD_CROP_BITMAP;
constexpr FT_Int32 kMonoFlags = kSmoothFlags | FT_LOAD_MONOCHROME;
static_assert(kSmoothFlags == 68 && kMonoFlags == 4164);

constexpr unsigned kMaxPixelHeight = 0xFF;  // greater ones lose their upper bits
constexpr int kNoFile = 1;

unsigned shareCount = 0;
FT_Library library = nullptr;  // while there are shares

/// From 64ths of a pixel.
constexpr FT_Pos Rounded(FT_Pos position) { return (position + 32) >> 6; }

struct FileBytes {
    std::unique_ptr<unsigned char[]> bytes;  // null if there is no memory for them
    std::size_t size;
};

FileBytes ReadWhole(si_file& file)
{
    auto const size = static_cast<std::size_t>(file.Size());
    FileBytes whole{std::unique_ptr<unsigned char[]>(new (std::nothrow) unsigned char[size]()), size};
    if (whole.bytes) ReadAll(file, whole.bytes.get(), size);
    return whole;
}

/// FreeType does not say for how long it looks at metrics, so they stay as long as the process.
FT_Error AttachMetrics(FT_Face face, si_file& file)
{
    static auto& kept = *new std::vector<FileBytes>;
    FileBytes const& metrics = kept.emplace_back(ReadWhole(file));
    if (!metrics.bytes) return FT_Err_Out_Of_Memory;
    FT_Open_Args arguments = {};
    arguments.flags = FT_OPEN_MEMORY;
    arguments.memory_base = metrics.bytes.get();
    arguments.memory_size = static_cast<FT_Long>(metrics.size);
    return FT_Attach_Stream(face, &arguments);
}

FT_BitmapGlyphRec_& BitmapOf(FT_GlyphRec_& glyph) { return reinterpret_cast<FT_BitmapGlyphRec_&>(glyph); }

/// Brings a bitmap to the form that drawing wants: grey levels without bytes between the rows, and no pixels
/// at all where there is no ink. False if it has other pixels than bits and bytes, or goes upward.
bool Normalize(FT_Bitmap& bitmap)
{
    bool const isGrey = bitmap.pixel_mode == FT_PIXEL_MODE_GRAY;
    if ((!isGrey && bitmap.pixel_mode != FT_PIXEL_MODE_MONO) || bitmap.pitch < 0) return false;
    auto const pitch = static_cast<std::size_t>(bitmap.pitch);
    auto const isBlank = [](unsigned char byte) { return byte == 0; };
    if (std::all_of(bitmap.buffer, bitmap.buffer + bitmap.rows * pitch, isBlank))
        bitmap.width = bitmap.rows = 0;
    if (isGrey && pitch != bitmap.width) {
        for (unsigned row = 1; row < bitmap.rows; ++row)
            std::memmove(bitmap.buffer + row * bitmap.width, bitmap.buffer + row * pitch, bitmap.width);
        bitmap.pitch = static_cast<int>(bitmap.width);
    }
    return true;
}

}

void GrEnableFreeType()
{
    RegisterFontFactory(
        GrFontTypeFreeType, [](GrFontDesc const& desc) -> GrFont* { return new GrFontFT(desc); });
}

GrFontFTDevice::Share::Share()
{
    if (++shareCount == 1) FT_Init_FreeType(&library);
}

GrFontFTDevice::Share::~Share()
{
    if (--shareCount > 0) return;
    FT_Done_FreeType(library);
    library = nullptr;
}

void GrFontFTDevice::DoneFace::operator()(FT_Face opened) const { FT_Done_Face(opened); }

void GrFontFTDevice::DoneGlyph::operator()(FT_Glyph loaded) const { FT_Done_Glyph(loaded); }

GrFontFTDevice::GrFontFTDevice(GrFontDesc const& desc) : GrFontBase(desc.flags.smooth, desc.weight)
{
    if (LoadFace(desc.file.c_str(), desc.metrics.c_str()) != 0) return;
    auto const pixelHeight = static_cast<unsigned>(FT_MulDiv(desc.size, 96, 1000)) & kMaxPixelHeight;
    FT_Set_Pixel_Sizes(face.get(), 0, pixelHeight);
    height = static_cast<std::uint32_t>(Rounded(face->size->metrics.height));
    ascent = static_cast<std::uint32_t>(Rounded(face->size->metrics.ascender));
    kerning = desc.flags.kerning && FT_HAS_KERNING(face);
    valid = true;
    glyphs = std::make_unique<GlyphTable>();
}

GrFontFTDevice::~GrFontFTDevice()
{
    face.reset();  // before `data`
}

int GrFontFTDevice::LoadFace(char const* file, char const* metrics)
{
    auto const fontFile = OpenFontFile(file);
    auto const metricsFile = *metrics != 0 ? OpenFontFile(metrics) : nullptr;
    if (!fontFile) {
        std::fprintf(stderr, "TESSELLA: Warning! Font file \"%s\" not found\r\n", file);
        return kNoFile;
    }
    FileBytes font = ReadWhole(*fontFile);
    data = std::move(font.bytes);
    FT_Face opened = nullptr;
    FT_Error error = FT_New_Memory_Face(library, data.get(), static_cast<FT_Long>(font.size), 0, &opened);
    face.reset(opened);
    if (error != 0) {
        std::fprintf(stderr, "TESSELLA: Failed to load FreeType font \"%s\" code:%d\r\n", file, error);
        return error;
    }
    if (metricsFile) {
        error = AttachMetrics(opened, *metricsFile);
        if (error != 0)
            std::fprintf(
                stderr, "TESSELLA: Failed to attach metrics font \"%s\" code:%d\r\n", metrics, error);
    } else if (*metrics != 0) {
        std::fprintf(stderr, "TESSELLA: Warning! metrics file \"%s\" is not found\r\n", metrics);
    }
    return error;
}

bool GrFontFTDevice::GetGlyph(unsigned code, GrGlyphInfo& info)
{
    auto& page = (*glyphs)[code >> 8 & 0xFF];
    if (!page || !(*page)[code & 0xFF]) {
        GlyphPtr loaded = LoadGlyph(code);
        if (!loaded) return false;
        if (!page) page = std::make_unique<GlyphPage>();
        GlyphPtr& place = (*page)[code & 0xFF];
        GR_ASSERT_LINE(!place, "glyphs[GLYPHINDEX(index)] == 0", 66);
        place = std::move(loaded);
    }
    FT_BitmapGlyphRec_ const& glyph = BitmapOf(*(*page)[code & 0xFF]);
    info.top = glyph.top;
    info.left = glyph.left;
    info.advance = static_cast<std::uint32_t>(Rounded(glyph.root.advance.x));
    info.width = glyph.bitmap.width;
    info.rows = glyph.bitmap.rows;
    info.pitch = static_cast<std::uint32_t>(glyph.bitmap.pitch);
    // The number of grey levels does not tell: it is 256 for bits, too.
    info.bitsPerPixel = glyph.bitmap.pixel_mode == FT_PIXEL_MODE_MONO ? 1 : 8;
    info.bits = glyph.bitmap.buffer;
    return true;
}

GrFontFTDevice::GlyphPtr GrFontFTDevice::LoadGlyph(unsigned code) const
{
    if (FT_Load_Char(face.get(), code, smooth ? kSmoothFlags : kMonoFlags) != 0) return nullptr;
    FT_Glyph copy = nullptr;
    if (FT_Get_Glyph(face->glyph, &copy) != 0) return nullptr;
    GlyphPtr glyph(copy);
    glyph->advance = face->glyph->advance;  // in 64ths
    bool const isBitmap = glyph->format == FT_GLYPH_FORMAT_BITMAP;
    return isBitmap && Normalize(BitmapOf(*glyph).bitmap) ? std::move(glyph) : nullptr;
}

bool GrFontFTDevice::GetKerning(int out[2], unsigned code, unsigned previous)
{
    FT_Vector distance;
    // Codes instead of the glyphs' indices, and only one of the two rounded: texts are laid out for this.
    if (!kerning || FT_Get_Kerning(face.get(), previous, code, FT_KERNING_DEFAULT, &distance) != 0)
        return false;
    out[0] = static_cast<int>(Rounded(distance.x));
    out[1] = static_cast<int>(distance.y);
    return true;
}

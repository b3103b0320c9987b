#include <tools/cgf_face.h>

#include <ft2build.h>
#include FT_FREETYPE_H
#include FT_MODULE_H

#include <cstdlib>
#include <stdexcept>

namespace tools {

namespace {

/// The interpreter that applies hints in both directions, as rendering in black and white wants it.
constexpr FT_UInt kHintInterpreter = 35;

constexpr FT_Pos kPixel = 64;  // FreeType's unit of lengths is a 64th of one

}

void Face::Close::operator()(FT_LibraryRec_* opened) const { FT_Done_FreeType(opened); }
void Face::Close::operator()(FT_FaceRec_* opened) const { FT_Done_Face(opened); }

Face::Face(std::string const& itsPath, unsigned size) : path(itsPath)
{
    FT_Library newLibrary = nullptr;
    Check(FT_Init_FreeType(&newLibrary));
    library.reset(newLibrary);
    Check(FT_Property_Set(newLibrary, "truetype", "interpreter-version", &kHintInterpreter));
    FT_Face newFace = nullptr;
    Check(FT_New_Face(newLibrary, path.c_str(), 0, &newFace));
    face.reset(newFace);
    Check(FT_Select_Charmap(newFace, FT_ENCODING_UNICODE));
    Check(size == kOnlySize ? FT_Select_Size(newFace, 0) : FT_Set_Pixel_Sizes(newFace, 0, size));
}

bool Face::Has(char16_t code) const { return FT_Get_Char_Index(face.get(), code) != 0; }

Glyph Face::Read(char16_t code) const
{
    Check(FT_Load_Char(face.get(), code, FT_LOAD_RENDER | FT_LOAD_TARGET_MONO));
    auto const& slot = *face->glyph;
    auto const& bitmap = slot.bitmap;
    Glyph glyph{slot.bitmap_left, slot.bitmap_top, static_cast<unsigned>(slot.advance.x / kPixel),
        bitmap.width, bitmap.rows, {}};
    for (unsigned y = 0; y < bitmap.rows; ++y) {
        auto const* const row = bitmap.buffer + static_cast<std::ptrdiff_t>(y) * bitmap.pitch;
        for (unsigned x = 0; x < bitmap.width; ++x)
            glyph.ink.push_back(row[x / 8] >> (7 - x % 8) & 1);
    }
    return Trimmed(glyph);
}

std::string Face::Shape(char16_t code) const
{
    Check(FT_Load_Char(face.get(), code, FT_LOAD_NO_SCALE));
    auto const& slot = *face->glyph;
    auto const count = static_cast<std::size_t>(slot.outline.n_points);
    std::string shape(reinterpret_cast<char const*>(slot.outline.points), count * sizeof(FT_Vector));
    shape.append(reinterpret_cast<char const*>(slot.outline.tags), count);
    return shape + std::to_string(slot.advance.x);
}

void Face::Check(int error) const
{
    if (error == 0) return;
    char const* const text = FT_Error_String(error);  // null if FreeType was built without its texts
    throw std::runtime_error(path + ": " + (text ? text : "FreeType's error " + std::to_string(error)));
}

}

#include <tessella/font_factory.h>

#include <tessella/font_cgf.h>
#include <tessella/font_substitution.h>

#include <cstdio>
#include <map>
#include <memory>

namespace {

std::map<std::uint32_t, GrFontFactory> factories;  // by type

}

void RegisterFontFactory(std::uint32_t type, GrFontFactory factory) { factories[type] = factory; }

void LoadFontTable()
{
    ReadFontTable();
    RegisterFontFactory(GrFontTypeCgf, [](GrFontDesc const& desc) -> GrFont* { return new GrFontCGF(desc); });
    GrEnableFreeType();
}

GrFont* GrFont::Create(
    char const* face, unsigned int size, bool italic, unsigned int weight, bool smooth, bool kerning)
{
    GrFontDesc request;
    request.face = face;
    request.file = face;
    request.size = static_cast<std::int32_t>(size);
    request.weight = weight;
    request.flags = {italic, smooth, kerning};

    GrFontDesc resolved = request;
    if (HasFontTable()) ResolveFace(resolved, request);
    auto const factory = factories.find(resolved.type);
    if (factory == factories.end()) {
        std::fprintf(stderr, "TESSELLA: Warning! Unknown font type %d\r\n", static_cast<int>(resolved.type));
    } else {
        std::unique_ptr<GrFont> font(factory->second(resolved));
        if (font->IsValid()) return font.release();
    }
    return new GrFontCGF(request);
}

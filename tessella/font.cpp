#include <tessella/font_factory.h>

#include <tessella/font_cgf.h>
#include <tessella/font_substitution.h>

#include <cstdio>
#include <map>
#include <memory>
#include <new>
#include <utility>

namespace {

std::map<std::uint32_t, GrFontFactory> factories;  // by type

/// The font that the table has for a request. Null if it isn't to be had.
std::unique_ptr<GrFont> CreateResolved(GrFontDesc const& request)
try {
    GrFontDesc resolved = request;
    if (HasFontTable()) ResolveFace(resolved, request);
    auto const factory = factories.find(resolved.type);
    if (factory == factories.end()) {
        std::fprintf(stderr, "TESSELLA: Warning! Unknown font type %d\r\n", static_cast<int>(resolved.type));
        return nullptr;
    }
    std::unique_ptr<GrFont> font(factory->second(resolved));
    return font->IsValid() ? std::move(font) : nullptr;
} catch (std::bad_alloc const&) {
    return nullptr;  // a font file that asks for more than there is
}

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
    if (face != nullptr) request.face = request.file = face;
    request.size = static_cast<std::int32_t>(size);
    request.weight = weight;
    request.flags = {italic, smooth, kerning};

    if (std::unique_ptr<GrFont> font = CreateResolved(request)) return font.release();
    return new GrFontCGF(request);
}

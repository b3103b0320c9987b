#include "pages.h"

namespace gallery {

std::span<Page const> Pages()
{
    static constexpr Page kPages[] = {{"fills", DrawFills}, {"raster-modes", DrawRasterModes},
        {"lines", DrawLines}, {"polygons", DrawPolygons}, {"arcs", DrawArcs}, {"images", DrawImages},
        {"dithering", DrawDithering}, {"alpha", DrawAlpha}, {"masks", DrawMasks}, {"text", DrawTexts},
        {"cursors", DrawCursors}};
    return kPages;
}

}

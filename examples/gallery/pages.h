#pragma once

#include "plate.h"

#include <span>

namespace gallery {

/// A page of the picture book: one topic, told by pictures. It fits any size of some hundred pixels.
struct Page {
    char const* name;
    void (*draw)(Plate const& page);
};

/// The whole book.
std::span<Page const> Pages();

void DrawFills(Plate const& page);
void DrawRasterModes(Plate const& page);
void DrawLines(Plate const& page);
void DrawPolygons(Plate const& page);
void DrawArcs(Plate const& page);
void DrawImages(Plate const& page);
void DrawDithering(Plate const& page);
void DrawAlpha(Plate const& page);
void DrawMasks(Plate const& page);
void DrawTexts(Plate const& page);
void DrawCursors(Plate const& page);

}

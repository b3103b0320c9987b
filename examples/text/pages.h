#pragma once

#include "sheet.h"

namespace specimen {

/// The same paragraph in all languages whose script the style's font covers. Around each line stands the box
/// that the font measures.
void DrawLanguages(Sheet const& sheet, Style const& style);

/// The scalable face from small to large, smooth and in black and white, regular and bold; and letters that
/// are struck twice.
void DrawSizes(Sheet const& sheet);

/// The 256 characters whose codes begin with `block`, each in the box that the font measures.
void DrawBlock(Sheet const& sheet, Style const& style, unsigned block);

}

#pragma once

#include <tools/cgf_glyph.h>

#include <tessella/cgf.h>

namespace tools {

/// A font as the library's reader gives it, with the glyphs that its characters have of their own.
GlyphFont TakeFont(CGF_Font const& font);

}

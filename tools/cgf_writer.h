#pragma once

#include <tools/cgf_glyph.h>

#include <tessella/cgf_format.h>

#include <string>

namespace tools {

/// The bytes of a file with one font, the same every time: its chunk, and behind it 256 sets in falling
/// order. A set with glyphs begins with its first one. Of `font`, the file has all but the sizes and types of
/// chunks, which are filled in. Throws `std::runtime_error` if a glyph doesn't fit the format.
std::string MakeCgf(CGF_FontHeader font, Glyphs const& glyphs);

}

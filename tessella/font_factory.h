#pragma once

#include <tessella/font_base.h>

/// Makes a font of one type, which the caller deletes. It may turn out not to be valid.
using GrFontFactory = GrFont* (*)(GrFontDesc const& desc);

/// Has fonts of a type made by `factory` from now on. The application's thread.
void RegisterFontFactory(std::uint32_t type, GrFontFactory factory);

/// What the start of a session does for fonts: reads the table of substitutions and registers the factories.
void LoadFontTable();

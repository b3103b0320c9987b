#pragma once

#include <memory>

class si_file;

/// Opens a file that fonts need: that of the working directory, else that of the archive in the language in
/// force. Null if there is neither.
std::unique_ptr<si_file> OpenFontFile(char const* name);

#pragma once

#include <string>
#include <string_view>

namespace tools {

/// Makes a file of these bytes. Throws `std::runtime_error`, which names the file, if that fails.
void WriteFile(std::string const& path, std::string_view bytes);

}

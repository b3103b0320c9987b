#pragma once

#include <tools/layout_source.h>

#include <span>
#include <string>

namespace tools {

/// The bytes of a file `keyboard.kbd` with these layouts, in this order; the same bytes every time.
std::string MakeLayoutFile(std::span<Layout const> layouts);

}

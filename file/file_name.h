#pragma once

#include <optional>
#include <string>
#include <string_view>

/// A file name in the system's encoding: that of the locale which the environment names, or UTF-8 if that
/// has only ASCII or is not known. Nothing if the name is empty, longer than any path, or has a character
/// that cannot be written so, or a 0.
std::optional<std::string> SystemFileName(std::u16string_view name);

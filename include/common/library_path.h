#pragma once

#include <span>
#include <string_view>

/// The absolute path of the file this library was loaded from, or of the program if that cannot be told;
/// empty if neither can. The text stays for the life of the process. From any thread.
char const* GetLibraryPath();

/// Turns the absolute folder in `path` (at least 2 bytes, 0-terminated, may be empty for the root) into
/// `name` as seen from there, with empty components, "." and ".." resolved by text alone; ".." stops at the
/// root. False if the result does not fit; `path` is then empty.
bool NormalizePath(std::span<char> path, std::string_view name);

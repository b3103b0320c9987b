#pragma once

#include <tessella/key_layout.h>

#include <fstream>
#include <iterator>
#include <string>

using Bytes = std::vector<unsigned char>;

inline Bytes ReadBytes(std::string const& path)
{
    std::ifstream file(path, std::ios::binary);
    return Bytes(std::istreambuf_iterator<char>(file), {});
}

/// The layouts of a file `keyboard.kbd`, with its bytes.
struct LayoutFile {
    explicit LayoutFile(Bytes itsBytes) : bytes(std::move(itsBytes)), layouts(ReadKeyLayouts(bytes)) {}
    Bytes bytes;
    std::optional<std::vector<std::unique_ptr<GrSmartKeyLayout>>> layouts;
};

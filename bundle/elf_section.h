#pragma once

#include <cstdint>
#include <cstdio>
#include <optional>

/// Where a section's bytes lie in its file.
struct ElfSection {
    std::uint64_t offset;
    std::uint64_t size;
};

/// The first section of this name. Nothing if the file is no ELF file, has no such section, or has not all
/// its bytes.
std::optional<ElfSection> FindElfSection(std::FILE* file, char const* name);

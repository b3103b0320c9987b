#pragma once

#include <span>
#include <string>
#include <vector>

namespace tools {

/// What a file of bitmap glyphs holds, a line for each of its chunks behind one for the file, and what is
/// wrong with it.
struct CgfInspection {
    std::vector<std::string> contents;
    std::vector<std::string> problems;
};

/// Looks at the file byte by byte, more strictly than those who only want its glyphs: everything in it must
/// be reachable, and nothing may lie between the glyphs. Takes any bytes.
CgfInspection InspectCgf(std::span<unsigned char const> file);

}

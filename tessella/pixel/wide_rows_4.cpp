// Compiled for every processor: see CMakeLists.txt.
namespace {
constexpr int kLanesHere = 4;
}

#include <tessella/pixel/wide_rows.inl>

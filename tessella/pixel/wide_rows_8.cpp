// Compiled for processors with AVX2: see CMakeLists.txt.
namespace {
constexpr int kLanesHere = 8;
}

#include <tessella/pixel/wide_rows.inl>

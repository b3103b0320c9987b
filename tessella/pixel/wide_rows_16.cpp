// Compiled for processors with AVX-512: see CMakeLists.txt.
namespace {
constexpr int kLanesHere = 16;
}

#include <tessella/pixel/wide_rows.inl>

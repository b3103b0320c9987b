#pragma once

/// Marks what `libtessella.so` offers to applications; everything else stays hidden in the library.
#define GR_API __attribute__((visibility("default")))

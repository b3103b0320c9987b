#pragma once

/// Marks what `libtessella.so` offers to applications; everything else stays hidden in the library.
#define GR_API __attribute__((visibility("default")))

/// Takes a member of a class that applications may use out of the interface: the library's own.
#define GR_INTERNAL __attribute__((visibility("hidden")))

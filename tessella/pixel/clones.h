#pragma once

// GR_CLONES before a function compiles it for several generations of processors; the best is chosen when the
// library is loaded. What it calls must be inlined into it to take part: GR_INLINE.
//
// Sanitizers would instrument the choice of the version too, which happens before they are ready; and clang
// does not know the names of these processors.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__) || defined(__clang__) ||                   \
    !defined(__x86_64__)
#define GR_CLONES
#else
#define GR_CLONES __attribute__((target_clones("arch=x86-64-v4", "avx2", "default")))
#endif

#define GR_INLINE [[gnu::always_inline]] inline

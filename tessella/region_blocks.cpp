#include <tessella/region_blocks.h>

template <typename T, int kMost>
constinit thread_local typename SmallBlocks<T, kMost>::Block* SmallBlocks<T, kMost>::first = nullptr;

// None is kept before the thread is known to return them when it ends, nor afterwards.
template <typename T, int kMost>
constinit thread_local int SmallBlocks<T, kMost>::room = 0;

template <typename T, int kMost>
struct SmallBlocks<T, kMost>::Release {
    Release() { room = kMost; }
    ~Release()
    {
        while (first != nullptr)
            delete[] Take();
        room = 0;
    }
};

template <typename T, int kMost>
T* SmallBlocks<T, kMost>::Make()
{
#ifndef __SANITIZE_ADDRESS__  // which is to see what is used after it was given back
    thread_local Release const release;
#endif
    return new T[kGrowth];
}

template class SmallBlocks<GrRange, 256>;
template class SmallBlocks<GrRegion::Band, 16>;

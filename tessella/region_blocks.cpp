#include <tessella/region_blocks.h>

template <typename T>
constinit thread_local typename SmallBlocks<T>::Block* SmallBlocks<T>::first = nullptr;

// None is kept before the thread is known to return them when it ends, nor afterwards.
template <typename T>
constinit thread_local int SmallBlocks<T>::room = 0;

template <typename T>
struct SmallBlocks<T>::Release {
    Release() { room = kMost; }
    ~Release()
    {
        while (first != nullptr)
            delete[] Take();
        room = 0;
    }
};

template <typename T>
T* SmallBlocks<T>::Make()
{
#ifndef __SANITIZE_ADDRESS__  // which is to see what is used after it was given back
    thread_local Release const release;
#endif
    return new T[kGrowth];
}

template class SmallBlocks<GrRange>;
template class SmallBlocks<GrRegion::Band>;

#pragma once

#include <tessella/region.h>

/// Lists grow by this many slots, so nearly all are kept in blocks of as many.
constexpr int kGrowth = 10;

/// Blocks of `kGrowth` slots that the thread has done with, for its next lists. A merge of small regions is
/// over sooner than the heap has found it a block for each band. They are the heap's all the same: any of
/// them may be deleted, and one that was made elsewhere may be given.
template <typename T>
class SmallBlocks {
public:
    static T* Take()
    {
        if (first == nullptr) return Make();
        Block* const block = first;
        first = block->next;
        ++room;
        return reinterpret_cast<T*>(block);
    }

    /// `slots` must have room for `kGrowth`.
    static void Give(T* slots)
    {
        if (room == 0) {
            delete[] slots;
        } else {
            auto* const block = reinterpret_cast<Block*>(slots);
            block->next = first;
            first = block;
            --room;
        }
    }

private:
    struct Block {
        Block* next;
    };
    struct Release;

    static constexpr int kMost = 20'480 / (kGrowth * sizeof(T));  // a thread has not many complex regions

    static T* Make();

    // As little as the room that is set aside for libraries loaded late, so it can be reached without a call.
    [[gnu::tls_model("initial-exec")]] static constinit thread_local Block* first;
    [[gnu::tls_model("initial-exec")]] static constinit thread_local int room;  // for so many more blocks
};

extern template class SmallBlocks<GrRange>;
extern template class SmallBlocks<GrRegion::Band>;

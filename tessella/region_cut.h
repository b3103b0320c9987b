#pragma once

#include <tessella/region.h>

/// `result` = the pixels that `region` shares with `other`: the same bands and ranges as a copy of `region`
/// that is then intersected with `other`, made without copying what the intersection drops. An empty result
/// may have fewer bands. `result` is neither of the two, and its storage is only ever enlarged. Any thread.
void CutRegion(GrRegion& result, GrRegion const& region, GrRegion const& other);
void CutRegion(GrRegion& result, GrRegion const& region, GrRect const& rect);

/// A region for the length of a scope, whose storage stays with the thread for the next one: every drawing
/// operation needs such a region, and the heap would cost it more than a small fill does. It begins with
/// whatever pixels the last user left.
class LocalRegion {
public:
    LocalRegion() : scratch(unused ? unused : NewScratch()) { unused = scratch->next; }
    ~LocalRegion()
    {
        if (scratch->region.bands.item_capacity > kMostBandsKept) scratch->region.Clear();
        scratch->next = unused;
        unused = scratch;
    }
    LocalRegion(LocalRegion const&) = delete;
    LocalRegion& operator=(LocalRegion const&) = delete;

    GrRegion& Get() const { return scratch->region; }

private:
    struct Scratch {
        GrRegion region;
        Scratch* next = nullptr;
    };
    struct Release;

    static constexpr int kMostBandsKept = 4096;

    static Scratch* NewScratch();

    /// The thread's regions that nobody has borrowed. One pointer is little enough for the room that is set
    /// aside for libraries loaded late, so it can be reached without a call.
    [[gnu::tls_model("initial-exec")]] static constinit thread_local Scratch* unused;

    Scratch* const scratch;
};

#pragma once

#include <tessella/region.h>

/// `result` = the pixels that `region` shares with `other`: the same bands and ranges as a copy of `region` that
/// is then intersected with `other` (none at all if they share no pixel's row), made without copying what the
/// intersection drops. `result` is neither of the two, and its storage is only ever enlarged. Any thread.
void CutRegion(GrRegion& result, GrRegion const& region, GrRegion const& other);
void CutRegion(GrRegion& result, GrRegion const& region, GrRect const& rect);

/// A region for the length of a scope, whose storage stays with the thread for the next one: every drawing
/// operation needs such a region, and the heap would cost it more than a small fill does. It begins with
/// whatever pixels the last user left.
class LocalRegion {
public:
    LocalRegion();
    ~LocalRegion();
    LocalRegion(LocalRegion const&) = delete;
    LocalRegion& operator=(LocalRegion const&) = delete;

    GrRegion& Get() const;

private:
    struct Scratch;
    struct Release;
    static constinit thread_local Scratch* unused;  // the thread's regions that nobody has borrowed

    Scratch* scratch;
};

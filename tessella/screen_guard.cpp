#include <tessella/screen_guard.h>

#include <tessella/cursor.h>
#include <tessella/cursor_state.h>
#include <tessella/mouse.h>

#include <algorithm>
#include <span>

constinit ScreenMutex screenMutex;
constinit std::atomic<std::uint32_t> hideCount{1};

namespace {

constexpr auto kRelaxed = std::memory_order_relaxed;

bool Meet(GrRect const& a, GrRect const& b)
{
    return std::max(a.x1, b.x1) < std::min(a.x2, b.x2) && std::max(a.y1, b.y1) < std::min(a.y2, b.y2);
}

bool Meet(GrRegion const& region, GrRect const& rect)
{
    auto const items = [](auto const& list) {
        return std::span(list.items, static_cast<std::size_t>(list.item_count));
    };
    return std::ranges::any_of(items(region.bands), [&](auto const& band) {
        return std::ranges::any_of(items(band), [&](GrRange const& range) {
            return Meet({range.r1, band.r1, range.r2, band.r2}, rect);
        });
    });
}

}

// The count is not per thread; only the guard that raises it from 0 takes the lock.
template <typename Area>
void GrScreenGuard::Enter(Area const& area)
{
    if (hideCount.fetch_add(1, kRelaxed) == 0) screenMutex.lock();
    KeepClear(area);
}

template <typename Area>
void GrScreenGuard::KeepClear(Area const& area)
{
    if (!cursorVisible) return;
    GrCursor const* const cursor = currentCursor;
    if (cursor && Meet(area, cursor->shownRect)) GrHideCursor();
}

GrScreenGuard::GrScreenGuard(GrRegion const& region) { Enter(region); }

GrScreenGuard::GrScreenGuard(GrRect const& rect) { Enter(rect); }

void GrScreenGuard::Extend(GrRegion const& region) const { KeepClear(region); }

void GrScreenGuard::Extend(GrRect const& rect) const { KeepClear(rect); }

GrScreenGuard::~GrScreenGuard()
{
    if (hideCount.load(kRelaxed) == 1) PutCursorBack();
    if (hideCount.fetch_sub(1, kRelaxed) == 1) screenMutex.unlock();
}

// The pointer may have moved while the guard held its cursor back.
void GrScreenGuard::PutCursorBack()
{
    GrCursor* const cursor = currentCursor;
    if (!cursor) return;
    int const x = mouseX.load(kRelaxed);
    int const y = mouseY.load(kRelaxed);
    if (cursorVisible && (cursor->x != x || cursor->y != y)) GrHideCursor();
    if (cursorVisible) return;
    cursor->x = x;
    cursor->y = y;
    GrShowCursor();
}

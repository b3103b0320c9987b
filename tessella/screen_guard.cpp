#include <tessella/screen_guard.h>

constinit std::recursive_mutex screenMutex;
constinit std::atomic<std::uint32_t> hideCount{1};

namespace {

// The count is not per thread; only the guard that raises it from 0 takes the lock.
void Enter()
{
    if (hideCount.fetch_add(1, std::memory_order_relaxed) == 0) screenMutex.lock();
}

}

GrScreenGuard::GrScreenGuard(GrRegion const&) { Enter(); }

GrScreenGuard::GrScreenGuard(GrRect const&) { Enter(); }

GrScreenGuard::~GrScreenGuard()
{
    if (hideCount.fetch_sub(1, std::memory_order_relaxed) == 1) screenMutex.unlock();
}

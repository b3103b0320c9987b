#include <tessella/screen_mutex_l.h>

#include <bit>
#include <cerrno>
#include <climits>
#include <ctime>

#include <linux/futex.h>
#include <pthread.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace {

constexpr std::uint64_t kOnce = std::uint64_t{1} << 48;  // addresses of programs end below

std::uint64_t Self() { return std::bit_cast<std::uint64_t>(pthread_self()); }

long Futex(
    std::atomic<std::uint32_t>& word, int operation, std::uint32_t value, timespec const* limit = nullptr)
{
    return syscall(SYS_futex, &word, operation | FUTEX_PRIVATE_FLAG, value, limit, nullptr, 0);
}

}

bool ScreenMutex::try_lock()
{
    std::uint64_t const self = Self();
    std::uint64_t before = state.load(std::memory_order_relaxed);
    do
        if (before != 0 && before % kOnce != self) return false;
    while (!state.compare_exchange_weak(before, before == 0 ? self + kOnce : before + kOnce));
    return true;
}

void ScreenMutex::lock()
{
    if (!try_lock()) Take(nullptr);
}

bool ScreenMutex::try_lock_for(std::chrono::nanoseconds limit) { return try_lock() || Take(&limit); }

// Who is about to sleep says so first and looks once more; who releases does it in the opposite order. So one
// of them sees the other.
bool ScreenMutex::Take(std::chrono::nanoseconds const* limit)
{
    auto const seconds =
        std::chrono::floor<std::chrono::seconds>(limit ? *limit : std::chrono::nanoseconds(0));
    timespec const time{seconds.count(), limit ? (*limit - seconds).count() : 0};
    for (;;) {
        ++waiting;
        std::uint32_t const seen = releases;
        bool const taken = try_lock();
        bool const tooLate =
            !taken && Futex(releases, FUTEX_WAIT, seen, limit ? &time : nullptr) == -1 && errno == ETIMEDOUT;
        --waiting;
        if (taken || tooLate) return taken;
    }
}

void ScreenMutex::unlock()
{
    std::uint64_t before = state.load(std::memory_order_relaxed);
    if (before % kOnce != Self()) return;
    std::uint64_t after = 0;
    do
        after = before / kOnce == 1 ? 0 : before - kOnce;
    while (!state.compare_exchange_weak(before, after));
    if (after != 0 || waiting == 0) return;
    ++releases;
    Futex(releases, FUTEX_WAKE, INT_MAX);  // one of them may own it by now, and sleep in a handler
}

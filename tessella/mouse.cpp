#include <tessella/mouse.h>

#include <tessella/cursor.h>
#include <tessella/cursor_state.h>
#include <tessella/event.h>
#include <tessella/event_wait_l.h>
#include <tessella/keyboard_device.h>
#include <tessella/mouse_l.h>
#include <tessella/screen.h>
#include <tessella/screen_guard.h>

#include <algorithm>
#include <array>
#include <bit>
#include <chrono>
#include <cstdlib>
#include <ctime>
#include <thread>

#include <pthread.h>

constinit std::mutex mouseMutex;
constinit std::atomic<std::uint32_t> mouseButtons{7};
int mouseFd = -1;
bool mouseWheel = false;
constinit std::atomic<bool> mouseRefreshPending{false};
constinit std::atomic<int> mouseX{0}, mouseY{0};

namespace {

constexpr auto kRelaxed = std::memory_order_relaxed;

/// A side of the screen, which a change of mode may be about to alter.
int Side(std::uint32_t& side) { return static_cast<int>(std::atomic_ref(side).load(kRelaxed)); }

constexpr std::uint32_t kLeft = 4, kMiddle = 2, kRight = 1;
constexpr std::uint32_t kQueuedKinds = 0x1FE;  // all that is not a move

struct Change {
    std::uint32_t kinds;  // bits of those not taken yet; a move's bit is not looked at
    int x, y;
    std::uint32_t time;
};

/// The changes not taken yet, oldest first. One slot stays free.
class ChangeQueue {
public:
    void Clear() { head = tail = 0; }
    bool IsEmpty() const { return head == tail; }
    bool Push(Change const& change)
    {
        std::size_t const next = (head + 1) % changes.size();
        if (next == tail) return false;
        changes[head] = change;
        head = next;
        return true;
    }
    Change& Oldest() { return changes[tail]; }
    void Pop() { tail = (tail + 1) % changes.size(); }

private:
    std::array<Change, 128> changes{};
    std::size_t head = 0, tail = 0;
};

// All guarded by mouseMutex.
ChangeQueue mouseQueue;
bool mouseEnabled = false;  // there is something to move the pointer
std::uint32_t queuedButtons = 0;
int reportedX = 0, reportedY = 0;  // what the application was told last

void CentrePointer()
{
    mouseX.store(Side(GrScreen.width) >> 1, kRelaxed);
    mouseY.store(Side(GrScreen.height) >> 1, kRelaxed);
}

bool HasMoved() { return mouseX.load(kRelaxed) != reportedX || mouseY.load(kRelaxed) != reportedY; }

/// The pointer goes into use, or out of it. `hideCount` holds one for a pointer that is out of use.
void OnMouseEnabledChanged()
{
    if (mouseEnabled) {
        if (hideCount.fetch_sub(1, kRelaxed) == 1) {
            GrShowCursor();
            return;
        }
        hideCount.fetch_add(1, kRelaxed);
    } else {
        hideCount.fetch_add(1, kRelaxed);
    }
    GrHideCursor();
}

/// Set when the session ends. Whoever ends it waits for the mouse's thread, and may hold any lock: a handler
/// of crashes does, and the application while somebody else has the console.
constinit std::atomic<bool> mouseStopping{false};

constexpr std::chrono::nanoseconds kGlance{10'000'000};  // from one look at the session to the next

bool LockAtAGlance(ScreenMutex& mutex) { return mutex.try_lock_for(kGlance); }

bool LockAtAGlance(std::mutex& mutex)
{
    timespec deadline{};
    clock_gettime(CLOCK_MONOTONIC, &deadline);
    deadline.tv_nsec += kGlance.count();
    deadline.tv_sec += deadline.tv_nsec / 1'000'000'000;
    deadline.tv_nsec %= 1'000'000'000;
    return pthread_mutex_clocklock(mutex.native_handle(), CLOCK_MONOTONIC, &deadline) == 0;
}

/// The lock for a report of the mouse; not held if the session ends meanwhile.
template <typename Mutex>
std::unique_lock<Mutex> LockUnlessStopping(Mutex& mutex)
{
    while (!mouseStopping)
        if (LockAtAGlance(mutex)) return std::unique_lock(mutex, std::adopt_lock);
    return std::unique_lock(mutex, std::defer_lock);
}

int Accelerated(int delta) { return std::abs(delta) > 5 ? delta * 2 : delta; }

/// The kinds of event that a button's change makes, if its bit differs: `down`, or `up`, the bit above.
std::uint32_t ButtonKind(std::uint32_t before, std::uint32_t now, std::uint32_t button, std::uint32_t down)
{
    if (((before ^ now) & button) == 0) return 0;
    return now & button ? down << 1 : down;
}

/// Moves the pointer and queues changes of buttons and wheel. False if a change is lost, or the session ends.
/// Under `mouseMutex`.
bool GrMousePush(std::uint32_t kinds, std::uint32_t buttons, int x, int y)
{
    if (kinds & GrEventMouseMove) {
        auto const lock = LockUnlessStopping(screenMutex);
        if (!lock) return false;
        if (GrCursor* const cursor = currentCursor) cursor->Move(x, y);
        mouseX.store(x, kRelaxed);
        mouseY.store(y, kRelaxed);
    }
    if ((kinds & kQueuedKinds) == 0) return true;
    queuedButtons = buttons;
    return mouseQueue.Push({kinds, x, y, 0});
}

}

MousePacket DecodeMousePacket(std::span<unsigned char const> bytes)
{
    std::uint32_t const left = bytes[0] & 1;
    std::uint32_t const right = bytes[0] >> 1 & 1;
    int const roll = bytes.size() > 3 ? bytes[3] & 0x0F : 0;
    return {7 - (right | left * kLeft), static_cast<signed char>(bytes[1]),
        -static_cast<signed char>(bytes[2]),
        roll == 1        ? -1
            : roll == 15 ? 1
                         : 0};
}

void GrMouseStart()
{
    {
        std::scoped_lock const lock(mouseMutex);
        mouseEnabled = false;
        mouseRefreshPending = false;
        queuedButtons = 0;
        mouseQueue.Clear();
        cursorVisible = false;
        CentrePointer();
    }
    GrMouseOpen();
    if (mouseFd == -1) return;
    mouseRefreshPending = true;
    GrMouseRefresh();
}

void GrMouseStop()
{
    mouseStopping = true;
    StopMouseThread();
}

void GrMouseRefresh()
{
    if (!mouseRefreshPending) return;
    std::scoped_lock const lock(mouseMutex);
    bool const before = mouseEnabled;
    if (mouseFd != -1) StartMouseThread();
    mouseEnabled = mouseFd != -1 || (sessionKeyboard && sessionKeyboard->emulationActive);
    if (mouseEnabled != before) OnMouseEnabledChanged();
    mouseRefreshPending = false;
}

void GrMouseReport(std::uint32_t buttons, int dx, int dy, int wheel)
{
    dx = Accelerated(dx);
    dy = Accelerated(dy);
    std::uint32_t kinds = dx != 0 || dy != 0 ? std::uint32_t{GrEventMouseMove} : 0;
    std::uint32_t const before = mouseButtons.exchange(buttons, kRelaxed);
    kinds |= ButtonKind(before, buttons, kLeft, GrEventLeftDown) |
        ButtonKind(before, buttons, kMiddle, GrEventMiddleDown) |
        ButtonKind(before, buttons, kRight, GrEventRightDown);
    if (wheel == 1) kinds |= GrEventWheelUp;
    if (wheel == -1) kinds |= GrEventWheelDown;
    int const x =
        std::clamp(mouseX.load(kRelaxed) + dx, 0, Side(GrScreen.width));  // may be one past the edge
    int const y = std::clamp(mouseY.load(kRelaxed) + dy, 0, Side(GrScreen.height));
    bool stored = false;
    {
        auto const lock = LockUnlessStopping(mouseMutex);
        stored = lock && GrMousePush(kinds, buttons, x, y);
    }
    if (stored) GrPostInputWake();
}

bool GrMouseHasEvent()
{
    GrMouseRefresh();
    std::scoped_lock const lock(mouseMutex);
    return mouseEnabled && (!mouseQueue.IsEmpty() || HasMoved());
}

bool GrMousePop(std::uint32_t* kind, int* x, int* y, std::uint32_t* time)
{
    std::scoped_lock const lock(mouseMutex);
    if (!mouseEnabled) return false;
    bool const queued = !mouseQueue.IsEmpty();
    *x = queued ? mouseQueue.Oldest().x : mouseX.load(kRelaxed);
    *y = queued ? mouseQueue.Oldest().y : mouseY.load(kRelaxed);
    *time = 0;
    if (*x != reportedX || *y != reportedY) {
        reportedX = *x;
        reportedY = *y;
        *kind = GrEventMouseMove;
        return true;
    }
    if (!queued) return false;
    Change& oldest = mouseQueue.Oldest();
    std::uint32_t const pending = oldest.kinds & kQueuedKinds;
    *kind = pending & (~pending + 1);  // the lowest bit
    *time = oldest.time;
    oldest.kinds = pending & ~*kind;
    if (oldest.kinds == 0) mouseQueue.Pop();
    return true;
}

void GrGetCursorPos(int& x, int& y, unsigned& buttons)
{
    std::scoped_lock const lock(mouseMutex);
    x = mouseX.load(kRelaxed);
    y = mouseY.load(kRelaxed);
    buttons = queuedButtons;
}

void GrMouseRecentre()
{
    // The guard holds the screen, and the mouse's thread may hold the pointer and wait for the screen. Giving
    // the screen away for a moment harms nobody: while the count is not 0, nobody draws the pointer.
    bool const screenHeld = hideCount.load(kRelaxed) == 1;
    while (!mouseMutex.try_lock()) {
        if (screenHeld) screenMutex.unlock();
        std::this_thread::sleep_for(std::chrono::microseconds(50));
        if (screenHeld) screenMutex.lock();
    }
    std::scoped_lock const lock(std::adopt_lock, mouseMutex);
    CentrePointer();
    currentCursor = nullptr;
}

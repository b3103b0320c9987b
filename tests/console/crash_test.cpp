#include <support/on_console.h>
#include <tessella.h>
#include <tessella/keyboard_l.h>
#include <tessella/mouse.h>
#include <tessella/screen_guard.h>
#include <tessella/session_state.h>

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <new>
#include <thread>

#include <sys/mman.h>
#include <unistd.h>

// Segmentation faults on the virtual console.

/// The handler ends the session, for the console's sake, which frees memory: not safe in a fault of the heap.
extern "C" __attribute__((visibility("default"))) char const* __tsan_default_suppressions()
{
    return "signal:GrCrashHandler\n";
}

/// As after a fault in the allocator, which is in the midst of something then.
static std::atomic<bool> heapIsLocked{false};

static void WaitForHeap()
{
    while (heapIsLocked)
        pause();
}

[[gnu::noinline]] void* operator new(std::size_t size)
{
    WaitForHeap();
    return std::malloc(size);
}

[[gnu::noinline]] void operator delete(void* memory) noexcept
{
    WaitForHeap();
    std::free(memory);
}

[[gnu::noinline]] void operator delete(void* memory, std::size_t /*size*/) noexcept
{
    WaitForHeap();
    std::free(memory);
}

namespace {

// Loads r10 to r15, rdi, rsi, rdx, rax and rcx, and writes where nothing is.
asm(R"(
    .text
    CrashWith:
    mov %rdi, %rbx
    mov (%rbx), %r10; mov 8(%rbx), %r11; mov 16(%rbx), %r12; mov 24(%rbx), %r13; mov 32(%rbx), %r14
    mov 40(%rbx), %r15; mov 48(%rbx), %rdi; mov 56(%rbx), %rsi; mov 64(%rbx), %rdx; mov 72(%rbx), %rax
    mov 80(%rbx), %rcx
    mov $0xDEAD008, %rbx
    CrashHere: movb $0, (%rbx)
)");
extern "C" void CrashWith(unsigned long const* registers);
extern "C" char const CrashHere[];

/// Low memory that the report follows: 20 bytes of code, 40 frames of two words, and 40 words of a stack.
constexpr unsigned long kCode = 0x10000000, kFrames = kCode + 0x100, kStack = kCode + 0x800;
unsigned long& WordAt(unsigned long address) { return *reinterpret_cast<unsigned long*>(address); }
std::array<unsigned long, 11> registers = {
    0x11, 0x22, kFrames, kStack, 0x123456789, 0x66, 0x77, 0x88, kCode, 0x7777BBAA, 0xCC};

constexpr int kReported = 7 << 8, kGivenBack = 9 << 8;

/// What a program tells that faults in `body`, in ten seconds; `kReported` if it aborts without a session,
/// and `kGivenBack` if it does so in one that has no console any more.
template <typename Body>
ChildOutcome Crash(Body body, bool inSession = true)
{
    return RunChild([&] {
        console::VirtualConsole screen({*console::ParseMode("64x48x16"), {}, {}});
        screen.AttachProcess();
        static auto& tty = screen;
        std::signal(SIGABRT, [](int) {
            _exit(!initialized ? 7 : tty.Tty().consoleMode == KD_TEXT && ConsoleTty() == -1 ? 9 : 10);
        });
        alarm(10);
        mmap(reinterpret_cast<void*>(kCode), 4096, PROT_READ | PROT_WRITE,
            MAP_PRIVATE | MAP_ANONYMOUS | MAP_FIXED_NOREPLACE, -1, 0);
        for (unsigned i = 0; i < 40; ++i) {
            reinterpret_cast<unsigned char*>(kCode)[i] = static_cast<unsigned char>(i);
            WordAt(kFrames + 16 * i) = kFrames + 16 * (i + 1);
            WordAt(kFrames + 16 * i + 8) = 0x1000 + i;
            WordAt(kStack + 8 * i) = 0xA0 + i;
        }
        Sizes sizes;
        if (inSession) Init(sizes);
        body(screen);
        CrashWith(registers.data());
        return 8;
    });
}

TEST(Crash, EveryByteOfTheReport)
{
    std::string report = "\x1B[H\x1B[2JSegmentation fault, addr=0x0DEAD008\nEIP=0x10000000\n"
                         "EAX=0x00000088 EBX=0x123456789 ECX=0x00000077 EDX=0x00000066\n"
                         "EDI=0x00000011 ESI=0x00000022 EBP=0x10000100 ESP=0x10000800\nCS=0xBBAA SS=0x";
    auto const add = [&report](char const* format, unsigned value) {
        char text[64];
        report.append(text, static_cast<std::size_t>(std::snprintf(text, sizeof text, format, value)));
    };
    add("%04X", reinterpret_cast<std::uintptr_t>(CrashHere) & 0xFFFF);
    report += "\nEFLAGS=0x000000CC\nCode:";
    for (unsigned i = 0; i < 20; ++i)
        add(" %02X", i);
    report += "\nBacktrace:";
    for (unsigned i = 0; i < 32; ++i)
        add(i % 5 == 0 ? "\n [ 0x%08X ]" : " [ 0x%08X ]", 0x1000 + i);
    report += "\nStack:";
    for (unsigned i = 0; i < 32; ++i)
        add(i % 8 == 0 ? "\n %08X" : " %08X", 0xA0 + i);
    report += "\n";
    for (bool const isOver : {false, true}) {
        auto const outcome = Crash([&](auto&) { isOver ? GrDone() : void(); });
        EXPECT_EQ(outcome.err, report);
        EXPECT_EQ(outcome.status, kReported);
    }
}

TEST(Crash, AReportEndsWhereItsMemoryEnds)
{
    for (unsigned long const beyond : {0xC0000000UL, kFrames - 8}) {
        auto const outcome = Crash([&](auto&) {
            static unsigned long const high = 0xFEDCBA98;
            registers[3] = reinterpret_cast<unsigned long>(&high);
            WordAt(kFrames + 16) = beyond;
        });
        EXPECT_TRUE(outcome.err.ends_with(":\n [ 0x00001000 ] [ 0x00001001 ]\nStack:\n FEDCBA98\n"))
            << outcome.err;
    }
    auto const badCode = Crash([&](auto&) { registers[8] = 0x10; });
    EXPECT_TRUE(badCode.status == SIGSEGV && badCode.err.ends_with("\nCode:")) << badCode.err;
    EXPECT_EQ(Crash([](auto&) {}, false).err.find("EIP="), std::string::npos) << "before a session";
}

TEST(Crash, WhileTheMouseMoves)
{
    for (int const place : {0, 1, 2, 3}) {
        auto const outcome = Crash([&](auto& screen) {
            std::thread([&] {
                for (int i = 0;; ++i)
                    screen.MoveMouse(i % 7 - 3, i % 5 - 2);
            }).detach();
            if (place == 1) mouseMutex.lock();
            if (place == 2) screenMutex.lock();  // as while somebody else has the console
            auto const crash = [](GrEvent const&) {
                GrScreenGuard const guard(GrRect{0, 0, 64, 48});
                std::this_thread::sleep_for(std::chrono::milliseconds(30));  // the mouse comes to the locks
                CrashWith(registers.data());
            };
            GrWindow::SetCallback(crash);
            if (place == 3) GrWindow::RootWindow()->Repaint(GrRegion());
            std::this_thread::sleep_for(std::chrono::milliseconds(30));
        });
        EXPECT_EQ(outcome.status, kReported) << place << outcome.err;
    }
}

TEST(Crash, InTheHeapGivesTheConsoleBack)
{
    auto const outcome = Crash([](auto&) { heapIsLocked = true; });
    EXPECT_EQ(outcome.status, kGivenBack);
    EXPECT_NE(outcome.err.find("Stack:"), std::string::npos) << outcome.err;
}

}

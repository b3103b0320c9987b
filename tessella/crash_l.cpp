#include <tessella/crash_l.h>

#include <tessella/keyboard_l.h>
#include <tessella/session.h>

#include <bit>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include <unistd.h>

// The report names the registers of a 32-bit processor. On this one the words hold others (EIP is rdx, EBP
// r12, ESP r13), and the stack lies above the end of memory there, so that a frame and a word are all that is
// usually seen. Those who collect reports know; what they read is not to change.

namespace {

using Word = unsigned long;

/// Where the context that comes with the signal has a register, in words.
enum RegisterWord : unsigned char {
    kEdi = 7,
    kEsi = 8,
    kEbp = 9,
    kEsp = 10,
    kEbx = 11,
    kEdx = 12,
    kEcx = 13,
    kEax = 14,
    kEip = 17,
    kCs = 18,
    kEflags = 19,
    kSs = 21
};

constexpr char kHomeAndClear[] = "\x1B[H\x1B[2J";
constexpr Word kEndOfMemory = 0xBFFFFFFF;
constexpr Word kCodeBytes = 20;
constexpr int kMaxEntries = 32;  // of the backtrace and of the stack

template <typename T>
T ReadAt(Word address)
{
    T value;
    std::memcpy(&value, std::bit_cast<void const*>(address), sizeof value);
    return value;
}

void PrintRegisters(Word const* words)
{
    std::fprintf(stderr, "EIP=0x%08lX\n", words[kEip]);
    std::fprintf(stderr, "EAX=0x%08lX EBX=0x%08lX ECX=0x%08lX EDX=0x%08lX\n", words[kEax], words[kEbx],
        words[kEcx], words[kEdx]);
    std::fprintf(stderr, "EDI=0x%08lX ESI=0x%08lX EBP=0x%08lX ESP=0x%08lX\n", words[kEdi], words[kEsi],
        words[kEbp], words[kEsp]);
    std::fprintf(stderr, "CS=0x%04X SS=0x%04X\n", static_cast<unsigned>(words[kCs] & 0xFFFF),
        static_cast<unsigned>(words[kSs] & 0xFFFF));
    std::fprintf(stderr, "EFLAGS=0x%08lX\n", words[kEflags]);
}

void PrintCode(Word eip)
{
    std::fputs("Code:", stderr);
    for (Word i = 0; i < kCodeBytes; ++i)
        std::fprintf(stderr, " %02X", ReadAt<unsigned char>(eip + i));
    std::fputc('\n', stderr);
}

void PrintBacktrace(Word ebp)
{
    std::fputs("Backtrace:", stderr);
    Word frame = ebp;
    for (int n = 0;; ++n) {
        Word const next = ReadAt<Word>(frame);
        if (n % 5 == 0) std::fputc('\n', stderr);
        std::fprintf(stderr, " [ 0x%08lX ]", ReadAt<Word>(frame + sizeof(Word)));
        if (next > kEndOfMemory || next < ebp || n + 1 == kMaxEntries) break;
        frame = next;
    }
    std::fputc('\n', stderr);
}

void PrintStack(Word esp)
{
    std::fputs("Stack:", stderr);
    Word p = esp;
    for (int n = 0;; ++n) {
        if (n % 8 == 0) std::fputc('\n', stderr);
        std::fprintf(stderr, " %08lX", ReadAt<Word>(p));
        p += sizeof(Word);
        if (p > kEndOfMemory || n + 1 == kMaxEntries) break;
    }
    std::fputc('\n', stderr);
}

/// What the handler was told.
struct {
    siginfo_t const* info;
    void const* context;
} crash;

[[noreturn]] void Report()
{
    auto const* const words = static_cast<Word const*>(crash.context);
    std::fputs(kHomeAndClear, stderr);
    std::fprintf(stderr, "Segmentation fault, addr=0x%08lX\n", std::bit_cast<Word>(crash.info->si_addr));
    PrintRegisters(words);
    PrintCode(words[kEip]);
    PrintBacktrace(words[kEbp]);
    PrintStack(words[kEsp]);
    std::abort();
}

constexpr unsigned kLongestEnd = 2;  // seconds

/// The fault has left a lock taken that the session's end needs, as faults in the heap do.
void OnEndlessEnd(int /*signal*/)
{
    GiveConsoleBackAtOnce();
    Report();
}

/// Gives the session's end a time, none if 0.
void LimitEnd(unsigned seconds)
{
    sigset_t alarms{};
    sigemptyset(&alarms);
    sigaddset(&alarms, SIGALRM);
    if (seconds != 0) std::signal(SIGALRM, OnEndlessEnd);
    pthread_sigmask(SIG_UNBLOCK, &alarms, nullptr);
    alarm(seconds);
}

}

void InstallCrashHandler()
{
    struct sigaction action {};
    action.sa_sigaction = GrCrashHandler;
    action.sa_flags = SA_SIGINFO;
    sigaction(SIGSEGV, &action, nullptr);
}

void GrCrashHandler(int /*signal*/, siginfo_t* info, void* context)
{
    crash = {info, context};
    LimitEnd(kLongestEnd);
    GrDone();
    LimitEnd(0);
    Report();
}

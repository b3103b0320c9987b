#include <common/stack_walk.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <cxxabi.h>
#include <execinfo.h>
#include <memory>

namespace {

struct Free {
    void operator()(void* memory) const { std::free(memory); }
};

constexpr int kMaxFrames = 64;

// Frames that may lie between the caller of WalkStack and the first that backtrace reports: WalkStack
// itself, and the sanitizers' own backtrace.
constexpr int kInnerFrames = 4;

}

void FormatStackLine(char* symbols, std::span<char> line)
{
    char* const open = std::strrchr(symbols, '(');
    char* const plus = std::strrchr(symbols, '+');
    char* const close = std::strrchr(symbols, ')');
    if (open == nullptr || close == nullptr || open > close) {
        std::snprintf(line.data(), line.size(), "%-40s", symbols);
        return;
    }

    // A plus outside the brackets belongs to a path, as in "/opt/c++/program(main) [0x401136]".
    bool const hasOffset = plus > open && plus < close;
    *open = 0;
    *close = 0;
    if (hasOffset) *plus = 0;

    char const* const symbol = open + 1;
    int status = 0;
    std::unique_ptr<char, Free> const demangled(abi::__cxa_demangle(symbol, nullptr, nullptr, &status));
    char const* const name = demangled != nullptr ? demangled.get() : symbol;
    if (hasOffset)
        std::snprintf(
            line.data(), line.size(), "%-30s ( %-40s  + %-6s) %s", symbols, name, plus + 1, close + 1);
    else
        std::snprintf(line.data(), line.size(), "%-30s ( %-40s    %-6s) %s", symbols, name, "", close + 1);
}

// Never inlined: the return address tells which frame is the caller's, whatever lies further in.
[[gnu::noinline]] void WalkStack(int frameCount, StackFrameCallback callback, void* context)
{
    std::array<void*, kMaxFrames + kInnerFrames> addresses;
    int const wanted = std::clamp(frameCount, 0, kMaxFrames);
    int const found = backtrace(addresses.data(), wanted + kInnerFrames);
    auto const end = addresses.begin() + found;
    auto const caller = std::find(addresses.begin(), end, __builtin_return_address(0));
    int const count = std::min(wanted, static_cast<int>(end - caller));
    if (count == 0) return;

    std::unique_ptr<char*, Free> const symbols(backtrace_symbols(&*caller, count));
    if (symbols == nullptr) return;
    std::array<char, kStackLineSize> line;
    for (int frame = 0; frame < count; ++frame) {
        FormatStackLine(symbols.get()[frame], line);
        if (!callback(frame, line.data(), context)) return;
    }
}

#pragma once

#include <span>

/// Gets one frame: its number, its line of text (valid during the call only) and the walk's context.
/// False stops the walk.
using StackFrameCallback = bool (*)(int frame, char const* line, void* context);

/// Most bytes of a frame's line, with the closing 0.
constexpr int kStackLineSize = 4096;

/// Calls back for at most `frameCount` frames, and never more than 64, the innermost first. Frame 0 is the
/// caller of WalkStack. A stack that cannot be read has no frames. From any thread; not for signal handlers,
/// since it allocates.
void WalkStack(int frameCount, StackFrameCallback callback, void* context);

/// Turns a line of backtrace_symbols, "module(symbol+offset) rest", into aligned columns with the symbol
/// demangled. A line without such brackets stays whole. `symbols` is cut up in place; what does not fit
/// into `line` is dropped.
void FormatStackLine(char* symbols, std::span<char> line);

#pragma once

/// Reporting of programming errors. An assertion that fails is written to the log, by default with the
/// call stack, and execution goes on behind it; VELLUM_SAFE_ASSERT in the environment chooses otherwise.
/// All forms are usable as a condition, since the code behind an assertion must be safe even so:
///
///     if (!GR_ASSERT_TEXT(file != nullptr, "file != 0"))
///         return;
///
/// Each source file (or class, in a header) that asserts names its module once:
///
///     static constexpr char kSource[] = GR_SOURCE("tessella/region");
#define GR_SOURCE(module) TESSELLA_BUILD_FOLDER module ".cpp"

/// True if the condition holds; otherwise reports `text` at `line` of the file's module and is false.
#define GR_ASSERT_LINE(condition, text, line)                                                                \
    (static_cast<bool>(condition) || (::AssertFailed(text, kSource, line), false))
#define GR_ASSERT_TEXT(condition, text) GR_ASSERT_LINE(condition, text, __LINE__)
#define GR_ASSERT(condition) GR_ASSERT_TEXT(condition, #condition)

/// Reports a failed assertion, from any thread, and leaves errno alone. The report starts its stack at the
/// caller. 1 if reporting ran, 0 if assertions are off.
int AssertFailed(char const* expression, char const* file, unsigned line);

/// Reports a system call that failed with the error number `error`; `function` may be null.
/// 1 if reporting ran, 0 if assertions are off.
int AssertErrno(int error, char const* file, unsigned line, char const* function);

/// What the forms above have in common: sends `text` (unless null) and, if the settings ask for it, the
/// call stack to the channels that are on, then stops in a debugger or aborts if told to. `expression` is
/// null when no expression is known. The stack leaves out this function and its caller. 1 if reporting ran,
/// 0 if assertions are off.
int ReportFailure(char const* expression, char const* file, unsigned line, char const* text);

/// For code of the library, which does not export it. Called while the "event" channel is on, as (5, 0, 27,
/// text): once with the text of a report and once with its whole stack, on the thread that reports. Null
/// until someone sets it, before other threads may report.
using AssertEventSink = void (*)(int, int, int, char const*);
extern AssertEventSink assertEventSink;

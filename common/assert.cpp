#include <common/assert.h>

#include <common/assert_settings.h>
#include <common/library_path.h>
#include <common/stack_walk.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <unistd.h>

AssertEventSink assertEventSink = nullptr;

namespace {

constexpr int kStackFrames = 32;
constexpr int kReportingFrames = 2;  // ReportFailure, and AssertFailed or AssertErrno

/// Read at the first failure and never changed again.
AssertSettings const& Settings()
{
    static AssertSettings const settings = ReadAssertSettings();
    return settings;
}

void WriteToLog(AssertSettings const& settings, char const* text)
{
    if (settings.logTarget == AssertLogTarget::File) {
        dprintf(settings.logFile, "%s\n", text);
        return;
    }
    std::FILE* const stream = settings.logTarget == AssertLogTarget::Stdout ? stdout : stderr;
    std::fprintf(stream, "%s\n", text);
    std::fflush(stream);  // abort() may follow, and would lose it
}

/// Reporting comes between a failed call and whoever looks at its error number.
class KeepErrno {
public:
    KeepErrno() : number(errno) {}
    ~KeepErrno() { errno = number; }
    KeepErrno(KeepErrno const&) = delete;
    KeepErrno& operator=(KeepErrno const&) = delete;

private:
    int number;
};

void SendToSink(AssertEventSink sink, char const* text) { sink(5, 0, 27, text); }

/// Lines joined by line ends. Lives without exceptions: when memory runs out, further lines are dropped.
class LineBuffer {
public:
    LineBuffer() = default;
    LineBuffer(LineBuffer const&) = delete;
    LineBuffer& operator=(LineBuffer const&) = delete;
    ~LineBuffer() { std::free(text); }

    /// Null while there is no line.
    char const* Text() const { return text; }

    void Add(char const* line)
    {
        std::size_t const lineLength = std::strlen(line);
        std::size_t const needed = length + 1 + lineLength + 1;
        if (needed > capacity) {
            std::size_t const newCapacity = (needed + kStep - 1) / kStep * kStep;
            auto* const grown = static_cast<char*>(std::realloc(text, newCapacity));
            if (grown == nullptr) return;
            text = grown;
            capacity = newCapacity;
        }
        if (length != 0) text[length++] = '\n';
        std::memcpy(text + length, line, lineLength + 1);
        length += lineLength;
    }

private:
    static constexpr std::size_t kStep = 1024;

    char* text = nullptr;
    std::size_t length = 0;
    std::size_t capacity = 0;
};

struct StackReport {
    AssertSettings const& settings;
    AssertEventSink sink;  // null: nobody wants the lines gathered
    LineBuffer lines;
};

bool ReportFrame(int frame, char const* line, void* context)
{
    if (frame < kReportingFrames) return true;
    auto& report = *static_cast<StackReport*>(context);
    if ((report.settings.flags & AssertLog) != 0) WriteToLog(report.settings, line);
    if (report.sink != nullptr) report.lines.Add(line);
    return true;
}

bool DebuggerAttached()
{
    int const status = open("/proc/self/status", O_RDONLY | O_CLOEXEC);
    if (status == -1) return false;
    std::array<char, 1024 + 1> text{};
    ssize_t const length = read(status, text.data(), text.size() - 1);
    close(status);
    if (length <= 0) return false;
    constexpr char kField[] = "TracerPid:";
    char const* const field = std::strstr(text.data(), kField);
    return field != nullptr && std::strtol(field + sizeof kField - 1, nullptr, 10) != 0;
}

}

// The reporting functions are never inlined, and ReportFailure walks the stack itself: the report leaves
// out exactly these two frames, so that its first line is the place that failed.

[[gnu::noinline]] int ReportFailure(
    char const* expression, char const* /*file*/, unsigned /*line*/, char const* text)
{
    KeepErrno const keepErrno;
    AssertSettings const& settings = Settings();
    std::uint64_t const flags = settings.flags;
    if (flags == AssertOff) return 0;

    AssertEventSink const sink = (flags & AssertEvent) != 0 ? assertEventSink : nullptr;
    if (text != nullptr) {
        if ((flags & AssertLog) != 0) WriteToLog(settings, text);
        if (sink != nullptr) SendToSink(sink, text);
    }
    if ((flags & AssertStack) != 0 && (flags & (AssertDebug | AssertLog | AssertEvent)) != 0) {
        StackReport report{settings, sink, {}};
        WalkStack(kStackFrames, ReportFrame, &report);
        if (sink != nullptr && report.lines.Text() != nullptr) SendToSink(sink, report.lines.Text());
    }
    if (((flags & AssertMsgBox) != 0 && expression != nullptr) || (flags & AssertBreak) != 0) {
        if (DebuggerAttached()) std::raise(SIGTRAP);
    }
    if ((flags & AssertAbort) != 0) std::abort();
    return 1;
}

[[gnu::noinline]] int AssertFailed(char const* expression, char const* file, unsigned line)
{
    KeepErrno const keepErrno;
    if (Settings().flags == AssertOff) return 0;  // spares writing a text that nobody reads
    std::array<char, 540> text;
    int const length = std::snprintf(text.data(), text.size(), "Assertion failed: %s, file %s, line %d",
        expression, file, static_cast<int>(line));
    return ReportFailure(expression, file, line, length < 0 ? nullptr : text.data());
}

[[gnu::noinline]] int AssertErrno(int error, char const* file, unsigned line, char const* function)
{
    KeepErrno const keepErrno;
    char const* const path = GetLibraryPath();
    char const* const slash = std::strrchr(path, '/');
    std::array<char, 256> buffer;
    char const* const message = strerror_r(error, buffer.data(), buffer.size());
    std::array<char, 4096> text;
    int const length = std::snprintf(text.data(), text.size(), "%s: %s:%u: %s%sUnexpected error: %s.",
        slash != nullptr ? slash + 1 : path, file, line, function != nullptr ? function : "",
        function != nullptr ? ": " : "", message);
    return ReportFailure(nullptr, file, line, length < 0 ? nullptr : text.data());
}

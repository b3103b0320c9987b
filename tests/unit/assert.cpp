#include <common/assert.h>

#include <common/assert_settings.h>
#include <common/stack_walk.h>
#include <support/child_process.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <gtest/gtest.h>
#include <sys/ptrace.h>
#include <thread>
#include <vector>

namespace {

constexpr char kText[] = "Assertion failed: a == b, file part, line 7\n";
int const logFd = memfd_create("log", 0);
std::string const logPath = "/proc/self/fd/" + std::to_string(logFd);

/// Runs `body` under the given settings in a process of its own, since they are read once per process.
ChildOutcome RunWith(char const* settings, char const* logFile, auto body, auto... parent)
{
    auto const withSettings = [=] {
        clearenv();
        if (settings != nullptr) setenv("VELLUM_SAFE_ASSERT", settings, 1);
        if (logFile != nullptr) setenv("VELLUM_SAFE_ASSERT_LOGFILE", logFile, 1);
        return body();
    };
    return RunChild(withSettings, parent...);
}

[[gnu::always_inline]] inline int Fail() { return AssertFailed("a == b", "part", 7); }
[[gnu::always_inline]] inline int FailCall() { return AssertErrno(ENOENT, "part", 7, nullptr); }

}

// Outside the unnamed namespace and visible, so that stack reports name it. The empty statement keeps the
// call from being the last thing it does, which would take its frame away; the pointer keeps it from being
// cloned.
[[gnu::noinline, gnu::visibility("default")]] int FailingPlace(int depth, bool call)
{
    int result = depth > 0 ? FailingPlace(depth - 1, call) : call ? FailCall() : Fail();
    asm volatile("" : "+r"(result));
    return result;
}
static int (*volatile failingPlace)(int depth, bool call) = FailingPlace;

TEST(Assert, SettingsAreReadFromNumbersAndWords)
{
    // Only 127 characters count: the fifth of "abort" is the last.
    std::string const blanks(122, ' '), last = blanks + "abort none", cut = blanks + " abort";
    std::pair<char const*, std::uint64_t> const cases[] = {{nullptr, 0x4E}, {"", 0x4E}, {"0x24", 0x24},
        {"0X2f", 0x2F}, {"0x0", AssertOff}, {"0x1FFFFFFFFFFFFFFFF", AssertOff}, {"zz0x24", 0x24},
        {" 0x24", AssertOff}, {"10x24", AssertOff}, {"break", 0x01}, {"log", 0x04}, {"event", 0x08},
        {"msgbox", 0x10}, {"abort", 0x20}, {"stack", 0x40}, {"  log   abort log ", 0x24}, {" ", 0},
        {"Log", AssertOff}, {"log none stack", AssertOff}, {last.c_str(), 0x20}, {cut.c_str(), AssertOff}};
    for (auto const& c : cases) {
        auto const read = [&] { return ReadAssertSettings().flags != c.second; };
        EXPECT_EQ(RunWith(c.first, nullptr, read).status, 0) << (c.first ? c.first : "unset");
    }
}

TEST(Assert, ReportGoesWhereTheSettingsSay)
{
    struct {
        char const *value, *logFile;
        char where;  // the report is found: on one of the streams, in the file or nowhere
        int status = 1 << 8;
    } const cases[] = {{"log", nullptr, 'e'}, {"log", "stdout", 'o'}, {"log", "/", 'e'},
        {"log log", logPath.c_str(), 'f'}, {"0x4", logPath.c_str(), 'f'},
        {"log abort", nullptr, 'e', SIGABRT}, {"0x24", "stdout", 'o', SIGABRT},
        {"abort", nullptr, '-', SIGABRT}, {"abort none log", nullptr, '-', 0}, {"debug stack", nullptr, '-'},
        {"event stack", nullptr, '-'}};
    for (auto const& c : cases) {
        ASSERT_EQ(ftruncate(logFd, 0) + pwrite(logFd, "before\n", 7, 0), 7);
        ChildOutcome const outcome = RunWith(c.value, c.logFile, Fail);
        EXPECT_EQ(outcome.out, c.where == 'o' ? kText : "") << c.value;
        EXPECT_EQ(outcome.err, c.where == 'e' ? kText : "") << c.value;
        EXPECT_EQ(ReadAll(logFd), std::string("before\n") + (c.where == 'f' ? kText : "")) << c.value;
        EXPECT_EQ(outcome.status, c.status) << c.value;
    }
}

TEST(Assert, TextsAreFormattedAndCut)
{
    std::string const longText(5000, 'x');
    auto const fail = [&] {
        AssertFailed(nullptr, nullptr, 4000000000U);
        AssertFailed(longText.c_str(), "part", 7);
        AssertErrno(ENOENT, "part", 4000000000U, nullptr);
        AssertErrno(12345, "part", 7, "open");
        AssertErrno(ENOENT, "part", 7, longText.c_str());
        setenv("VELLUM_SAFE_ASSERT", "none", 1);  // too late
        return ReportFailure("a == b", "part", 7, nullptr) + Fail();
    };
    EXPECT_EQ(RunWith("log", "stdout", fail).out,
        "Assertion failed: (null), file (null), line -294967296\nAssertion failed: " +
            longText.substr(0, 539 - 18) +
            "\nassert_test: part:4000000000: Unexpected error: No such file or directory.\n"
            "assert_test: part:7: open: Unexpected error: Unknown error 12345.\nassert_test: part:7: " +
            longText.substr(0, 4095 - 21) + "\n" + kText);
}

TEST(Assert, StackStartsAtTheFailingPlaceAndErrnoIsLeftAlone)
{
    for (char const* const settings : {"", "log"})
        for (bool const call : {false, true}) {
            ChildOutcome const outcome = RunWith(settings, "/dev/full", [=] {
                errno = EDOM;
                return failingPlace(0, call) == 1 ? errno : 0;
            });
            EXPECT_EQ(WEXITSTATUS(outcome.status), EDOM);
            std::string const stack = outcome.err.substr(outcome.err.find('\n') + 1);
            EXPECT_EQ(stack.find(" ( FailingPlace(int, bool)") < stack.find('\n'), *settings == 0) << stack;
        }
}

TEST(Assert, SinkGetsTheTextAndThenTheWholeStack)
{
    auto const [out, err, status] = RunWith("event log stack", nullptr, [] {
        assertEventSink = [](int a, int b, int c, auto s) { std::printf("<%d %d %d>\n%s\n", a, b, c, s); };
        return failingPlace(40, false) + ReportFailure(nullptr, nullptr, 0, "alone");
    });
    std::string const mark = "<5 0 27>\n";
    auto const stack = err.find('\n') + 1, alone = err.find("alone\n"), rest = alone + 6;
    EXPECT_EQ(out,
        mark + kText + mark + err.substr(stack, alone - stack) + mark + "alone\n" + mark + err.substr(rest));
    // 32 frames are walked, of which two are the reporting functions'.
    EXPECT_EQ(std::count(err.begin(), err.begin() + static_cast<long>(alone), '\n'), 31);
}

TEST(Assert, TrapsOnlyForADebugger)
{
    struct {
        char const* value;
        int (*fail)();
        std::vector<int> stops;
    } const cases[] = {{"break", Fail, {SIGTRAP}}, {"break", FailCall, {SIGTRAP}},
        {"msgbox", Fail, {SIGTRAP}}, {"msgbox", FailCall, {}},
        {"break msgbox abort", Fail, {SIGTRAP, SIGABRT}}, {"debug", Fail, {}}};
    for (auto const& c : cases) {
        std::vector<int> stops;
        auto const debug = [&](pid_t child) {
            for (int status = 0; waitpid(child, &status, 0) == child && WIFSTOPPED(status);) {
                stops.push_back(WSTOPSIG(status));
                ptrace(PTRACE_CONT, child, nullptr, WSTOPSIG(status) == SIGTRAP ? 0 : WSTOPSIG(status));
            }
            return 0;
        };
        auto const fail = [&] { return ptrace(PTRACE_TRACEME, 0, nullptr, nullptr) == 0 ? c.fail() : 99; };
        RunWith(c.value, nullptr, fail, debug);
        EXPECT_EQ(stops, c.stops) << c.value;
    }
}

TEST(Assert, ThreadsShareOneLogFile)
{
    ASSERT_EQ(ftruncate(logFd, 0), 0);
    RunWith("log", logPath.c_str(), [] {
        std::vector<std::jthread> threads;
        while (threads.size() < 8)
            threads.emplace_back([] { return Fail() + Fail() + Fail() + Fail() + Fail(); });
        return 0;
    });
    EXPECT_EQ(ReadAll(logFd).size(), 8 * 5 * (sizeof kText - 1));
}

TEST(Stack, LineIsCutIntoColumnsAtTheLastMarksAndToItsBuffer)
{
    auto const line = [](char const* module, char const* name, char const* offset, char const* rest) {
        char text[4096];
        std::snprintf(
            text, sizeof text, "%-30s ( %-40s  %c %-6s) %s", module, name, *offset ? '+' : ' ', offset, rest);
        return std::string(text);
    };
    std::string const name(5000, 'f');
    std::pair<std::string, std::string> const cases[] = {
        {"lib.so(_Z3foov+0x123456789) [0x55]", line("lib.so", "foo()", "0x123456789", " [0x55]")},
        {"a(b)(_Zbad)c", line("a(b)", "_Zbad", "", "c")}, {"(a+b+c)", line("", "a+b", "c", "")},
        {"/c++/prog(main) + 3", line("/c++/prog", "main", "", " + 3")},
        {"m(" + name + "+0x1) [0x2]", line("m", name.c_str(), "0x1", " [0x2]")}, {name, name.substr(0, 4095)},
        {"prog(main", "prog(main" + std::string(31, ' ')}, {"a(b)c(", "a(b)c(" + std::string(34, ' ')}};
    for (auto [symbols, expected] : cases) {
        char text[kStackLineSize];
        FormatStackLine(symbols.data(), text);
        EXPECT_EQ(text, expected);
    }
}

// The loader tells a program's file by its first argument, whatever that says.
TEST(LibraryPath, ComesFromTheLoaderOrElseFromTheProgram)
{
    std::string const program = ASSERT_PATH_PROBE, longest(4094, 'x');
    std::string const cases[][3] = {{"/usr", "/x//y/../lib", "/x/lib"},
        {"/usr", "x/./../y/..z/.../", "/usr/y/..z/..."}, {"/usr/lib", "../../../y", "/y"},
        {"/usr", "../", "/"}, {"/", "./y", "/y"}, {"/usr", "plain", program},
        {"/usr", '/' + longest, '/' + longest}, {"/usr", "/x" + longest, program}};
    for (auto const& c : cases) {
        auto const run = [&] {
            return chdir(c[0].data()) == 0 ? execl(program.data(), c[1].data(), nullptr) : 99;
        };
        EXPECT_EQ(RunChild(run).out, c[2]);
    }
}

#include <common/assert.h>

#include "assert_child.h"
#include <common/assert_settings.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>
#include <sys/ptrace.h>
#include <thread>
#include <vector>

namespace {

constexpr auto kOff = static_cast<std::uint64_t>(AssertOff);
constexpr auto kOut = AssertLogTarget::Stdout;
constexpr auto kErr = AssertLogTarget::Stderr;
constexpr auto kFile = AssertLogTarget::File;

std::string LogPath() { return testing::TempDir() + "assert_" + std::to_string(getpid()) + ".log"; }

std::string Contents(std::string const& path)
{
    std::ostringstream text;
    text << std::ifstream(path).rdbuf();
    return text.str();
}

std::vector<std::string> Lines(std::string const& text)
{
    std::vector<std::string> lines;
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);)
        lines.push_back(line);
    return lines;
}

int FailOnce() { return AssertFailed("a == b", "part", 7); }
constexpr char kFailOnceText[] = "Assertion failed: a == b, file part, line 7\n";

}

// Outside the unnamed namespace and visible, so that stack reports name them. The empty statements keep the
// calls from being the last thing these functions do, which would take their frames away.
#define KEEP_FRAME(result) asm volatile("" : "+r"(result))

[[gnu::noinline, gnu::visibility("default")]] int FailingPlace()
{
    int result = AssertFailed("a == b", "part", 7);
    KEEP_FRAME(result);
    return result;
}

[[gnu::noinline, gnu::visibility("default")]] int FailingCall()
{
    int result = AssertErrno(ENOENT, "part", 7, nullptr);
    KEEP_FRAME(result);
    return result;
}

[[gnu::noinline, gnu::visibility("default")]] int FailingDeepDown(int depth)
{
    int result = depth > 0 ? FailingDeepDown(depth - 1) : FailingPlace();
    KEEP_FRAME(result);
    return result;
}

TEST(AssertSettings, AreReadFromNumbersAndWords)
{
    std::string const blanks(122, ' ');
    struct {
        char const* value;
        std::uint64_t flags;
    } const cases[] = {{nullptr, 0x4E}, {"", 0x4E}, {"0x24", 0x24}, {"0X2f", 0x2F}, {"24", 0x24},
        {"add", 0xADD}, {"0x0", kOff}, {"0", kOff}, {"0x", kOff}, {"0x24 ", kOff}, {"0x24g", kOff},
        {"-1", kOff}, {"0xFFFFFFFFFFFFFFFF", kOff}, {"0x1FFFFFFFFFFFFFFFF", kOff}, {"zz24", kOff},
        {"zz0x24", 0x24}, {" 24", 0x24}, {" 0x24", kOff}, {"10x24", kOff}, {"log 0x24", kOff},
        {"break", 0x01}, {"debug", 0x02}, {"log", 0x04}, {"event", 0x08}, {"msgbox", 0x10}, {"abort", 0x20},
        {"stack", 0x40}, {"  log   abort log ", 0x24}, {" ", 0}, {"none", kOff}, {"Log", kOff},
        {"log,abort", kOff}, {"log none stack", kOff}};
    unsetenv("VELLUM_SAFE_ASSERT_LOGFILE");
    auto const flagsOf = [](char const* value) {
        SetVariable("VELLUM_SAFE_ASSERT", value);
        return ReadAssertSettings().flags;
    };
    for (auto const& c : cases)
        EXPECT_EQ(flagsOf(c.value), c.flags) << '"' << (c.value != nullptr ? c.value : "(unset)") << '"';
    // Only 127 characters count: the fifth of "abort" is the last.
    EXPECT_EQ(flagsOf((blanks + "abort none").c_str()), 0x20U);
    EXPECT_EQ(flagsOf((blanks + " abort").c_str()), kOff);
    EXPECT_EQ(flagsOf((blanks + "     none").c_str()), 0U);
    unsetenv("VELLUM_SAFE_ASSERT");
}

TEST(AssertSettings, LogTargetIsReadOnlyForTheLog)
{
    std::string const path = LogPath();
    struct {
        char const* value;
        char const* logFile;
        AssertLogTarget target;
    } const cases[] = {{"log", nullptr, kErr}, {"log", "stdout", kOut}, {"log", "stderr", kErr},
        {"log", "", kErr}, {"log", "/nowhere/at/all", kErr}, {"log", "/", kErr}, {"0x20", "stdout", kErr},
        {"abort", "stdout", kErr}, {nullptr, "stdout", kErr}, {"0x24", "stdout", kOut},
        {"stack log log", path.c_str(), kFile}, {"none log", path.c_str(), kFile},
        {"0x4", path.c_str(), kFile}};
    for (auto const& c : cases) {
        SetVariable("VELLUM_SAFE_ASSERT", c.value);
        SetVariable("VELLUM_SAFE_ASSERT_LOGFILE", c.logFile);
        AssertSettings const settings = ReadAssertSettings();
        EXPECT_EQ(settings.logTarget, c.target) << c.logFile;
        EXPECT_EQ(settings.logFile != -1, c.target == kFile) << c.logFile;
        if (settings.logFile != -1) close(settings.logFile);
    }
    unsetenv("VELLUM_SAFE_ASSERT");
    unsetenv("VELLUM_SAFE_ASSERT_LOGFILE");
    unlink(path.c_str());
}

TEST(AssertReport, GoesWhereTheSettingsSay)
{
    std::string const path = LogPath();
    struct {
        char const* value;
        char const* logFile;
        std::string out, err, file;
        int result, signal;
    } const cases[] = {{"log", nullptr, "", kFailOnceText, "", 1, 0},
        {"log", "stdout", kFailOnceText, "", "", 1, 0}, {"log", path.c_str(), "", "", kFailOnceText, 1, 0},
        {"log abort", nullptr, "", kFailOnceText, "", 0, SIGABRT},
        {"log abort", "stdout", kFailOnceText, "", "", 0, SIGABRT},
        {"0x24", path.c_str(), "", "", kFailOnceText, 0, SIGABRT}, {"abort", nullptr, "", "", "", 0, SIGABRT},
        {"none", nullptr, "", "", "", 0, 0}, {"abort none", nullptr, "", "", "", 0, 0},
        {"stack", nullptr, "", "", "", 1, 0}, {"debug stack", nullptr, "", "", "", 1, 0},
        {"event stack", nullptr, "", "", "", 1, 0}, {"break msgbox", nullptr, "", "", "", 1, 0}};
    for (auto const& c : cases) {
        SCOPED_TRACE(c.value);
        std::ofstream(path) << "before\n";
        ChildOutcome const outcome = RunChild(c.value, c.logFile, FailOnce);
        EXPECT_EQ(outcome.out, c.out);
        EXPECT_EQ(outcome.err, c.err);
        EXPECT_EQ(Contents(path), "before\n" + c.file);
        EXPECT_EQ(WIFSIGNALED(outcome.status) ? WTERMSIG(outcome.status) : 0, c.signal);
        EXPECT_EQ(WIFEXITED(outcome.status) ? WEXITSTATUS(outcome.status) : 0, c.result);
    }
    unlink(path.c_str());
}

TEST(AssertReport, TextsAreFormattedAndCut)
{
    std::string const longText(5000, 'x');
    ChildOutcome const outcome = RunChild("log", "stdout", [&] {
        AssertFailed(nullptr, nullptr, 4000000000U);
        AssertFailed(longText.c_str(), "part", 7);
        AssertErrno(ENOENT, "part", 4000000000U, nullptr);
        AssertErrno(12345, "part", 7, "open");
        AssertErrno(ENOENT, "part", 7, longText.c_str());
        ReportFailure("a == b", "part", 7, nullptr);
        setenv("VELLUM_SAFE_ASSERT", "none", 1);  // too late
        return FailOnce() == 1 ? 0 : 1;
    });
    std::vector<std::string> const expected = {
        "Assertion failed: (null), file (null), line -294967296",
        "Assertion failed: " + std::string(539 - 18, 'x'),
        "assert_test: part:4000000000: Unexpected error: No such file or directory.",
        "assert_test: part:7: open: Unexpected error: Unknown error 12345.",
        "assert_test: part:7: " + std::string(4095 - 21, 'x'),
        "Assertion failed: a == b, file part, line 7",
    };
    EXPECT_EQ(Lines(outcome.out), expected);
    EXPECT_EQ(outcome.status, 0);
}

TEST(AssertReport, LeavesErrnoAlone)
{
    for (char const* const settings : {"log", "none log"})
        for (char const* const logFile : {"/dev/full", "/nowhere/at/all"}) {
            ChildOutcome const outcome = RunChild(settings, logFile, [] {
                errno = EDOM;
                AssertErrno(ENOENT, "part", 7, nullptr);
                FailOnce();
                return errno == EDOM ? 0 : 1;
            });
            EXPECT_EQ(outcome.status, 0) << settings << ' ' << logFile;
        }
}

TEST(AssertReport, StackStartsAtTheFailingPlace)
{
    for (auto const& [fail, name] :
        {std::pair{&FailingPlace, "FailingPlace()"}, std::pair{&FailingCall, "FailingCall()"}}) {
        ChildOutcome const outcome = RunChild(nullptr, nullptr, fail);
        std::vector<std::string> const lines = Lines(outcome.err);
        ASSERT_GT(lines.size(), 3U) << outcome.err;
        EXPECT_NE(lines[1].find(std::string(" ( ") + name + "   "), std::string::npos) << lines[1];
        EXPECT_EQ(outcome.err.find(name), outcome.err.rfind(name));
        EXPECT_EQ(WEXITSTATUS(outcome.status), 1);
    }
}

TEST(AssertReport, SinkGetsTheTextAndThenTheWholeStack)
{
    ChildOutcome const outcome = RunChild("event log stack", nullptr, [] {
        assertEventSink = [](int a, int b, int c, char const* text) {
            std::printf("<%d %d %d>\n%s\n", a, b, c, text);
        };
        return FailingDeepDown(40) + ReportFailure(nullptr, nullptr, 0, "alone");
    });
    EXPECT_EQ(WEXITSTATUS(outcome.status), 2);
    // 32 frames are walked, and two of them are the reporting functions; the second report is shallow.
    std::vector<std::string> const logged = Lines(outcome.err);
    ASSERT_GT(logged.size(), 31U + 1);
    EXPECT_EQ(logged[31], "alone");
    std::string expected;
    for (std::size_t i = 0; i < logged.size(); ++i)
        expected += (i <= 1 || i == 31 || i == 32 ? "<5 0 27>\n" : "") + logged[i] + '\n';
    EXPECT_EQ(outcome.out, expected);
    for (std::size_t i = 2; i < 31; ++i)
        EXPECT_NE(logged[i].find("FailingDeepDown(int)"), std::string::npos) << logged[i];
}

TEST(AssertReport, TrapsOnlyForADebugger)
{
    struct {
        char const* value;
        int (*fail)();
        std::vector<int> stops;
    } const cases[] = {{"break", FailOnce, {SIGTRAP}},
        {"break", [] { return AssertErrno(EIO, "part", 7, nullptr); }, {SIGTRAP}},
        {"msgbox", FailOnce, {SIGTRAP}}, {"msgbox", [] { return AssertErrno(EIO, "part", 7, nullptr); }, {}},
        {"break msgbox abort", FailOnce, {SIGTRAP, SIGABRT}}, {"debug", FailOnce, {}}};
    for (auto const& c : cases) {
        std::vector<int> stops;
        ChildOutcome const outcome = RunChild(
            c.value, nullptr,
            [&] { return ptrace(PTRACE_TRACEME, 0, nullptr, nullptr) == 0 ? c.fail() : 99; },
            [&](pid_t child) {
                int status = -1;
                while (waitpid(child, &status, 0) == child && WIFSTOPPED(status)) {
                    stops.push_back(WSTOPSIG(status));
                    int const passed = WSTOPSIG(status) == SIGTRAP ? 0 : WSTOPSIG(status);
                    ptrace(PTRACE_CONT, child, nullptr, passed);
                }
                return status;
            });
        EXPECT_EQ(stops, c.stops) << c.value;
        EXPECT_TRUE(c.stops.size() < 2 ? WEXITSTATUS(outcome.status) == 1 : WIFSIGNALED(outcome.status));
    }
}

TEST(AssertReport, ThreadsShareOneLogFile)
{
    std::string const path = LogPath();
    ChildOutcome const outcome = RunChild("log", path.c_str(), [] {
        std::array<std::jthread, 8> threads;
        for (std::jthread& thread : threads)
            thread = std::jthread([] {
                for (int n = 0; n < 50; ++n)
                    FailOnce();
            });
        threads = {};
        return 0;
    });
    std::string expected;
    for (int i = 0; i < 8 * 50; ++i)
        expected += kFailOnceText;
    EXPECT_EQ(Contents(path), expected);
    EXPECT_EQ(outcome.status, 0);
    unlink(path.c_str());
}

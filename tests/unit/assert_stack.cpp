#include <common/stack_walk.h>

#include "assert_child.h"
#include <common/library_path.h>

#include <array>
#include <gtest/gtest.h>
#include <vector>

namespace {

std::string Formatted(std::string symbols, std::size_t size = kStackLineSize)
{
    std::vector<char> line(size);
    FormatStackLine(symbols.data(), line);
    return line.data();
}

std::string Padded(std::string text, std::size_t width)
{
    return text.append(width - std::min(width, text.size()), ' ');
}

std::string Bracketed(char const* module, char const* name, char const* offset, char const* rest)
{
    return Padded(module, 30) + " ( " + Padded(name, 40) + (*offset != 0 ? "  + " : "    ") +
        Padded(offset, 6) + ") " + rest;
}

std::string Normalized(char const* base, char const* name, std::size_t size = 64)
{
    std::vector<char> path(size);
    std::copy_n(base, std::string_view(base).size(), path.begin());
    return NormalizePath(path, name) ? path.data() : "too long";
}

struct Walk {
    std::vector<std::string> lines;
    std::size_t stopAt;
};

bool Collect(int frame, char const* line, void* context)
{
    Walk& walk = *static_cast<Walk*>(context);
    EXPECT_EQ(frame, static_cast<int>(walk.lines.size()));
    walk.lines.emplace_back(line);
    return walk.lines.size() < walk.stopAt;
}

}

[[gnu::noinline, gnu::visibility("default")]] std::vector<std::string> WalkFromHere(
    int frameCount, std::size_t stopAt)
{
    Walk walk{{}, stopAt};
    WalkStack(frameCount, Collect, &walk);
    return walk.lines;
}

TEST(StackLine, IsCutIntoColumnsAtTheLastMarks)
{
    EXPECT_EQ(Formatted("lib.so(_Z3foov+0x1a) [0x55]"), Bracketed("lib.so", "foo()", "0x1a", " [0x55]"));
    EXPECT_EQ(
        Formatted("lib.so(main+0x123456789) [0x55]"), Bracketed("lib.so", "main", "0x123456789", " [0x55]"));
    EXPECT_EQ(Formatted("lib.so(+0x1a) [0x55]"), Bracketed("lib.so", "", "0x1a", " [0x55]"));
    EXPECT_EQ(Formatted("lib.so() [0x55]"), Bracketed("lib.so", "", "", " [0x55]"));
    EXPECT_EQ(Formatted("a(b)(_Zbad)c"), Bracketed("a(b)", "_Zbad", "", "c"));
    EXPECT_EQ(Formatted("(a+b+c)"), Bracketed("", "a+b", "c", ""));
    EXPECT_EQ(Formatted("/c++/prog(main) [0x55]"), Bracketed("/c++/prog", "main", "", " [0x55]"));
    EXPECT_EQ(Formatted("prog(main) + 3"), Bracketed("prog", "main", "", " + 3"));
    for (char const* whole : {"", "[0x55]", "prog(main", "prog)main(", "a+b)c", "a(b)c("})
        EXPECT_EQ(Formatted(whole), Padded(whole, 40));
}

TEST(StackLine, IsCutToItsBuffer)
{
    std::string const name(5000, 'f');
    EXPECT_EQ(Formatted(name), name.substr(0, 4095));
    EXPECT_EQ(Formatted("m(" + name + "+0x1) [0x2]"), (Padded("m", 30) + " ( " + name).substr(0, 4095));
    EXPECT_EQ(Formatted("m(f+0x1)", 3), "m ");
}

TEST(StackWalk, NumbersFramesFromItsCallerUntilStopped)
{
    std::size_t const all = 1000;
    std::vector<std::string> const lines = WalkFromHere(5, all);
    ASSERT_EQ(lines.size(), 5U);
    EXPECT_NE(lines[0].find("WalkFromHere"), std::string::npos) << lines[0];
    EXPECT_EQ(WalkFromHere(5, 2).size(), 2U);
    EXPECT_EQ(WalkFromHere(1, all).size(), 1U);
    EXPECT_EQ(WalkFromHere(0, all).size(), 0U);
    EXPECT_EQ(WalkFromHere(-1, all).size(), 0U);
}

TEST(LibraryPath, IsNormalisedByText)
{
    EXPECT_EQ(Normalized("/a/b", "c"), "/a/b/c");
    EXPECT_EQ(Normalized("/a/b", ".//../c/./d/"), "/a/c/d");
    EXPECT_EQ(Normalized("/a/b", "../../../c"), "/c");
    EXPECT_EQ(Normalized("/a/b", "/c/..d/.../x/../e"), "/c/..d/.../e");
    EXPECT_EQ(Normalized("/a/b", "../.."), "/");
    EXPECT_EQ(Normalized("/", "c"), "/c");
    EXPECT_EQ(Normalized("", "c/.."), "/");
    EXPECT_EQ(Normalized("/abc", "def", 9), "/abc/def");
    EXPECT_EQ(Normalized("/abc", "def", 8), "too long");
}

// The loader tells a program's file by its first argument, whatever that says.
TEST(LibraryPath, ComesFromTheLoaderOrElseFromTheProgram)
{
    std::string const program = ASSERT_PATH_PROBE;
    auto const pathWith = [&](char const* folder, std::string argument) {
        return RunChild(nullptr, nullptr, [&] {
            if (folder == nullptr) {
                char gone[] = "/tmp/tessella-gone-XXXXXX";
                if (mkdtemp(gone) == nullptr || chdir(gone) != 0 || rmdir(gone) != 0) return 98;
            } else if (chdir(folder) != 0) {
                return 98;
            }
            execl(program.c_str(), argument.c_str(), nullptr);
            return 99;
        }).out;
    };
    EXPECT_EQ(pathWith("/usr", "/x//y/../lib"), "/x/lib");
    EXPECT_EQ(pathWith("/usr", "x/./../y"), "/usr/y");
    EXPECT_EQ(pathWith("/", "./y"), "/y");
    EXPECT_EQ(pathWith("/usr", "plain"), program);
    EXPECT_EQ(pathWith(nullptr, "./y"), program);
    EXPECT_EQ(pathWith("/usr", '/' + std::string(4094, 'x')), '/' + std::string(4094, 'x'));
    EXPECT_EQ(pathWith("/usr", '/' + std::string(4095, 'x')), program);
}

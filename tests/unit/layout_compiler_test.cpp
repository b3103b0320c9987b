#include <support/child_process.h>
#include <support/layout_file.h>

#include <gtest/gtest.h>

#include <filesystem>

namespace {

/// What the compiler says, on both streams, about these words and the text a.layout, with b.layout beside it.
ChildOutcome Compile(std::string const& text, std::string const& words, Bytes* output = nullptr)
{
    auto const folder = testing::TempDir() + "tessella-layouts-" + std::to_string(getpid());
    std::filesystem::create_directory(folder);
    std::ofstream(folder + "/a.layout") << text;
    std::ofstream(folder + "/b.layout") << "name B\nkey 2 2 sign 2 @\ndead x\n";
    auto const command = "cd " + folder + " && " LAYOUT_COMPILER " " + words + " 2>&1";
    auto outcome = RunChild([&] { return execl("/bin/sh", "sh", "-c", command.c_str(), nullptr); });
    outcome.status = WEXITSTATUS(outcome.status);
    if (output != nullptr) *output = ReadBytes(folder + "/out");
    std::filesystem::remove_all(folder);
    return outcome;
}

TEST(LayoutCompiler, FileLooksByteForByteLikeThis)
{
    Bytes output;
    auto const outcome = Compile(
        "name AB // shown to users\nbase b.layout\n\nkey 127 0xFF67 caps a A ä U+20AC altgr-caps none //\n"
        "key 71 0x7F95 pad 7 0x7FB7\nkey 57 0x20 always U+0020\ndead ^ a â\ndead ´\ndead ^ A Â\r\n",
        "--output out a.layout b.layout", &output);
    ASSERT_EQ(outcome.status, 0) << outcome.out;

    Bytes expected(4660 + 44);
    auto const put = [&](std::size_t at, std::initializer_list<unsigned> words) {
        for (unsigned const word : words) {
            expected[at++] = static_cast<unsigned char>(word);
            expected[at++] = static_cast<unsigned char>(word >> 8);
        }
    };
    put(0, {2, 0, 'A', 'B'});
    put(20 + 2 * 18, {'2', '2', '@', '2', '@'});
    put(20 + 57 * 18, {' ', ' ', ' ', ' ', ' ', 1});
    put(20 + 71 * 18, {0x7F95, 0, 0, 0, 0, 4, '7', 0x7FB7, 0});
    put(20 + 127 * 18, {0xFF67, 'a', 'A', 0xE4, 0x20AC, 1, 0, 0, 1, 2, 0, 4660, 0});
    put(2332, {'B'});
    put(2332 + 16 + 2 * 18, {'2', '2', '@', '2', '@'});
    put(2332 + 2320, {1, 0, 4660 + 32, 0});
    put(4660, {20, 0, '^', 0, 2, 0, 'a', 0xE2, 'A', 0xC2, 12, 0, 0xB4, 0, 0, 0, 12, 0, 'x', 0, 0, 0});
    EXPECT_EQ(output, expected);
}

TEST(LayoutCompiler, WhatIsWrongIsToldWithItsLine)
{
    std::string const name = "name A\n";
    std::string manyDeadKeys = name;
    for (int i = 1000; i < 1128; ++i)
        manyDeadKeys += "dead U+" + std::to_string(i) + "\n";
    std::pair<std::string, char const*> const texts[] = {{"", "a.layout: the layout has no name"},
        {"\nnames A", "a.layout:2: 'names' begins no line"}, {name + "name B", "2: the layout has a name"},
        {"name ABCDEFGH", "1: a name has 7"}, {"name ß", "1: a name is made of ASCII"},
        {"name", "1: the line ends too early"}, {"name A B", "1: 'B' is one word too many"},
        {name + "key 128 a", "2: key codes end at 127"}, {name + "key 1x a", "2: '1x' is no number"},
        {name + "key 1 ä", "2: 'ä' is no virtual key"}, {name + "key 1 0x1FFFF", "no virtual key code"},
        {name + "key 1 a\nkey 1 b", "3: key 1 is here already"}, {name + "key 1 a big A", "'big' is no kind"},
        {name + "key 1 a always \xC1\xA1", "no character"},
        {name + "key 1 a always \xF0\x9F\x98\x80", "no ch"},
        {name + "key 1 a always \xED\xA0\x80", "no character"}, {name + "key 1 a always U+", "no character"},
        {name + "key 1 a always ab", "'ab' is no character"},
        {name + "key 1 a always b alt c", "'alt' is not"},
        {name + "base b.layout\nbase b.layout", "3: the base stands"},
        {name + "key 1 a\nbase b.layout", "3: the base stands"}, {name + "base a.layout", "2: the base of"},
        {name + "base x.layout", "x.layout: cannot be opened"}, {name + "base .", ".: cannot be read"},
        {name + "dead ^ a b a c", "2: the dead key has a pair for 'a'"},
        {manyDeadKeys, "129: a layout has 127"}};
    for (auto const& [text, problem] : texts) {
        auto const outcome = Compile(text, "--output out a.layout");
        EXPECT_EQ(outcome.status, 1) << text;
        EXPECT_NE(outcome.out.find(problem), std::string::npos) << text << "\n" << outcome.out;
    }
    for (auto const& [words, status, problem] :
        {std::tuple{"b.layout", 2, "--output is missing"}, {"--output", 2, "needs the name"},
            {"--output out", 2, "no layout is given"}, {"--colour", 2, "unknown option '--colour'"},
            {"--output . b.layout", 1, ".: cannot be written: Is"},
            {"--output /dev/full b.layout", 1, "/dev/full: cannot be written: No space"}}) {
        auto const outcome = Compile("", words);
        EXPECT_EQ(outcome.status, status) << words;
        EXPECT_NE(outcome.out.find(problem), std::string::npos) << outcome.out;
    }
}

}

#include <console/script.h>

#include <gtest/gtest.h>

#include <array>
#include <random>

using namespace console;

namespace {

/// The steps, or what is wrong.
std::string Steps(std::string const& text)
{
    auto const parsed = ParseScript(text, "s");
    auto const* const script = std::get_if<Script>(&parsed);
    return script ? PrintSteps(*script) : std::get<std::string>(parsed);
}

TEST(Script, CommandsComeDownToSteps)
{
    EXPECT_EQ(
        Steps("# nothing\r\n\n\tmove  -127 127 3 0 # far\nclick\npress middle\nclick right\nrelease middle\n"
              "wheel up 2\nwheel down\nkeys e 8E ff\ntype ctrl-alt-f2 a\nwait 7\nsettle\nsettle 0 5\n"
              "screenshot a#.png\nexpect b\nexpect c 9\nswitch 63\nquit"),
        "move -127 127\nmove 3 0\npress left\nrelease left\npress middle\npress right\nrelease "
        "right\nrelease middle\n"
        "wheel up\nwheel up\nwheel down\nkeys 0e\nkeys 8e\nkeys ff\nkeys 1d\nkeys 38\nkeys 3c\nkeys bc\nkeys "
        "b8\n"
        "keys 9d\nkeys 1e\nkeys 9e\nwait 7\nsettle 200 10000\nsettle 0 5\nscreenshot a#.png\nexpect b "
        "2000\nexpect c 9\nswitch "
        "63\nquit\n");
}

TEST(Script, ProblemsNameTheirLine)
{
    for (auto const& [text, problem] :
        std::initializer_list<std::pair<char const*, char const*>>{
            {"\nmov 1 1", "s:2: unknown command 'mov'"}, {"move 1", "s:1: the command is 'move DX DY...'"},
            {"move 1 2 3", "s:1: each move is two numbers"},
            {"move 128 0", "s:1: a move is two numbers from -127 to 127"}, {"move 0 0", "s:1: a move of 0 0"},
            {"click\npress left\n#\nclick", "s:4: the left button is down already"},
            {"release right", "s:1: the right button is up already"},
            {"press up", "s:1: 'up' isn't a button"}, {"wheel left", "s:1: the wheel goes up or down"},
            {"wheel up 1001", "s:1: the wheel goes 1 to"}, {"keys 1e 100", "s:1: '100' isn't a byte"},
            {"type a b-", "s:1: 'b-' isn't a key"}, {"wait 1s", "s:1: the time '1s' isn't"},
            {"settle 9 8", "s:1: the screen cannot be quiet"}, {"switch 64", "s:1: there is no console '64'"},
            {"quit\n\nquit", "s:3: a command after 'quit'"}, {"\x1B[2J\xFF", "s:1: unknown command '?[2J?'"}})
        EXPECT_TRUE(Steps(text).starts_with(problem)) << Steps(text);
}

TEST(Script, AnyTextHasStepsThatStandForThemselvesOrAProblem)
{
    constexpr std::array words = {"move", "press", "release", "click", "wheel", "keys", "type", "settle",
        "left", "middle", "up", "1", "-5", "7f", "a", "ctrl-b", "\n", "\n", "\n", "#", "-", "\xC3",
        "4294967296", "\r"};
    std::mt19937 random(5);
    int scripts = 0;
    for (int round = 0; round < 100000; ++round) {
        std::string text;
        for (auto left = random() % 8; left > 0; --left)
            text.append(words[random() % words.size()]).append(random() % 8, ' ');
        auto const steps = Steps(text);
        if (steps.starts_with("s:")) continue;
        scripts += steps.empty() ? 0 : 1;
        ASSERT_EQ(Steps(steps), steps) << text;
    }
    EXPECT_GT(scripts, 1000);
}

}

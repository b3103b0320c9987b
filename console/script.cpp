#include <console/script.h>

#include <console/owned.h>
#include <console/script_keys.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <cstdio>
#include <optional>
#include <span>
#include <system_error>
#include <utility>

#include <fcntl.h>
#include <unistd.h>

namespace console {

namespace {

using Problem = std::string;
using Words = std::span<std::string_view const>;
using std::chrono::milliseconds;

constexpr int kFarthest = 127;              // what a packet of the mouse carries, in each direction
constexpr unsigned kMostNotches = 1000;     // of the wheel, in one command
constexpr unsigned kLongestTime = 3600000;  // an hour, in milliseconds
constexpr unsigned kLastConsole = 63;       // the kernel has no more
constexpr std::array<std::string_view, 3> kButtons = {"left", "right", "middle"};  // by their bits

/// For a message: short, and without bytes that a terminal would obey.
std::string Quoted(std::string_view word)
{
    constexpr std::size_t longest = 40;
    std::string shown(word.substr(0, longest));
    std::replace_if(
        shown.begin(), shown.end(), [](char c) { return c < ' ' || c > '~'; }, '?');
    return "'" + shown + (word.size() > longest ? "...'" : "'");
}

template <class Number>
std::optional<Number> ReadNumber(std::string_view word, Number least, Number most, int base = 10)
{
    Number number{};
    auto const* const end = word.data() + word.size();
    auto const result = std::from_chars(word.data(), end, number, base);
    if (result.ec != std::errc() || result.ptr != end || number < least || number > most) return std::nullopt;
    return number;
}

std::optional<unsigned> ReadButton(std::string_view word)
{
    auto const found = std::find(kButtons.begin(), kButtons.end(), word);
    if (found == kButtons.end()) return std::nullopt;
    return 1U << (found - kButtons.begin());
}

std::vector<std::string_view> WordsOf(std::string_view line)
{
    constexpr std::string_view blanks = " \t\r";
    std::vector<std::string_view> words;
    for (auto from = line.find_first_not_of(blanks); from != std::string_view::npos;) {
        if (line[from] == '#') break;
        auto const end = std::min(line.find_first_of(blanks, from), line.size());
        words.push_back(line.substr(from, end - from));
        from = line.find_first_not_of(blanks, end);
    }
    return words;
}

/// A script on its way into steps. Each reader takes the words after a command's name, as many as the command
/// has, and gives an empty text or what is wrong.
class Parser {
public:
    Problem ReadLine(unsigned number, Words words);
    std::vector<Step> TakeSteps() { return std::move(steps); }

private:
    struct Command {
        std::string_view form;  ///< as a message shows it
        std::size_t fewest, most;
        Problem (Parser::*read)(Words);
    };
    static std::span<Command const> Commands();

    Problem Move(Words words);
    Problem Press(Words words) { return SetButton(words[0], true); }
    Problem Release(Words words) { return SetButton(words[0], false); }
    Problem Click(Words words);
    Problem Wheel(Words words);
    Problem Keys(Words words);
    Problem Type(Words words);
    Problem Wait(Words words);
    Problem SettleScreen(Words words);
    Problem Shoot(Words words);
    Problem Expect(Words words);
    Problem SwitchConsole(Words words);
    Problem End(Words words);

    Problem SetButton(std::string_view word, bool down);
    static Problem ReadTime(std::string_view word, milliseconds& time);
    template <class Action>
    void Add(Action action)
    {
        auto& step = steps.emplace_back();
        step.line = line;
        step.action = std::move(action);
    }

    std::vector<Step> steps;
    unsigned line = 0;
    unsigned buttons = 0;  // that are down
    bool ended = false;
};

std::span<Parser::Command const> Parser::Commands()
{
    constexpr auto any = static_cast<std::size_t>(-1);
    static constexpr std::array commands = {
        Command{"move DX DY...", 2, any, &Parser::Move},
        Command{"press BUTTON", 1, 1, &Parser::Press},
        Command{"release BUTTON", 1, 1, &Parser::Release},
        Command{"click [BUTTON]", 0, 1, &Parser::Click},
        Command{"wheel up|down [NOTCHES]", 1, 2, &Parser::Wheel},
        Command{"keys CODE...", 1, any, &Parser::Keys},
        Command{"type KEY...", 1, any, &Parser::Type},
        Command{"wait TIME", 1, 1, &Parser::Wait},
        Command{"settle [QUIET [LIMIT]]", 0, 2, &Parser::SettleScreen},
        Command{"screenshot FILE", 1, 1, &Parser::Shoot},
        Command{"expect FILE [LIMIT]", 1, 2, &Parser::Expect},
        Command{"switch CONSOLE", 1, 1, &Parser::SwitchConsole},
        Command{"quit", 0, 0, &Parser::End},
    };
    return commands;
}

Problem Parser::ReadLine(unsigned number, Words words)
{
    if (words.empty()) return {};
    line = number;
    auto const all = Commands();
    auto const command = std::find_if(all.begin(), all.end(),
        [&](Command const& one) { return one.form.substr(0, one.form.find(' ')) == words[0]; });
    if (command == all.end()) return "unknown command " + Quoted(words[0]);
    if (ended) return "a command after 'quit'";
    words = words.subspan(1);
    if (words.size() < command->fewest || words.size() > command->most)
        return "the command is " + Quoted(command->form);
    return (this->*command->read)(words);
}

Problem Parser::Move(Words words)
{
    if (words.size() % 2 != 0) return "each move is two numbers";
    for (; !words.empty(); words = words.subspan(2)) {
        auto const dx = ReadNumber(words[0], -kFarthest, kFarthest);
        auto const dy = ReadNumber(words[1], -kFarthest, kFarthest);
        if (!dx || !dy) return "a move is two numbers from -127 to 127";
        if (*dx == 0 && *dy == 0) return "a move of 0 0 is none";
        Add(MouseReport{*dx, *dy, 0, buttons});
    }
    return {};
}

Problem Parser::SetButton(std::string_view word, bool down)
{
    auto const button = ReadButton(word);
    if (!button) return Quoted(word) + " isn't a button; there are left, right and middle";
    if (((buttons & *button) != 0) == down)
        return "the " + std::string(word) + " button is " + (down ? "down" : "up") + " already";
    buttons ^= *button;
    Add(MouseReport{0, 0, 0, buttons});
    return {};
}

Problem Parser::Click(Words words)
{
    auto const button = words.empty() ? kButtons[0] : words[0];
    auto problem = SetButton(button, true);
    return problem.empty() ? SetButton(button, false) : problem;
}

Problem Parser::Wheel(Words words)
{
    if (words[0] != "up" && words[0] != "down") return "the wheel goes up or down";
    auto const notches = words.size() == 1 ? 1U : ReadNumber(words[1], 1U, kMostNotches);
    if (!notches) return "the wheel goes 1 to 1000 notches";
    for (unsigned i = 0; i < *notches; ++i)
        Add(MouseReport{0, 0, words[0] == "up" ? 1 : -1, buttons});
    return {};
}

Problem Parser::Keys(Words words)
{
    for (auto const word : words) {
        auto const code = ReadNumber(word, 0x00U, 0xFFU, 16);
        if (!code) return Quoted(word) + " isn't a byte in hexadecimal digits";
        Add(KeyByte{static_cast<unsigned char>(*code)});
    }
    return {};
}

Problem Parser::Type(Words words)
{
    for (auto const word : words) {
        auto const bytes = BytesOfChord(word);
        if (!bytes) return Quoted(word) + " isn't a key, or keys with '-' between them";
        for (auto const byte : *bytes)
            Add(KeyByte{byte});
    }
    return {};
}

Problem Parser::ReadTime(std::string_view word, milliseconds& time)
{
    auto const number = ReadNumber(word, 0U, kLongestTime);
    if (!number) return "the time " + Quoted(word) + " isn't a number of milliseconds up to 3600000";
    time = milliseconds(*number);
    return {};
}

Problem Parser::Wait(Words words)
{
    Pause pause;
    if (auto problem = ReadTime(words[0], pause.time); !problem.empty()) return problem;
    Add(pause);
    return {};
}

Problem Parser::SettleScreen(Words words)
{
    Settle settle;
    std::array<milliseconds*, 2> const times = {&settle.quiet, &settle.limit};
    for (std::size_t i = 0; i < words.size(); ++i)
        if (auto problem = ReadTime(words[i], *times[i]); !problem.empty()) return problem;
    if (settle.quiet > settle.limit) return "the screen cannot be quiet for longer than the limit";
    Add(settle);
    return {};
}

Problem Parser::Shoot(Words words)
{
    Add(Screenshot{std::string(words[0])});
    return {};
}

Problem Parser::Expect(Words words)
{
    Expectation expectation{std::string(words[0])};
    if (words.size() == 2)
        if (auto problem = ReadTime(words[1], expectation.limit); !problem.empty()) return problem;
    Add(expectation);
    return {};
}

Problem Parser::SwitchConsole(Words words)
{
    auto const console = ReadNumber(words[0], 1U, kLastConsole);
    if (!console) return "there is no console " + Quoted(words[0]) + "; they are 1 to 63";
    Add(ConsoleSwitch{*console});
    return {};
}

Problem Parser::End(Words)
{
    Add(Quit{});
    ended = true;
    return {};
}

}

std::string AtLine(std::string const& name, unsigned line, std::string const& problem)
{
    return name + ":" + std::to_string(line) + ": " + problem;
}

std::variant<Script, std::string> ParseScript(std::string_view text, std::string const& name)
{
    Parser parser;
    for (unsigned number = 1; !text.empty(); ++number) {
        auto const end = std::min(text.find('\n'), text.size());
        auto const words = WordsOf(text.substr(0, end));
        auto const problem = parser.ReadLine(number, words);
        if (!problem.empty()) return AtLine(name, number, problem);
        text.remove_prefix(std::min(end + 1, text.size()));
    }
    return Script{name, parser.TakeSteps()};
}

std::variant<Script, std::string> ReadScript(std::string const& path)
{
    std::string text;
    try {
        OwnedFd const file(open(path.c_str(), O_RDONLY | O_CLOEXEC), "opening a script");
        std::array<char, 4096> part{};
        while (int const length =
                   Checked(static_cast<int>(read(file.Get(), part.data(), part.size())), "reading a script"))
            text.append(part.data(), static_cast<std::size_t>(length));
    } catch (std::system_error const& error) {
        return "cannot read " + path + ": " + error.code().message();
    }
    return ParseScript(text, path);
}

std::string StepPrinter::Print(StepAction const& action)
{
    return std::visit([this](auto const& one) { return this->Text(one); }, action);
}

std::string StepPrinter::Text(MouseReport const& report)
{
    unsigned const changed = std::exchange(buttons, report.buttons) ^ report.buttons;
    for (unsigned bit = 0; bit < kButtons.size(); ++bit) {
        if ((changed >> bit & 1) != 0)
            return ((report.buttons >> bit & 1) != 0 ? "press " : "release ") + std::string(kButtons[bit]);
    }
    if (report.wheel != 0) return report.wheel > 0 ? "wheel up" : "wheel down";
    return "move " + std::to_string(report.dx) + " " + std::to_string(report.dy);
}

std::string StepPrinter::Text(KeyByte const& key)
{
    std::array<char, 8> text{};
    std::snprintf(text.data(), text.size(), "keys %02x", key.code);
    return text.data();
}

std::string StepPrinter::Text(Pause const& pause) { return "wait " + std::to_string(pause.time.count()); }

std::string StepPrinter::Text(Settle const& settle)
{
    return "settle " + std::to_string(settle.quiet.count()) + " " + std::to_string(settle.limit.count());
}

std::string StepPrinter::Text(Screenshot const& shot) { return "screenshot " + shot.path; }

std::string StepPrinter::Text(Expectation const& expected)
{
    return "expect " + expected.path + " " + std::to_string(expected.limit.count());
}

std::string StepPrinter::Text(ConsoleSwitch const& to) { return "switch " + std::to_string(to.console); }

std::string StepPrinter::Text(Quit const&) { return "quit"; }

std::string PrintSteps(Script const& script)
{
    std::string text;
    StepPrinter printer;
    for (auto const& step : script.steps)
        text.append(printer.Print(step.action)).append("\n");
    return text;
}

}

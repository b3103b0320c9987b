#pragma once

#include <chrono>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

namespace console {

// A script tells what the user does at the console, one command a line; docs/scripts.md describes them. It is
// taken apart into steps, each of which does one thing to one device.

/// One report of the mouse. `dy` grows downward, `wheel` is 1 away from the user and -1 towards them;
/// `buttons` are those that are down, bit 0 left, bit 1 right, bit 2 middle.
struct MouseReport {
    int dx = 0;
    int dy = 0;
    int wheel = 0;
    unsigned buttons = 0;
};

/// A key's code, with `kReleased` set at its release.
struct KeyByte {
    static constexpr unsigned char kReleased = 0x80;
    unsigned char code = 0;
};

struct Pause {
    std::chrono::milliseconds time{};
};

/// Goes on when the screen has shown the same picture for a time.
struct Settle {
    std::chrono::milliseconds quiet{200};
    std::chrono::milliseconds limit{10000};
};

struct Screenshot {
    std::string path;
};

/// Goes on when the screen shows what is in a file beside the script.
struct Expectation {
    std::string path;
    std::chrono::milliseconds limit{2000};
};

struct ConsoleSwitch {
    unsigned console = 0;
};

/// Ends the program; the last step if there is one.
struct Quit {};

using StepAction =
    std::variant<MouseReport, KeyByte, Pause, Settle, Screenshot, Expectation, ConsoleSwitch, Quit>;

struct Step {
    unsigned line = 0;  ///< of the script, from 1
    StepAction action;
};

struct Script {
    std::string name;  ///< as messages name it
    std::vector<Step> steps;
};

/// A message about a line of a script.
std::string AtLine(std::string const& name, unsigned line, std::string const& problem);

/// Takes a script's text apart. Gives what is wrong, beginning with name and line, if it cannot be followed.
/// The text may hold anything.
std::variant<Script, std::string> ParseScript(std::string_view text, std::string const& name);

/// The same for a file, named by its path; or why it cannot be read.
std::variant<Script, std::string> ReadScript(std::string const& path);

/// Writes steps as commands again, one after the other.
class StepPrinter {
public:
    /// A line, without its end. A report does one thing: it moves the mouse, turns the wheel or changes a
    /// button.
    std::string Print(StepAction const& action);

private:
    std::string Text(MouseReport const& report);
    static std::string Text(KeyByte const& key);
    static std::string Text(Pause const& pause);
    static std::string Text(Settle const& settle);
    static std::string Text(Screenshot const& shot);
    static std::string Text(Expectation const& expected);
    static std::string Text(ConsoleSwitch const& to);
    static std::string Text(Quit const& quit);

    unsigned buttons = 0;  // the buttons' commands are in what changes from one report to the next
};

/// The steps as a script, one a line. `click` and `type` do not occur, nor numbers of notches or codes.
std::string PrintSteps(Script const& script);

}

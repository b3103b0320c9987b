#pragma once

#include <console/script_player.h>
#include <console/viewer_options.h>
#include <console/virtual_console.h>

#include <span>
#include <string>
#include <variant>

namespace console {

/// A command line of the tool, read.
struct Options {
    Setup setup;
    std::string screenshot;  ///< a file's path, empty for none
    std::string script;      ///< likewise
    PlayMode playMode = PlayMode::Compare;
    ViewerOptions viewers;
    bool printSteps = false;     ///< of the script, and run nothing
    char const* told = nullptr;  ///< what the user wants to be told; nothing else counts then
    std::span<char*> program;    ///< with its arguments; part of the command line
};

/// Reads the words after the tool's name. Gives what is wrong, in one sentence, if they cannot be followed.
std::variant<Options, std::string> ReadOptions(std::span<char*> words);

}

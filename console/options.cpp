#include <console/options.h>

#include <string_view>

namespace console {

char const* const kHelp =
    R"(Usage: tessella-console [OPTION]... -- PROGRAM [ARGUMENT]...

Runs a program on a virtual Linux console: a framebuffer, a tty with the console's requests, and a PS/2 mouse,
at the device paths where programs look for them. No root, no device and no change to the program is needed.

  --mode WIDTHxHEIGHTxDEPTH   the video mode, 1024x768x32 if not given. Depths: 8 (with a colour map), 15, 16,
                              24 (three bytes a pixel) and 32 (24 bits of colour in four bytes)
  --pitch BYTES               bytes from one row to the next, if more than the pixels need
  --screenshot FILE.png       when the program has ended, however it did, write what the screen shows
  --fault REQUEST=ERRNO       let a call fail, always. May be repeated. REQUEST is OPEN_FB, OPEN_TTY,
                              OPEN_MOUSE, MMAP, IOPERM, an ioctl's name (FBIOGET_FSCREENINFO,
                              FBIOGET_VSCREENINFO, FBIOPUTCMAP, KDGKBMODE, KDSKBMODE, KDGETMODE, KDSETMODE,
                              KDGKBLED, KDSKBLED, VT_GETMODE, VT_SETMODE, VT_GETSTATE, VT_RELDISP,
                              VT_ACTIVATE), or the path of one device, whose opening fails. ERRNO is a name
                              (ENODEV) or a number
  --report BITS:RED,GREEN,BLUE
                              let the driver tell of pixels of BITS bits with fields of these lengths,
                              whatever the mode is: to see how a program takes a mode that it doesn't support
  --help                      show this

The exit status is the program's, or 128 and the signal's number if one killed it; 2 if the console couldn't
do its part; 127 if the program couldn't be run.
)";

namespace {

using Problem = std::string;

std::string Quoted(std::string_view text) { return std::string("'").append(text).append("'"); }

/// The command line on its way into options. Each reader gives an empty text or what is wrong.
class Reader {
public:
    std::variant<Options, Problem> Read(std::span<char*> words);

private:
    Problem ReadValue(std::string_view name, std::string_view value);
    Problem Finish();

    Options options;
    std::optional<unsigned> pitch;
};

bool TakesValue(std::string_view name)
{
    return name == "--mode" || name == "--pitch" || name == "--screenshot" || name == "--fault" ||
        name == "--report";
}

Problem Reader::ReadValue(std::string_view name, std::string_view value)
{
    if (name == "--mode") {
        auto const mode = ParseMode(value);
        if (!mode)
            return "the mode " + Quoted(value) +
                " isn't supported; it is WIDTHxHEIGHTxDEPTH with a depth of 8, 15, 16, 24 or 32 and sides up "
                "to " +
                std::to_string(kLongestSide);
        options.setup.mode = *mode;
    } else if (name == "--pitch") {
        pitch = ParseNumber(value);
        if (!pitch) return "the pitch " + Quoted(value) + " isn't a number of bytes";
    } else if (name == "--screenshot") {
        if (value.empty()) return "--screenshot needs the name of a file";
        options.screenshot = value;
    } else if (name == "--fault") {
        auto const fault = ParseFault(value);
        if (!fault)
            return "the fault " + Quoted(value) + " isn't REQUEST=ERRNO with a known request and error";
        options.setup.faults.push_back(*fault);
    } else {
        options.setup.format = ParseFormat(value);
        if (!options.setup.format) return "the report " + Quoted(value) + " isn't BITS:RED,GREEN,BLUE";
    }
    return {};
}

Problem Reader::Finish()
{
    if (options.program.empty()) return "no program is given";
    if (!pitch) return {};
    if (!IsPitchValid(options.setup.mode, *pitch))
        return "the mode's rows cannot be " + std::to_string(*pitch) + " bytes apart; its pixels need " +
            std::to_string(options.setup.mode.pitch) + ", and " + std::to_string(kLongestPitch) +
            " is the most";
    options.setup.mode.pitch = *pitch;
    return {};
}

std::variant<Options, Problem> Reader::Read(std::span<char*> words)
{
    while (!words.empty()) {
        std::string_view word = words.front();
        if (!word.starts_with("-")) break;
        words = words.subspan(1);
        if (word == "--") break;
        if (word == "--help") {
            options.help = true;
            return options;
        }
        auto const equals = word.find('=');
        auto const name = word.substr(0, equals);
        if (!TakesValue(name)) return "unknown option " + Quoted(word);
        std::string_view value;
        if (equals != std::string_view::npos) {
            value = word.substr(equals + 1);
        } else {
            if (words.empty()) return std::string(name) + " needs a value";
            value = words.front();
            words = words.subspan(1);
        }
        if (auto problem = ReadValue(name, value); !problem.empty()) return problem;
    }
    options.program = words;
    if (auto problem = Finish(); !problem.empty()) return problem;
    return options;
}

}

std::variant<Options, std::string> ReadOptions(std::span<char*> words) { return Reader().Read(words); }

}

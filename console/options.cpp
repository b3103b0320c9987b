#include <console/options.h>

#include <limits>
#include <string_view>

namespace console {

namespace {

constexpr char kHelp[] =
    R"(Usage: tessella-console [OPTION]... -- PROGRAM [ARGUMENT]...

Runs a program on a virtual Linux console: a framebuffer, a tty with the console's requests, and a PS/2 mouse,
at the device paths where programs look for them. No root, no device and no change to the program is needed.

  --mode WIDTHxHEIGHTxDEPTH   the video mode, 1024x768x32 if not given. Depths: 4 (16 colours in the planes of
                              a VGA; slow), 8 (with a colour map), 15, 16, 24 (three bytes a pixel) and 32
                              (24 bits of colour in four bytes)
  --pitch BYTES               bytes from one row to the next, if more than the pixels need
  --screenshot FILE.png       when the program has ended, however it did, write what the screen shows
  --script FILE               do at the console what the file says: move the mouse, press its buttons, type
                              keys, switch consoles, take screenshots, end the program; see below
  --bless                     write what the screen shows to the files that the script expects it to be like
  --print-steps               print the single steps that the script comes down to, and run nothing
  --web[=PORT]                show the screen to web browsers, with mouse and keyboard, at port 6080 if not
                              given, at any free one if 0. The address is printed
  --vnc[=PORT]                the same for VNC viewers; port 5900 if not given
  --listen ADDRESS            let other machines reach these ports, at this address. Needs a password
  --password-file FILE        ask viewers for the password in the first line of a file; 8 characters count
  --record FILE               write what viewers do as a script that does the same
  --fault REQUEST=ERRNO       let a call fail, always. May be repeated. REQUEST is OPEN_FB, OPEN_TTY,
                              OPEN_MOUSE, MMAP, IOPERM, an ioctl's name (FBIOGET_FSCREENINFO,
                              FBIOGET_VSCREENINFO, FBIOPUTCMAP, FBIOGETCMAP, KDGKBMODE, KDSKBMODE, KDGETMODE,
                              KDSETMODE, KDGKBLED, KDSKBLED, VT_GETMODE, VT_SETMODE, VT_GETSTATE, VT_RELDISP,
                              VT_ACTIVATE, VT_WAITACTIVE), or the path of one device, whose opening fails.
                              ERRNO is a name (ENODEV) or a number
  --report BITS:RED,GREEN,BLUE
                              let the driver tell of pixels of BITS bits with fields of these lengths,
                              whatever the mode is: to see how a program takes a mode that it doesn't support
  --help                      show this
  --version                   show the version

A script has one command a line; what follows a word that begins with # is a comment. Times are milliseconds.

  move DX DY...               move the mouse, right and downward, by -127 to 127 counts, once for each pair
  press|release BUTTON        press or release left, right or middle
  click [BUTTON]              both, left if no button is given
  wheel up|down [NOTCHES]     turn the wheel, one notch if no number is given
  type KEY...                 press and release keys: type a shift-b ctrl-alt-f2 ret. They have QEMU's names
  keys CODE...                key codes in hexadecimal digits, with 80 added for a release
  wait TIME                   do nothing
  settle [QUIET [LIMIT]]      wait until the picture hasn't changed for a time, 200 if not given; the script
                              fails if it still changes at the limit, 10000 if not given
  screenshot FILE.png         write what the screen shows
  expect FILE.png [LIMIT]     wait until the screen shows what is in the file, 2000 if not given; the script
                              fails if it doesn't, and leaves FILE.actual.png and FILE.difference.png
  switch CONSOLE              switch to console 1, the program's, to 63
  quit                        end the program (SIGTERM; SIGKILL 5 seconds later). Without this it goes on

Each command waits, for 10 seconds at most, until the program has got ready for it. A command that cannot be
carried out ends the program.

The exit status is the program's, or 128 and the signal's number if one killed it, but 0 if the script's quit
ended it. If the program reports no failure of its own: 1 if the screen was not as expected, 2 if the console
or the script couldn't do its part. 127 if the program couldn't be run.
)";

using Problem = std::string;

constexpr unsigned kWebPort = 6080;
constexpr unsigned kVncPort = 5900;

std::string Quoted(std::string_view text) { return std::string("'").append(text).append("'"); }

/// The command line on its way into options. Each reader gives an empty text or what is wrong.
class Reader {
public:
    std::variant<Options, Problem> Read(std::span<char*> words);

private:
    Problem ReadValue(std::string_view name, std::string_view value);
    Problem ReadPort(std::string_view name, std::optional<std::string_view> value);
    Problem Finish();

    Options options;
    std::optional<unsigned> pitch;
};

bool TakesValue(std::string_view name)
{
    return name == "--mode" || name == "--pitch" || name == "--screenshot" || name == "--script" ||
        name == "--fault" || name == "--report" || name == "--listen" || name == "--password-file" ||
        name == "--record";
}

/// The value of `--web` or `--vnc`, which may be left out.
Problem Reader::ReadPort(std::string_view name, std::optional<std::string_view> value)
{
    bool const web = name == "--web";
    auto const number = value ? ParseNumber(*value) : std::optional<unsigned>(web ? kWebPort : kVncPort);
    if (!number || *number > std::numeric_limits<std::uint16_t>::max())
        return "the port " + Quoted(*value) + " isn't a number up to 65535";
    (web ? options.viewers.webPort : options.viewers.vncPort) = static_cast<std::uint16_t>(*number);
    return {};
}

Problem Reader::ReadValue(std::string_view name, std::string_view value)
{
    if (name == "--mode") {
        auto const mode = ParseMode(value);
        if (!mode)
            return "the mode " + Quoted(value) +
                " isn't supported; it is WIDTHxHEIGHTxDEPTH with a depth of 8, 15, 16, 24 or 32 and sides up "
                "to " +
                std::to_string(kLongestSide) + ", or 640x480x4 or another of 8 pixels a byte in 64 KiB";
        options.setup.mode = *mode;
    } else if (name == "--pitch") {
        pitch = ParseNumber(value);
        if (!pitch) return "the pitch " + Quoted(value) + " isn't a number of bytes";
    } else if (name == "--screenshot") {
        if (value.empty()) return "--screenshot needs the name of a file";
        options.screenshot = value;
    } else if (name == "--script") {
        if (value.empty()) return "--script needs the name of a file";
        options.script = value;
    } else if (name == "--fault") {
        auto const fault = ParseFault(value);
        if (!fault)
            return "the fault " + Quoted(value) + " isn't REQUEST=ERRNO with a known request and error";
        options.setup.faults.push_back(*fault);
    } else if (name == "--listen") {
        if (value.empty()) return "--listen needs an address";
        options.viewers.address = value;
    } else if (name == "--password-file") {
        if (value.empty()) return "--password-file needs the name of a file";
        options.viewers.passwordFile = value;
    } else if (name == "--record") {
        if (value.empty()) return "--record needs the name of a file";
        options.viewers.recording = value;
    } else {
        options.setup.format = ParseFormat(value);
        if (!options.setup.format) return "the report " + Quoted(value) + " isn't BITS:RED,GREEN,BLUE";
    }
    return {};
}

Problem Reader::Finish()
{
    if (options.printSteps && options.script.empty()) return "--print-steps needs a script";
    if (!options.viewers.IsWanted()) {
        if (!options.viewers.address.empty()) return "--listen needs --web or --vnc";
        if (!options.viewers.passwordFile.empty()) return "--password-file needs --web or --vnc";
        if (!options.viewers.recording.empty()) return "--record needs --web or --vnc";
    }
    if (options.program.empty() && !options.printSteps) return "no program is given";
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
        if (word == "--help" || word == "--version") {
            options.told = word == "--help" ? kHelp : "tessella-console " TESSELLA_VERSION "\n";
            return options;
        }
        if (word == "--bless") {
            options.playMode = PlayMode::Bless;
            continue;
        }
        if (word == "--print-steps") {
            options.printSteps = true;
            continue;
        }
        auto const equals = word.find('=');
        auto const name = word.substr(0, equals);
        if (name == "--web" || name == "--vnc") {
            auto const value =
                equals == std::string_view::npos ? std::nullopt : std::optional(word.substr(equals + 1));
            if (auto problem = ReadPort(name, value); !problem.empty()) return problem;
            continue;
        }
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

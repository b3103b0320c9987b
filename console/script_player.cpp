#include <console/script_player.h>

#include <console/mouse_handshake.h>

#include <csignal>
#include <exception>
#include <filesystem>
#include <utility>
#include <variant>

#include <sys/eventfd.h>

namespace console {

namespace {

using std::chrono::milliseconds;

constexpr milliseconds kReadyLimit{10000};  // for the program to get ready for a step
constexpr milliseconds kReadLimit{100};     // to read a report; what takes longer is left in the device
constexpr milliseconds kPollInterval{2};
constexpr milliseconds kPictureInterval{20};
constexpr milliseconds kKillDelay{5000};  // to end when asked to

constexpr char const* kEndedBefore = "the program ended before this was done";

std::string Milliseconds(milliseconds time) { return std::to_string(time.count()) + " ms"; }

std::string SizeOf(Picture const& picture)
{
    return std::to_string(picture.width) + "x" + std::to_string(picture.height);
}

/// Leaves the picture that is shown, and one of the difference, in the current folder: NAME.actual.png and
/// NAME.difference.png. The expected one may lie where nothing is to be written.
std::string TellMiss(std::string const& path, Picture const& wanted, Picture const& shown)
{
    auto const name = std::filesystem::path(path).stem().string();
    std::string what = "the screen is not as in " + path;
    auto const leave = [&](Picture const& picture, std::string const& file) {
        auto const why = SavePicture(picture, file);
        what += why.empty() ? ", see " + file : "; cannot write " + file + ": " + why;
    };
    leave(shown, name + ".actual.png");
    if (shown.width == wanted.width && shown.height == wanted.height)
        leave(Difference(wanted, shown), name + ".difference.png");
    else
        what += "; it is " + SizeOf(shown) + ", and not " + SizeOf(wanted);
    return what;
}

}

ScriptPlayer::ScriptPlayer(VirtualConsole& onConsole, Script const& toPlay, PlayMode playMode)
    : console(onConsole), script(toPlay), mode(playMode),
      signalFd(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK), "starting the script"),
      thread([this](std::stop_token const& token) {
          stop = token;
          Play();
      })
{}

int ScriptPlayer::TakeSignal()
{
    eventfd_t count = 0;
    eventfd_read(signalFd.Get(), &count);
    return signalToSend.exchange(0);
}

std::string ScriptPlayer::Stop()
{
    thread.request_stop();
    if (thread.joinable()) thread.join();
    return problem;
}

void ScriptPlayer::Play()
{
    try {
        problem = PlaySteps();
    } catch (std::exception const& error) {
        problem = script.name + ": failed: " + error.what();
    }
    if (!problem.empty()) EndProgram();
}

ScriptPlayer::Problem ScriptPlayer::PlaySteps()
{
    for (auto const& step : script.steps) {
        bool const tooLate = stop.stop_requested() && !std::holds_alternative<Quit>(step.action);
        auto const what = tooLate
            ? kEndedBefore
            : std::visit([this](auto const& action) { return Do(action); }, step.action);
        if (!what.empty()) return AtLine(script.name, step.line, what);
    }
    return {};
}

ScriptPlayer::Problem ScriptPlayer::Do(MouseReport const& report)
{
    if (!mouseReady) {
        MouseHandshake handshake;
        auto const isOver = [&] { return handshake.IsOver(console); };
        if (auto what = Need(isOver, "opened the mouse and read its answers"); !what.empty()) return what;
        mouseReady = true;
    }
    if (!console.MoveMouse(report.dx, report.dy, report.wheel, report.buttons))
        return "the program reads the mouse so slowly that this was lost";
    Await([this] { return console.IsMouseRead(); }, kReadLimit, kPollInterval);
    return {};
}

ScriptPlayer::Problem ScriptPlayer::Do(KeyByte const& key)
{
    auto const areRead = [this] { return console.AreKeysRead(); };
    if (!keysReady) {
        if (auto what = Need(areRead, "put the keyboard into medium raw mode"); !what.empty()) return what;
        keysReady = true;
    }
    if (console.Tty().activeConsole != TtyState::kOwnConsole) return {};  // goes to the one that is shown
    if (!console.TypeKeys({&key.code, 1}))
        return "the program reads the keyboard so slowly that this was lost";
    Await(areRead, kReadLimit, kPollInterval);
    return {};
}

ScriptPlayer::Problem ScriptPlayer::Do(Pause const& pause)
{
    return Sleep(pause.time) ? Problem() : kEndedBefore;
}

ScriptPlayer::Problem ScriptPlayer::Do(Settle const& settle)
{
    if (auto what = NeedScreen(); !what.empty()) return what;
    auto shown = console.Screen();
    auto since = Clock::now();
    auto const isQuiet = [&] {
        if (auto now = console.Screen(); now.bytes != shown.bytes) {
            shown = std::move(now);
            since = Clock::now();
        }
        return Clock::now() - since >= settle.quiet;
    };
    switch (Await(isQuiet, settle.limit, kPictureInterval)) {
    case Outcome::Met: return {};
    case Outcome::Stopped: return kEndedBefore;
    default:
        return "the screen did not stand still for " + Milliseconds(settle.quiet) + " within " +
            Milliseconds(settle.limit);
    }
}

ScriptPlayer::Problem ScriptPlayer::Do(Screenshot const& shot)
{
    if (auto what = NeedScreen(); !what.empty()) return what;
    auto const why = SavePicture(console.Screen(), shot.path);
    return why.empty() ? why : "cannot write " + shot.path + ": " + why;
}

ScriptPlayer::Problem ScriptPlayer::Do(Expectation const& expected)
{
    auto const path = (std::filesystem::path(script.name).parent_path() / expected.path).string();
    if (mode == PlayMode::Bless) {
        auto what = Do(Settle());
        return what.empty() ? Do(Screenshot{path}) : what;
    }
    if (auto what = NeedScreen(); !what.empty()) return what;
    auto const loaded = LoadPicture(path);
    if (auto const* const why = std::get_if<std::string>(&loaded))
        return "cannot read " + path + ": " + *why + " (--bless writes it)";
    auto const& wanted = std::get<Picture>(loaded);
    Picture shown;
    auto const isEqual = [&] {
        shown = console.Screen();
        return shown == wanted;
    };
    switch (Await(isEqual, expected.limit, kPictureInterval)) {
    case Outcome::Met: return {};
    case Outcome::Stopped: return kEndedBefore;
    default: missed = true; return TellMiss(path, wanted, shown);
    }
}

ScriptPlayer::Problem ScriptPlayer::Do(ConsoleSwitch const& to)
{
    auto const takesPart = [this] { return console.Tty().vtMode.mode == VT_PROCESS; };
    if (auto what = Need(takesPart, "asked to be told of console switches"); !what.empty()) return what;
    auto const isThere = [&] { return console.Tty().activeConsole == static_cast<int>(to.console); };
    if (isThere()) return {};
    auto const answers = console.Count(Request::ReleaseDisplay);
    console.SwitchTo(to.console);
    auto what = Need(isThere, "let the console be switched");
    // It is told of its return, too, and is to have noticed.
    Await([&] { return console.Count(Request::ReleaseDisplay) != answers; }, kReadLimit, kPollInterval);
    return what;
}

ScriptPlayer::Problem ScriptPlayer::Do(Quit const&)
{
    EndProgram();
    return {};
}

ScriptPlayer::Problem ScriptPlayer::NeedScreen()
{
    return Need([this] { return console.Count(Request::MapMemory) != 0; }, "mapped the framebuffer");
}

template <class Condition>
ScriptPlayer::Problem ScriptPlayer::Need(Condition isMet, char const* otherwise)
{
    switch (Await(isMet, kReadyLimit, kPollInterval)) {
    case Outcome::Met: return {};
    case Outcome::Stopped: return kEndedBefore;
    default: return std::string("the program has not ") + otherwise + " within " + Milliseconds(kReadyLimit);
    }
}

template <class Condition>
ScriptPlayer::Outcome ScriptPlayer::Await(Condition isMet, milliseconds limit, milliseconds interval)
{
    auto const deadline = Clock::now() + limit;
    while (!isMet()) {
        if (Clock::now() >= deadline) return Outcome::TooLate;
        if (!Sleep(interval)) return Outcome::Stopped;
    }
    return Outcome::Met;
}

bool ScriptPlayer::Sleep(milliseconds time)
{
    std::unique_lock lock(sleepMutex);
    sleeper.wait_for(lock, stop, time, [] { return false; });
    return !stop.stop_requested();
}

void ScriptPlayer::EndProgram()
{
    Ask(SIGTERM);
    if (Sleep(kKillDelay)) Ask(SIGKILL);
}

void ScriptPlayer::Ask(int signal)
{
    signalToSend = signal;
    eventfd_write(signalFd.Get(), 1);
}

}

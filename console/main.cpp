// tessella-console: runs a program on a virtual console.

#include <console/options.h>
#include <console/picture.h>
#include <console/run_program.h>
#ifdef TESSELLA_CONSOLE_PAGE
#include <console/viewer_server.h>
#endif

#include <cstdio>
#include <filesystem>
#include <initializer_list>
#include <optional>
#include <stdexcept>
#include <system_error>
#include <utility>

namespace {

constexpr int kNotAsExpected = 1;
constexpr int kConsoleFailed = 2;
constexpr int kProgramFailed = 127;

int Complain(std::string const& problem, int status)
{
    std::fprintf(stderr, "tessella-console: %s\n", problem.c_str());
    return status;
}

/// What the tool needs lies beside it in the build folder, and where the installation puts it otherwise.
/// Empty if it is in neither place.
std::string Find(std::initializer_list<char const*> places)
{
    std::error_code error;
    auto const folder = std::filesystem::read_symlink("/proc/self/exe", error).parent_path();
    for (char const* const relative : places) {
        auto const path = (folder / relative).lexically_normal();
        if (std::filesystem::exists(path, error)) return path.string();
    }
    return {};
}

#ifdef TESSELLA_CONSOLE_PAGE
/// Shows the console to those who want to see it.
class Viewers {
public:
    Viewers(console::VirtualConsole& virtualConsole, console::ViewerOptions const& options)
    {
        if (options.IsWanted())
            server.emplace(
                virtualConsole, options, Find({TESSELLA_CONSOLE_PAGE, TESSELLA_CONSOLE_INSTALLED_PAGE}));
    }
    void Start()
    {
        if (server) server->Start();
    }
    std::string EndRecording(bool asked) { return server ? server->EndRecording(asked) : std::string(); }

private:
    std::optional<console::ViewerServer> server;
};
#else
class Viewers {
public:
    Viewers(console::VirtualConsole&, console::ViewerOptions const& options)
    {
        if (options.IsWanted()) throw std::runtime_error("this tessella-console was built without viewers");
    }
    void Start() {}
    std::string EndRecording(bool) { return {}; }
};
#endif

int Run(console::Options const& options, std::string const& preloaded, console::Script const* script)
{
    console::VirtualConsole virtualConsole(options.setup);
    std::optional<Viewers> viewers;
    try {
        viewers.emplace(virtualConsole, options.viewers);
    } catch (std::exception const& error) {
        return Complain(error.what(), kConsoleFailed);
    }
    console::RunOutcome outcome;
    try {
        outcome = console::RunProgram(
            virtualConsole, preloaded, options.program, script, options.playMode, [&] { viewers->Start(); });
    } catch (std::system_error const& error) {
        return Complain(std::string("cannot run ") + error.what(), kProgramFailed);
    }
    if (auto const problem = viewers->EndRecording(outcome.asked); !problem.empty())
        outcome.status = Complain(problem, outcome.status != 0 ? outcome.status : kConsoleFailed);
    viewers.reset();
    if (!outcome.scriptProblem.empty()) {
        int const failed = outcome.hasMissed ? kNotAsExpected : kConsoleFailed;
        outcome.status = Complain(outcome.scriptProblem, outcome.status != 0 ? outcome.status : failed);
    }
    if (!options.screenshot.empty()) {
        auto const problem = console::SavePicture(virtualConsole.Screen(), options.screenshot);
        if (!problem.empty())
            return Complain("cannot write " + options.screenshot + ": " + problem, kConsoleFailed);
    }
    return outcome.status;
}

int Follow(std::span<char*> words)
{
    auto const read = console::ReadOptions(words);
    if (auto const* const problem = std::get_if<std::string>(&read))
        return Complain(*problem + " (--help tells more)", kConsoleFailed);
    auto const& options = std::get<console::Options>(read);
    if (options.told != nullptr) return std::fputs(options.told, stdout), 0;
    std::optional<console::Script> script;
    if (!options.script.empty()) {
        auto parsed = console::ReadScript(options.script);
        if (auto const* const problem = std::get_if<std::string>(&parsed))
            return Complain(*problem, kConsoleFailed);
        script = std::get<console::Script>(std::move(parsed));
    }
    if (options.printSteps) {
        std::fputs(console::PrintSteps(*script).c_str(), stdout);
        return 0;
    }
    auto const preloaded = Find({TESSELLA_CONSOLE_OBJECT, TESSELLA_CONSOLE_INSTALLED_OBJECT});
    if (preloaded.empty())
        return Complain("its preloaded object " TESSELLA_CONSOLE_OBJECT " is missing", kConsoleFailed);
    // The loader divides its list there.
    if (preloaded.find_first_of(" :") != std::string::npos)
        return Complain(
            "it cannot work from " + preloaded + ", a path with blanks or colons", kConsoleFailed);
    return Run(options, preloaded, script ? &*script : nullptr);
}

}

int main(int count, char** words)
{
    try {
        return Follow({words + 1, static_cast<std::size_t>(count - 1)});
    } catch (std::exception const& error) {
        std::fprintf(stderr, "tessella-console: failed: %s\n", error.what());
        return kConsoleFailed;
    }
}

#include <console/viewer_server.h>

#include <array>
#include <climits>
#include <csignal>
#include <cstdio>
#include <fstream>
#include <stdexcept>

#include <pthread.h>
#include <unistd.h>

namespace console {

namespace {

constexpr char const* kLoopback = "127.0.0.1";

/// Threads that begin in its scope get no signals.
class AllSignalsBlocked {
public:
    AllSignalsBlocked()
    {
        sigset_t all{};
        sigfillset(&all);
        pthread_sigmask(SIG_SETMASK, &all, &maskBefore);
    }
    ~AllSignalsBlocked() { pthread_sigmask(SIG_SETMASK, &maskBefore, nullptr); }
    AllSignalsBlocked(AllSignalsBlocked const&) = delete;
    AllSignalsBlocked& operator=(AllSignalsBlocked const&) = delete;

private:
    sigset_t maskBefore{};
};

std::string AddressOf(ViewerOptions const& options)
{
    return options.address.empty() ? kLoopback : options.address;
}

std::string ReadPassword(ViewerOptions const& options)
{
    auto const& path = options.passwordFile;
    if (path.empty()) {
        if (IsLoopback(AddressOf(options))) return {};
        throw std::runtime_error(
            "to listen at " + options.address + " needs a password, see --password-file");
    }
    std::ifstream file(path);
    std::string password;
    if (!std::getline(file, password)) throw std::runtime_error("cannot read a password from " + path);
    if (password.empty()) throw std::runtime_error("the first line of " + path + ", the password, is empty");
    return password;
}

std::optional<Recording> BeginRecording(DisplayMode const& mode, std::string const& path)
{
    if (path.empty()) return std::nullopt;
    auto const comment = "recorded by tessella-console --mode " + std::to_string(mode.width) + "x" +
        std::to_string(mode.height) + "x" + std::to_string(mode.depth);
    return std::optional<Recording>(std::in_place, path, comment);
}

ViewerDoor::Ports Open(ViewerOptions const& options, std::string page)
{
    ViewerDoor::Ports ports;
    if (options.webPort) ports.web = Listen(AddressOf(options), *options.webPort);
    if (options.vncPort) ports.vnc = Listen(AddressOf(options), *options.vncPort);
    ports.page = std::move(page);
    return ports;
}

/// As the user writes it, who may be at another machine: with brackets around a number that has colons.
std::string HostOf(ViewerOptions const& options)
{
    if (options.address.empty()) return "localhost";
    if (std::array<char, HOST_NAME_MAX + 1> name{};
        (options.address == "0.0.0.0" || options.address == "::") &&
        gethostname(name.data(), name.size()) == 0)
        return name.data();
    return options.address.find(':') == std::string::npos ? options.address : "[" + options.address + "]";
}

}

ViewerServer::ViewerServer(VirtualConsole& console, ViewerOptions const& wanted, std::string page)
    : options(wanted), password(ReadPassword(options)), ports(Open(options, std::move(page))), watch(console),
      recording(BeginRecording(console.Mode(), options.recording)),
      input(console, recording ? &*recording : nullptr), share{watch, input, {}, password}, door(share, ports)
{}

void ViewerServer::Start()
{
    if (recording) recording->Begin();
    {
        AllSignalsBlocked const blocked;
        watch.Start();
        input.Start();
        door.Start();
    }
    Tell();
}

std::string ViewerServer::EndRecording(bool asked)
{
    input.Stop();
    return recording ? recording->End(asked) : std::string();
}

void ViewerServer::Tell() const
{
    auto const host = HostOf(options);
    if (ports.web)
        std::fprintf(stderr, "tessella-console: the screen is at http://%s:%u/\n", host.c_str(),
            unsigned{ports.web->port});
    if (ports.vnc)
        std::fprintf(stderr, "tessella-console: VNC viewers find it at %s:%u\n", host.c_str(),
            unsigned{ports.vnc->port});
}

}

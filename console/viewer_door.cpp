#include <console/viewer_door.h>

#include <console/http_request.h>

#include <algorithm>
#include <array>
#include <exception>
#include <fstream>
#include <iterator>

#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>

namespace console {

namespace {

constexpr std::size_t kMostViewers = 16;
constexpr std::size_t kMostGuests = 32;
constexpr std::chrono::seconds kPatience{10};
constexpr int kAttendInterval = 10;  // milliseconds; a header that is half there makes its socket readable
constexpr int kKeepAliveIdle = 30;   // seconds

void SetOption(int socket, int level, int option, int value)
{
    setsockopt(socket, level, option, &value, sizeof value);
}

/// True if the call that failed may succeed later.
bool IsPassing(int error) { return error == EAGAIN || error == EWOULDBLOCK || error == EINTR; }

/// Takes from a guest's socket what has come: closed with something unread, the answer would be lost. False
/// if the guest has closed its side.
bool Discard(int socket)
{
    std::array<char, 16384> unread{};
    auto const length = recv(socket, unread.data(), unread.size(), MSG_DONTWAIT);
    return length > 0 || (length == -1 && IsPassing(errno));
}

}

ViewerDoor::ViewerDoor(ViewerShare const& shared, Ports const& opened)
    : share(shared), ports(opened), wakeFd(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK), "waiting for viewers")
{}

ViewerDoor::~ViewerDoor()
{
    stopping = true;
    eventfd_write(wakeFd.Get(), 1);
    if (thread.joinable()) thread.join();
}

void ViewerDoor::Start()
{
    thread = std::thread([this] { Run(); });
}

void ViewerDoor::Run()
{
    while (!stopping) {
        try {
            Serve();
        } catch (std::exception const&) {
            // The system has no room for what somebody wanted; there are others.
        }
    }
    viewers.clear();
}

void ViewerDoor::Serve()
{
    std::array<pollfd, 3> events = {pollfd{wakeFd.Get(), POLLIN, 0},
        pollfd{ports.web ? ports.web->socket.Get() : -1, POLLIN, 0},
        pollfd{ports.vnc ? ports.vnc->socket.Get() : -1, POLLIN, 0}};
    poll(events.data(), events.size(), guests.empty() ? -1 : kAttendInterval);
    eventfd_t ends = 0;
    eventfd_read(wakeFd.Get(), &ends);
    std::erase_if(viewers, [](auto const& viewer) { return viewer->HasEnded(); });
    if (events[1].revents != 0) Admit(*ports.web, true);
    if (events[2].revents != 0) Admit(*ports.vnc, false);
    std::erase_if(guests, [this](Guest& guest) { return !Attend(guest); });
}

void ViewerDoor::Admit(Listener const& listener, bool fromWeb)
{
    int const accepted = accept4(listener.socket.Get(), nullptr, nullptr, SOCK_CLOEXEC | SOCK_NONBLOCK);
    if (accepted == -1) {
        if (!IsPassing(errno)) poll(nullptr, 0, kAttendInterval);  // it would fail again at once
        return;
    }
    Guest guest{OwnedFd(accepted, "letting in a viewer"), fromWeb, Clock::now() + kPatience, {}};
    SetOption(accepted, IPPROTO_TCP, TCP_NODELAY, 1);
    SetOption(accepted, SOL_SOCKET, SO_KEEPALIVE, 1);
    SetOption(accepted, IPPROTO_TCP, TCP_KEEPIDLE, kKeepAliveIdle);
    if (!fromWeb) send(accepted, kRfbVersion, kRfbVersionLength, MSG_NOSIGNAL);
    // Whoever has been here for the longest has said the least.
    if (guests.size() >= kMostGuests) guests.erase(guests.begin());
    guests.push_back(std::move(guest));
}

bool ViewerDoor::Attend(Guest& guest)
{
    if (Clock::now() > guest.deadline) return false;
    if (guest.leaving) return Discard(guest.socket.Get());
    if (!guest.answer.empty()) return Send(guest);
    return guest.fromWeb ? ReadRequest(guest) : ReadVersion(guest);
}

bool ViewerDoor::ReadRequest(Guest& guest)
{
    std::array<char, kLongestHeader + 1> bytes{};
    auto const length = recv(guest.socket.Get(), bytes.data(), bytes.size(), MSG_PEEK | MSG_DONTWAIT);
    if (length == -1) return IsPassing(errno);
    if (length == 0) return false;
    auto const wish =
        ReadHttpRequest({bytes.data(), static_cast<std::size_t>(length)}, share.password.empty());
    constexpr auto text = "text/plain";
    switch (wish) {
    case HttpWish::More: return true;
    case HttpWish::WebSocket:
        if (HasRoom()) {
            LetIn(guest, RfbGreeting::WebSocket);
            return false;
        }
        guest.answer = HttpAnswer("503 Service Unavailable", text, "There are too many viewers.\n");
        break;
    case HttpWish::Page: guest.answer = Page(); break;
    case HttpWish::NotFound: guest.answer = HttpAnswer("404 Not Found", text, "Only / is here.\n"); break;
    case HttpWish::WrongMethod:
        guest.answer = HttpAnswer("405 Method Not Allowed", text, "Only GET is allowed.\n");
        break;
    case HttpWish::Forbidden:
        guest.answer = HttpAnswer("403 Forbidden", text, "Only this server's own page may connect here.\n");
        break;
    case HttpWish::TooLong:
        guest.answer = HttpAnswer("431 Request Header Fields Too Large", text, "The header is too long.\n");
        break;
    case HttpWish::Malformed: guest.answer = HttpAnswer("400 Bad Request", text, "Not understood.\n"); break;
    }
    Discard(guest.socket.Get());
    guest.deadline = Clock::now() + kPatience;
    return Send(guest);
}

bool ViewerDoor::ReadVersion(Guest& guest)
{
    std::array<char, kRfbVersionLength> bytes{};
    auto const length = recv(guest.socket.Get(), bytes.data(), bytes.size(), MSG_PEEK | MSG_DONTWAIT);
    if (length == -1) return IsPassing(errno);
    constexpr std::string_view start = "RFB 003.";
    auto const known = std::min(static_cast<std::size_t>(length), start.size());
    if (length == 0 || std::string_view(bytes.data(), known) != start.substr(0, known)) return false;
    if (static_cast<std::size_t>(length) < bytes.size()) return true;
    if (HasRoom()) LetIn(guest, RfbGreeting::Version);
    return false;
}

/// True if there is room for one more viewer. Those who haven't even given the password make room.
bool ViewerDoor::HasRoom()
{
    if (viewers.size() < kMostViewers) return true;
    auto const idle = std::find_if(
        viewers.begin(), viewers.end(), [](auto const& viewer) { return !viewer->HasGreeted(); });
    if (idle == viewers.end()) return false;
    viewers.erase(idle);
    return true;
}

void ViewerDoor::LetIn(Guest& guest, RfbGreeting greeting)
{
    viewers.push_back(std::make_unique<Viewer>(share, std::move(guest.socket), greeting, wakeFd.Get()));
}

bool ViewerDoor::Send(Guest& guest)
{
    int const socket = guest.socket.Get();
    auto const sent = send(socket, guest.answer.data(), guest.answer.size(), MSG_NOSIGNAL | MSG_DONTWAIT);
    if (sent == -1) return IsPassing(errno);
    guest.answer.erase(0, static_cast<std::size_t>(sent));
    if (!guest.answer.empty()) return true;
    shutdown(socket, SHUT_WR);
    guest.leaving = true;
    return true;
}

std::string ViewerDoor::Page() const
{
    std::ifstream file(ports.page, std::ios::binary);
    std::string const content{std::istreambuf_iterator<char>(file), {}};
    if (content.empty())
        return HttpAnswer("503 Service Unavailable", "text/plain",
            "The page, console.html, is missing from this installation. VNC viewers do without, see "
            "--vnc.\n");
    return HttpAnswer("200 OK", "text/html", content);
}

}

#include <console/listener.h>

#include <cerrno>
#include <memory>
#include <stdexcept>
#include <system_error>

#include <arpa/inet.h>
#include <netdb.h>
#include <netinet/in.h>
#include <sys/socket.h>

namespace console {

namespace {

constexpr int kBacklog = 16;

using Addresses = std::unique_ptr<addrinfo, decltype(&freeaddrinfo)>;

Addresses Resolve(std::string const& address, std::uint16_t port)
{
    addrinfo hints{};
    hints.ai_socktype = SOCK_STREAM;
    hints.ai_flags = AI_PASSIVE | AI_NUMERICSERV;
    addrinfo* found = nullptr;
    int const error = getaddrinfo(address.c_str(), std::to_string(port).c_str(), &hints, &found);
    if (error == EAI_SYSTEM) throw std::system_error(errno, std::generic_category(), address);
    if (error != 0) throw std::runtime_error(address + ": " + gai_strerror(error));
    return {found, freeaddrinfo};
}

std::uint16_t PortOf(int socket)
{
    sockaddr_storage address{};
    socklen_t length = sizeof address;
    Checked(getsockname(socket, reinterpret_cast<sockaddr*>(&address), &length), "listening");
    if (address.ss_family == AF_INET6)
        return ntohs(reinterpret_cast<sockaddr_in6 const*>(&address)->sin6_port);
    return ntohs(reinterpret_cast<sockaddr_in const*>(&address)->sin_port);
}

}

bool IsLoopback(std::string const& address)
{
    auto const found = Resolve(address, 0);
    if (found->ai_family == AF_INET6)
        return IN6_IS_ADDR_LOOPBACK(&reinterpret_cast<sockaddr_in6 const*>(found->ai_addr)->sin6_addr);
    auto const number = ntohl(reinterpret_cast<sockaddr_in const*>(found->ai_addr)->sin_addr.s_addr);
    return number >> 24 == IN_LOOPBACKNET;
}

Listener Listen(std::string const& address, std::uint16_t port)
{
    auto const found = Resolve(address, port);
    auto const purpose = "listening at " + address + ", port " + std::to_string(port);
    OwnedFd socket(
        ::socket(found->ai_family, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0), purpose.c_str());
    int const one = 1;
    setsockopt(socket.Get(), SOL_SOCKET, SO_REUSEADDR, &one, sizeof one);
    Checked(bind(socket.Get(), found->ai_addr, found->ai_addrlen), purpose.c_str());
    Checked(listen(socket.Get(), kBacklog), purpose.c_str());
    auto const chosen = PortOf(socket.Get());
    return {std::move(socket), chosen};
}

}

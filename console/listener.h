#pragma once

#include <console/owned.h>

#include <cstdint>
#include <string>

namespace console {

/// A port that is listened at.
struct Listener {
    OwnedFd socket;          ///< doesn't block
    std::uint16_t port = 0;  ///< that was chosen if none was wanted
};

/// True if only this machine can reach the address, a number or a name. Throws `std::system_error` or
/// `std::runtime_error` if there is no such address.
bool IsLoopback(std::string const& address);

/// Listens at an address. Port 0 is any that is free. Throws likewise if the system refuses.
Listener Listen(std::string const& address, std::uint16_t port);

}

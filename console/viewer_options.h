#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace console {

/// How viewers reach the console.
struct ViewerOptions {
    std::optional<std::uint16_t> webPort;  ///< 0 for any that is free
    std::optional<std::uint16_t> vncPort;  ///< likewise
    std::string address;                   ///< to listen at; empty for this machine alone
    std::string passwordFile;              ///< empty for none
    std::string recording;                 ///< a file for what they do, likewise

    bool IsWanted() const { return webPort || vncPort; }
};

}

#pragma once

#include <cstddef>
#include <optional>
#include <string_view>

namespace console {

/// A call that shall fail, and the error number it fails with.
struct Fault {
    std::size_t slot = 0;  ///< `SlotOf` a request or `SlotOfPath`
    int error = 0;
};

/// Reads "REQUEST=ERRNO": a request's name or a device's path, then the name or number of an error. Nothing
/// if either is unknown.
std::optional<Fault> ParseFault(std::string_view text);

}

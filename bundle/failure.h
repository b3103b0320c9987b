#pragma once

#include <common/error.h>
#include <common/message.h>

#include <cstdint>
#include <string>
#include <string_view>

/// What went wrong with a file of an archive.
struct Failure {
    std::uint32_t code = 0;  ///< 0 if nothing did
    MessageKey key{};        ///< of what is told to users
    std::string detail;      ///< what the parts below have to say
    Common::Location where;
};

/// A failure as bytes of an error chain: `message`, which is UTF-8, with the names of the file and its
/// archive, and the detail as its reason.
std::string SerializeFailure(
    Failure const& failure, std::string_view message, std::string_view entry, std::string_view archive);

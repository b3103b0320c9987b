#pragma once

#include <string>
#include <string_view>

namespace console {

/// What a browser, or something else that has found the port, wants.
enum class HttpWish : unsigned char {
    More,       ///< the header isn't there as a whole yet
    WebSocket,  ///< an upgrade that may be granted
    Page,
    NotFound,
    WrongMethod,
    Forbidden,  ///< an upgrade for a page that isn't ours
    Malformed,
    TooLong,
};

/// The longest header, with the empty line at its end.
inline constexpr std::size_t kLongestHeader = 4000;

/// Says what is wanted, from what has come so far. The bytes may be anything.
///
/// Any page that a browser shows can open a WebSocket to any host, so an upgrade must come from a page of the
/// host that it goes to. With `localOnly` that host must be this machine's own name for itself, too: any
/// other name could have been given our address by whoever owns it.
HttpWish ReadHttpRequest(std::string_view received, bool localOnly);

/// An answer that closes the connection. `type` is the content's, for example text/plain.
std::string HttpAnswer(char const* status, char const* type, std::string const& content);

}

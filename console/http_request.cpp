#include <console/http_request.h>

#include <algorithm>
#include <optional>

#include <strings.h>

namespace console {

namespace {

constexpr std::string_view kLineEnd = "\r\n";

bool EqualsIgnoringCase(std::string_view a, std::string_view b)
{
    return a.size() == b.size() && strncasecmp(a.data(), b.data(), a.size()) == 0;
}

std::string_view TakeUntil(std::string_view& text, std::string_view separator)
{
    auto const end = std::min(text.find(separator), text.size());
    auto const part = text.substr(0, end);
    text.remove_prefix(std::min(end + separator.size(), text.size()));
    return part;
}

std::string_view Trimmed(std::string_view text)
{
    auto const first = std::min(text.find_first_not_of(" \t"), text.size());
    auto const last = text.find_last_not_of(" \t");
    return last == std::string_view::npos ? "" : text.substr(first, last + 1 - first);
}

struct Header {
    std::string_view method, path, version;
    std::string_view upgrade;
    // More than one of these, and somebody is to be deceived.
    std::optional<std::string_view> host, origin;
};

std::optional<Header> Parse(std::string_view text)
{
    Header header;
    auto line = TakeUntil(text, kLineEnd);
    header.method = TakeUntil(line, " ");
    header.path = TakeUntil(line, " ");
    header.version = line;
    if (!header.path.starts_with('/') || (header.version != "HTTP/1.1" && header.version != "HTTP/1.0"))
        return std::nullopt;
    while (!text.empty()) {
        auto value = TakeUntil(text, kLineEnd);
        auto const name = TakeUntil(value, ":");
        value = Trimmed(value);
        if (EqualsIgnoringCase(name, "upgrade")) header.upgrade = value;
        for (auto const& [known, place] : {std::pair("host", &header.host), {"origin", &header.origin}}) {
            if (!EqualsIgnoringCase(name, known)) continue;
            if (*place) return std::nullopt;
            *place = value;
        }
    }
    return header;
}

/// The name in a Host header, which may have a port behind it.
std::string_view NameOf(std::string_view host)
{
    if (host.starts_with('[')) return host.substr(0, host.find(']') + 1);
    return host.substr(0, host.find(':'));
}

bool IsLocal(std::string_view host)
{
    auto const name = NameOf(host);
    return EqualsIgnoringCase(name, "localhost") || name == "[::1]" ||
        (name.starts_with("127.") && name.find_first_not_of(".0123456789") == std::string_view::npos);
}

bool MayUpgrade(Header const& header, bool localOnly)
{
    if (!header.host || !header.origin) return false;
    auto origin = *header.origin;
    auto const scheme = TakeUntil(origin, "://");
    return (scheme == "http" || scheme == "https") && EqualsIgnoringCase(origin, *header.host) &&
        (!localOnly || IsLocal(*header.host));
}

bool IsText(char c)
{
    auto const code = static_cast<unsigned char>(c);
    return c == '\r' || c == '\n' || c == '\t' || (code >= ' ' && code != 0x7F);
}

}

HttpWish ReadHttpRequest(std::string_view received, bool localOnly)
{
    constexpr std::string_view headerEnd = "\r\n\r\n";
    auto const end = received.find(headerEnd);
    auto const text = received.substr(0, end);
    if (!std::all_of(text.begin(), text.end(), IsText)) return HttpWish::Malformed;
    if (std::min(end, received.size()) > kLongestHeader - headerEnd.size()) return HttpWish::TooLong;
    if (end == std::string_view::npos) return HttpWish::More;
    auto const header = Parse(text);
    if (!header) return HttpWish::Malformed;
    if (header->method != "GET") return HttpWish::WrongMethod;
    if (EqualsIgnoringCase(header->upgrade, "websocket"))
        return MayUpgrade(*header, localOnly) ? HttpWish::WebSocket : HttpWish::Forbidden;
    return header->path.substr(0, header->path.find('?')) == "/" ? HttpWish::Page : HttpWish::NotFound;
}

std::string HttpAnswer(char const* status, char const* type, std::string const& content)
{
    return std::string("HTTP/1.1 ") + status + "\r\nContent-Type: " + type +
        "; charset=utf-8\r\nContent-Length: " + std::to_string(content.size()) +
        "\r\nCache-Control: no-store\r\nX-Content-Type-Options: nosniff\r\n"
        "Content-Security-Policy: frame-ancestors 'none'\r\nConnection: close\r\n\r\n" +
        content;
}

}

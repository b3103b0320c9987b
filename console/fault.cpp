#include <console/display_mode.h>
#include <console/fault.h>
#include <console/request.h>

#include <cstring>
#include <string>

namespace console {

namespace {

constexpr int kLastErrno = 133;  // EHWPOISON

std::optional<std::size_t> FindSlot(std::string_view name)
{
    for (auto const& info : kRequests) {
        if (name == info.name) return SlotOf(info.request);
    }
    auto const path = FindDevicePath(std::string(name).c_str());
    if (!path) return std::nullopt;
    return SlotOfPath(*path);
}

std::optional<int> FindError(std::string_view name)
{
    auto const number = ParseNumber(name);
    if (number && *number >= 1 && *number <= kLastErrno) return static_cast<int>(*number);
    for (int error = 1; error <= kLastErrno; ++error) {
        char const* const known = strerrorname_np(error);
        if (known != nullptr && name == known) return error;
    }
    return std::nullopt;
}

}

std::optional<Fault> ParseFault(std::string_view text)
{
    auto const equals = text.find('=');
    if (equals == std::string_view::npos) return std::nullopt;
    auto const slot = FindSlot(text.substr(0, equals));
    auto const error = FindError(text.substr(equals + 1));
    if (!slot || !error) return std::nullopt;
    return Fault{*slot, *error};
}

}

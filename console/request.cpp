#include <console/request.h>

#include <cstring>

namespace console {

namespace {

constexpr bool RequestsInOrder()
{
    for (std::size_t i = 0; i < kRequests.size(); ++i) {
        if (SlotOf(kRequests[i].request) != i) return false;
    }
    return true;
}

static_assert(RequestsInOrder());

}

RequestInfo const* FindIoctl(unsigned long number)
{
    if (number == 0) return nullptr;
    for (auto const& info : kRequests) {
        if (info.number == number) return &info;
    }
    return nullptr;
}

std::optional<std::size_t> FindDevicePath(char const* path)
{
    // Nearly every path of a program fails here, at its first letters.
    if (path == nullptr || std::strncmp(path, "/dev", 4) != 0) return std::nullopt;
    for (std::size_t i = 0; i < kDevicePaths.size(); ++i) {
        if (std::strcmp(kDevicePaths[i].path, path) == 0) return i;
    }
    return std::nullopt;
}

}

#include <console/owned.h>

#include <cerrno>
#include <system_error>
#include <utility>

#include <sys/mman.h>
#include <unistd.h>

namespace console {

int Checked(int result, char const* purpose)
{
    if (result == -1) throw std::system_error(errno, std::generic_category(), purpose);
    return result;
}

OwnedFd::OwnedFd(int result, char const* purpose) : fd(Checked(result, purpose)) {}

OwnedFd::~OwnedFd() { Close(); }

OwnedFd::OwnedFd(OwnedFd&& other) noexcept : fd(std::exchange(other.fd, -1)) {}

OwnedFd& OwnedFd::operator=(OwnedFd&& other) noexcept
{
    std::swap(fd, other.fd);
    return *this;
}

void OwnedFd::Close()
{
    if (fd != -1) close(std::exchange(fd, -1));
}

OwnedMapping::OwnedMapping(int fd, std::size_t size, Access access, char const* purpose) : length(size)
{
    int const protection = access == Access::Write ? PROT_READ | PROT_WRITE : PROT_READ;
    memory = mmap(nullptr, size, protection, MAP_SHARED, fd, 0);
    if (memory == MAP_FAILED) throw std::system_error(errno, std::generic_category(), purpose);
}

OwnedMapping::~OwnedMapping()
{
    if (memory != nullptr) munmap(memory, length);
}

OwnedMapping::OwnedMapping(OwnedMapping&& other) noexcept
    : memory(std::exchange(other.memory, nullptr)), length(other.length)
{}

OwnedMapping& OwnedMapping::operator=(OwnedMapping&& other) noexcept
{
    std::swap(memory, other.memory);
    std::swap(length, other.length);
    return *this;
}

}

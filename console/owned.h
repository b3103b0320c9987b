#pragma once

#include <cstddef>

namespace console {

/// A descriptor that is closed with its owner.
class OwnedFd {
public:
    OwnedFd() = default;
    /// Takes the result of a system call that makes a descriptor. Throws `std::system_error` with `purpose`
    /// if it failed.
    OwnedFd(int result, char const* purpose);
    ~OwnedFd();
    OwnedFd(OwnedFd&& other) noexcept;
    OwnedFd& operator=(OwnedFd&& other) noexcept;

    int Get() const { return fd; }
    void Close();

private:
    int fd = -1;
};

/// A shared mapping of a file, from its start. Ends with its owner.
class OwnedMapping {
public:
    enum class Access : unsigned char { Read, Write };

    OwnedMapping() = default;
    /// Throws `std::system_error` with `purpose` if the system refuses.
    OwnedMapping(int fd, std::size_t size, Access access, char const* purpose);
    ~OwnedMapping();
    OwnedMapping(OwnedMapping&& other) noexcept;
    OwnedMapping& operator=(OwnedMapping&& other) noexcept;

    void* Get() const { return memory; }

private:
    void* memory = nullptr;
    std::size_t length = 0;
};

/// The result of a system call. Throws `std::system_error` with errno and `purpose` if it is -1.
int Checked(int result, char const* purpose);

}

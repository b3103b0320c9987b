#pragma once

#include <file/file.h>

#include <memory>

/// A file of the system, open for reading.
class posix_file final : public ri_file {
public:
    /// Null if there is no regular file of this name that can be read.
    static std::unique_ptr<posix_file> Open(char const* path);

    ~posix_file() override;

    void Read(void* buffer, std::uint64_t size, std::uint64_t& count) override;
    std::uint64_t Seek(std::uint64_t position) override;
    std::uint64_t SeekCurrent(std::int64_t distance) override;
    std::uint64_t SeekEnd(std::int64_t distance) override;

private:
    explicit posix_file(int file) : descriptor(file) {}
    std::uint64_t Move(std::int64_t distance, int whence);

    int const descriptor;
};

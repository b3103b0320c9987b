#include <file/posix_file.h>

#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

using Common::LocationOf;

namespace {

constexpr char kFile[] = "file/posix_file";

Common::Error Failure(unsigned code, MessageKey key, Common::Location const& where)
{
    int const number = errno;
    Common::Error error(code, GetMessage(key), where);
    return Common::AddPosixError(error, number);
}

}

std::unique_ptr<posix_file> posix_file::Open(char const* path)
{
    // Without waiting, should it be a pipe that nobody writes to.
    int const descriptor = open(path, O_RDONLY | O_CLOEXEC | O_NOCTTY | O_NONBLOCK);
    if (descriptor == -1) return nullptr;
    std::unique_ptr<posix_file> file(new posix_file(descriptor));
    struct stat status;
    if (fstat(descriptor, &status) == -1 || !S_ISREG(status.st_mode)) return nullptr;
    return file;
}

posix_file::~posix_file() { close(descriptor); }

void posix_file::Read(void* buffer, std::uint64_t size, std::uint64_t& count)
{
    count = 0;
    while (!error && count < size) {
        ssize_t const got = read(descriptor, static_cast<unsigned char*>(buffer) + count, size - count);
        if (got == 0) return;
        if (got > 0)
            count += static_cast<std::uint64_t>(got);
        else if (errno != EINTR)
            error = Failure(Common::ErrorReadFailed, MessageReadFailed, LocationOf(kFile, "Read", __LINE__));
    }
}

std::uint64_t posix_file::Seek(std::uint64_t position)
{
    return Move(static_cast<std::int64_t>(position), SEEK_SET);
}

std::uint64_t posix_file::SeekCurrent(std::int64_t distance) { return Move(distance, SEEK_CUR); }

std::uint64_t posix_file::SeekEnd(std::int64_t distance) { return Move(distance, SEEK_END); }

std::uint64_t posix_file::Move(std::int64_t distance, int whence)
{
    if (error) return 0;
    off_t const position = lseek(descriptor, distance, whence);
    if (position == -1) {
        error = Failure(Common::ErrorSeekFailed, MessageSeekFailed, LocationOf(kFile, "Move", __LINE__));
        return 0;
    }
    return static_cast<std::uint64_t>(position);
}

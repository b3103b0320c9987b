#pragma once

#include <common/error.h>
#include <common/message.h>

#include <cstdint>

/// Files of every kind. They never throw: a file keeps its first failure in `error`, and from then on its
/// operations do nothing and answer 0. A file belongs to one thread at a time; whoever gets one deletes it.
class file_object {
public:
    file_object() = default;
    file_object(file_object const&) = delete;
    file_object& operator=(file_object const&) = delete;
    virtual ~file_object() = default;

    /// A request to the device behind the file. False, with an error, where there are no such requests.
    virtual bool IOCTL(unsigned long request, void* argument);

    Common::Error error;  ///< the first failure; empty while there was none
};

class i_file : public virtual file_object {
public:
    /// Reads up to `size` bytes from the position on. `count` gets how many; 0 at the end, which is no error.
    virtual void Read(void* buffer, std::uint64_t size, std::uint64_t& count) = 0;
};

class sized_file : public virtual file_object {
public:
    /// Back to position 0.
    virtual void Rewind() = 0;
    /// The length of the file in bytes.
    virtual std::uint64_t Size() = 0;
};

class o_file : public virtual file_object {
public:
    /// Writes `size` bytes at the position. `count` gets how many have been written.
    virtual void Write(void const* buffer, std::uint64_t size, std::uint64_t& count) = 0;
    virtual void Flush() {}
};

class si_file : public i_file, public sized_file {};

class raccess_file : public sized_file {
public:
    /// Each moves the position, counted from the start, from where it is, or from the end, and answers it.
    virtual std::uint64_t Seek(std::uint64_t position) = 0;
    virtual std::uint64_t SeekCurrent(std::int64_t distance) = 0;
    virtual std::uint64_t SeekEnd(std::int64_t distance) = 0;

    void Rewind() override { Seek(0); }
    std::uint64_t Size() override;
};

class ri_file : public si_file, public raccess_file {
public:
    void Rewind() override { raccess_file::Rewind(); }
    std::uint64_t Size() override { return raccess_file::Size(); }
};

class ro_file : public o_file, public raccess_file {};

class rio_file : public ri_file, public ro_file {};

/// A read that must be complete: the file has an error if fewer than `size` bytes were left. Those are in
/// `buffer` even then.
inline void ReadAll(i_file& file, void* buffer, std::uint64_t size)
{
    std::uint64_t count = 0;
    file.Read(buffer, size, count);
    if (!file.error && count != size) {
        file.error = Common::Error(Common::ErrorEndOfFile, GetMessage(MessageEndOfFile),
            Common::LocationOf("include/file/file", "Read", 27));
    }
}

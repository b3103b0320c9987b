#pragma once

#include <memory>
#include <string>
#include <string_view>

class si_file;

/// A folder of the system.
class posix_dir {
public:
    /// Opens the file of this name for reading; `flags` must be 0. A path starts from this folder, unless
    /// it is absolute. Null if there is no such file, or it is not a regular one.
    virtual std::unique_ptr<si_file> Open(std::u16string_view name, unsigned flags);

    explicit posix_dir(std::string folder) : path(std::move(folder)) {}
    posix_dir(posix_dir const&) = delete;
    posix_dir& operator=(posix_dir const&) = delete;
    virtual ~posix_dir() = default;

private:
    std::string path;
};

/// The folder that was the working directory at the first call in this process; the root if there was none.
/// From any thread.
std::unique_ptr<posix_dir> OpenWorkingDir();

#include <file/posix_dir.h>

#include <file/file_name.h>
#include <file/posix_file.h>

#include <array>
#include <unistd.h>

std::unique_ptr<si_file> posix_dir::Open(std::u16string_view name, unsigned flags)
{
    auto const systemName = SystemFileName(name);
    if (flags != 0 || !systemName) return nullptr;
    if (systemName->front() == '/') return posix_file::Open(systemName->c_str());
    return posix_file::Open((path + '/' + *systemName).c_str());
}

std::unique_ptr<posix_dir> OpenWorkingDir()
{
    static std::string const folder = [] {
        std::array<char, 4096> buffer;
        char const* const found = getcwd(buffer.data(), buffer.size());
        return std::string(found != nullptr ? found : "/");
    }();
    return std::make_unique<posix_dir>(folder);
}

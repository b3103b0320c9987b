#include <common/library_path.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <dlfcn.h>
#include <mutex>
#include <unistd.h>

namespace {

using PathBuffer = std::array<char, 4096>;

/// Leaves `path` empty if the loader knows no path, only a bare name, or one that is too long.
void FindLoadedFile(PathBuffer& path)
{
    Dl_info info;
    if (dladdr(reinterpret_cast<void const*>(&GetLibraryPath), &info) == 0) return;
    std::string_view const name = info.dli_fname;
    if (name.find('/') == std::string_view::npos) return;
    if (name.front() != '/' && getcwd(path.data(), path.size()) == nullptr) {
        path[0] = 0;
        return;
    }
    NormalizePath(path, name);
}

}

bool NormalizePath(std::span<char> path, std::string_view name)
{
    // Without the closing slash a folder is a prefix ready for the next component; the root is nothing.
    std::size_t length = name.starts_with('/') ? 0 : strnlen(path.data(), path.size());
    if (length == 1) length = 0;
    for (std::size_t start = 0; start < name.size();) {
        std::size_t const end = std::min(name.find('/', start), name.size());
        std::string_view const component = name.substr(start, end - start);
        start = end + 1;
        if (component.empty() || component == ".") continue;
        if (component == "..") {
            std::string_view const folder(path.data(), length);
            length = length == 0 ? 0 : folder.rfind('/');
            continue;
        }
        if (length + 1 + component.size() >= path.size()) {
            path[0] = 0;
            return false;
        }
        path[length] = '/';
        component.copy(&path[length + 1], component.size());
        length += 1 + component.size();
    }
    if (length == 0) path[length++] = '/';
    path[length] = 0;
    return true;
}

char const* GetLibraryPath()
{
    static std::mutex mutex;
    static PathBuffer path;  // guarded by mutex while it is empty; never changes afterwards
    std::lock_guard const lock(mutex);
    if (path[0] == 0) FindLoadedFile(path);
    if (path[0] == 0) {
        ssize_t const length = readlink("/proc/self/exe", path.data(), path.size() - 1);
        path[length > 0 ? static_cast<std::size_t>(length) : 0] = 0;
    }
    return path.data();
}

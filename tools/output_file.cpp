#include <tools/output_file.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <stdexcept>

namespace tools {

void WriteFile(std::string const& path, std::string_view bytes)
{
    int error = 0;
    if (std::FILE* const file = std::fopen(path.c_str(), "wb")) {
        if (std::fwrite(bytes.data(), 1, bytes.size(), file) != bytes.size()) error = errno;
        if (std::fclose(file) != 0 && error == 0) error = errno;
    } else {
        error = errno;
    }
    if (error != 0) throw std::runtime_error(path + ": cannot be written: " + std::strerror(error));
}

}

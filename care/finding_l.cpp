#include <care/finding.h>

#include <cerrno>
#include <cstring>

#include <grp.h>
#include <sys/stat.h>

namespace care {

std::string CannotOpen(char const* path, int error)
{
    return std::string(path) + " can't be opened: " + std::strerror(error);
}

std::string MendOpening(char const* path, int error, char const* whenMissing)
{
    if (error == EACCES || error == EPERM) {
        struct stat node {};
        group const* const owner = stat(path, &node) == 0 ? getgrgid(node.st_gid) : nullptr;
        std::string const root = "Run the program as root";
        if (owner == nullptr || (node.st_mode & S_IRGRP) == 0) return root + ".";
        return root + ", or add its user to the group \"" + owner->gr_name + "\" (usermod -aG " +
            owner->gr_name + " USER; it counts from the next login on).";
    }
    if (error == EBUSY) return "Another program has the device for itself: end that program.";
    return whenMissing;
}

}

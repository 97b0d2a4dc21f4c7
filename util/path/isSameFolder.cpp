// SPDX-License-Identifier: MIT
#include "util/path/isSameFolder.hpp"

#include <sys/stat.h>

namespace vclink::git
{

bool isSameFolder(const std::string &one, const std::string &other) noexcept
{
    struct stat first = {};
    struct stat second = {};
    return ::stat(one.c_str(), &first) == 0 && ::stat(other.c_str(), &second) == 0 &&
           first.st_dev == second.st_dev && first.st_ino == second.st_ino;
}

} // namespace vclink::git

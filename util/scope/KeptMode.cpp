// SPDX-License-Identifier: MIT
#include "util/scope/KeptMode.hpp"

#include <utility>

#include <fcntl.h>
#include <sys/stat.h>

namespace vclink::git
{
namespace
{

constexpr mode_t modeBits = 07777;

bool isSameFile(const struct stat &left, const struct stat &right)
{
    return left.st_dev == right.st_dev && left.st_ino == right.st_ino;
}

} // namespace

KeptMode::KeptMode(std::string path)
    : path_(std::move(path)), before_(::open(path_.c_str(), O_PATH | O_CLOEXEC))
{
}

KeptMode::~KeptMode()
{
    struct stat before = {};
    struct stat now = {};
    if (before_ && ::fstat(before_.get(), &before) == 0 && ::stat(path_.c_str(), &now) == 0 &&
        !isSameFile(before, now) && (before.st_mode & modeBits) != (now.st_mode & modeBits))
    {
        ::chmod(path_.c_str(), before.st_mode & modeBits);
    }
}

} // namespace vclink::git

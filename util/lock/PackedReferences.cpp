// SPDX-License-Identifier: MIT
#include "util/lock/PackedReferences.hpp"

#include <cerrno>

#include <fcntl.h>
#include <git2/errors.h>
#include <git2/repository.h>
#include <unistd.h>

#include "error/errorUtil/raiseSystemError.hpp"
#include "util/scope/FileDescriptor.hpp"

namespace vclink::git
{

PackedReferences::PackedReferences(git_repository *repository)
    : path_(git_repository_commondir(repository) + std::string("packed-refs")),
      lock_(path_ + ".lock")
{
}

PackedReferences::~PackedReferences()
{
    if (isLocked_)
    {
        ::unlink(lock_.c_str());
    }
}

GitResult<void> PackedReferences::lock()
{
    const FileDescriptor file(::open(lock_.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC,
                                     S_IRUSR | S_IWUSR | S_IRGRP | S_IROTH));
    if (file)
    {
        isLocked_ = true;
        return boost::outcome_v2::success();
    }
    const int error = errno;
    const std::string text = "failed to create locked file '" + lock_ + "'";
    if (error != EEXIST)
    {
        raiseSystemError(error, text);
    }
    git_error_set_str(GIT_ERROR_REFERENCE, text.c_str());
    return GitError(GIT_ELOCKED);
}

void PackedReferences::release() noexcept
{
    noted_ = status();
    ::unlink(lock_.c_str());
    isLocked_ = false;
}

bool PackedReferences::haveChanged() const noexcept
{
    const struct stat now = status();
    return now.st_ino != noted_.st_ino || now.st_size != noted_.st_size ||
           now.st_mtim.tv_sec != noted_.st_mtim.tv_sec ||
           now.st_mtim.tv_nsec != noted_.st_mtim.tv_nsec;
}

/// Returns zeros if there is no file.
struct stat PackedReferences::status() const noexcept
{
    struct stat status = {};
    if (::stat(path_.c_str(), &status) != 0)
    {
        return {};
    }
    return status;
}

} // namespace vclink::git

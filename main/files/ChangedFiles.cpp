// SPDX-License-Identifier: MIT
#include "main/files/ChangedFiles.hpp"

#include <cerrno>

#include <fcntl.h>

#include "main/files/HeldEntries.hpp"

namespace vclink::git
{
namespace
{

/// The mode that Git has for what is there; GIT_FILEMODE_UNREADABLE if it is no file and no link.
std::uint32_t modeOf(const struct stat &status)
{
    if (S_ISLNK(status.st_mode))
    {
        return GIT_FILEMODE_LINK;
    }
    if (!S_ISREG(status.st_mode))
    {
        return GIT_FILEMODE_UNREADABLE;
    }
    return (status.st_mode & S_IXUSR) != 0 ? GIT_FILEMODE_BLOB_EXECUTABLE : GIT_FILEMODE_BLOB;
}

/// Not every program that writes an index writes fractions of seconds.
bool isSameTime(const git_index_time &noted, const timespec &time)
{
    return noted.seconds == static_cast<std::int32_t>(time.tv_sec) &&
           (noted.nanoseconds == 0 ||
            noted.nanoseconds == static_cast<std::uint32_t>(time.tv_nsec));
}

/// Whether the file looks as it did when the index took it.
bool isAsNoted(const git_index_entry &entry, const struct stat &status)
{
    return entry.mode == modeOf(status) &&
           entry.file_size == static_cast<std::uint32_t>(status.st_size) &&
           isSameTime(entry.mtime, status.st_mtim) && isSameTime(entry.ctime, status.st_ctim) &&
           entry.ino == static_cast<std::uint32_t>(status.st_ino) &&
           entry.uid == static_cast<std::uint32_t>(status.st_uid) &&
           entry.gid == static_cast<std::uint32_t>(status.st_gid);
}

bool isCompared(const git_index_entry &entry)
{
    return GIT_INDEX_ENTRY_STAGE(&entry) == GIT_INDEX_STAGE_NORMAL && isFileMode(entry.mode) &&
           !isLeftOut(entry) && !isAssumedUnchanged(entry);
}

bool isMissing(int error)
{
    return error == ENOENT || error == ENOTDIR;
}

} // namespace

bool isFileMode(std::uint32_t mode) noexcept
{
    return mode == GIT_FILEMODE_BLOB || mode == GIT_FILEMODE_BLOB_EXECUTABLE ||
           mode == GIT_FILEMODE_LINK;
}

bool isForAttributes(std::string_view path) noexcept
{
    return path.substr(path.rfind('/') + 1) == ".gitattributes";
}

ChangedFiles::ChangedFiles(const char *workdir, git_index *index)
    : workdir_(::open(workdir, O_PATH | O_DIRECTORY | O_CLOEXEC)), index_(index)
{
    struct stat status = {};
    if (::stat(git_index_path(index), &status) == 0)
    {
        indexTime_ = static_cast<std::int32_t>(status.st_mtim.tv_sec);
    }
}

int ChangedFiles::look(const char *path, struct stat &status) const
{
    return ::fstatat(workdir_.get(), path, &status, AT_SYMLINK_NOFOLLOW) == 0 ? 0 : errno;
}

bool ChangedFiles::isGone(const char *path) const
{
    struct stat status = {};
    return isMissing(look(path, status));
}

bool ChangedFiles::isOtherSize(const git_index_entry &entry) const
{
    struct stat status = {};
    return look(entry.path, status) != 0 ||
           entry.file_size != static_cast<std::uint32_t>(status.st_size);
}

bool ChangedFiles::isEmptied(const git_index_entry &entry) const
{
    struct stat status = {};
    return look(entry.path, status) == 0 && S_ISREG(status.st_mode) && status.st_size == 0;
}

bool ChangedFiles::isRacy(const git_index_entry &entry) const noexcept
{
    return entry.mtime.seconds >= indexTime_;
}

bool ChangedFiles::isChanged(const git_index_entry &entry) const
{
    if (!isCompared(entry))
    {
        return false;
    }
    struct stat status = {};
    const int error = look(entry.path, status);
    if (error != 0)
    {
        return isMissing(error);
    }
    // Where core.symlinks is off, libgit2 fails at some of them.
    if (S_ISLNK(status.st_mode) && (git_index_caps(index_) & GIT_INDEX_CAPABILITY_NO_SYMLINKS) != 0)
    {
        return false;
    }
    // What is in a file with attributes decides on other files, too.
    return isFileMode(modeOf(status)) &&
           (!isAsNoted(entry, status) || (isRacy(entry) && isForAttributes(entry.path)));
}

} // namespace vclink::git

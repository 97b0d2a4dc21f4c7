// SPDX-License-Identifier: MIT
#include "util/repository/ChangedFiles.hpp"

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <optional>
#include <string_view>
#include <utility>

#include <git2/index.h>
#include <git2/repository.h>
#include <strings.h>
#include <sys/stat.h>

#include "util/repository/entryStatus.hpp"
#include "util/repository/objectIds.hpp"

namespace vclink::git
{
namespace
{

/// The mode that Git has for what is there. GIT_FILEMODE_UNREADABLE if it is not a file or link.
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

bool isFile(std::uint32_t mode)
{
    return mode == GIT_FILEMODE_BLOB || mode == GIT_FILEMODE_BLOB_EXECUTABLE;
}

bool isEmptyFile(const struct stat &status)
{
    return S_ISREG(status.st_mode) && status.st_size == 0;
}

/// An entry that is to be compared by its content has the size of an empty file.
bool isEmptyButNotNoted(const git_index_entry &entry, const struct stat &status)
{
    return isEmptyFile(status) && !isEmptyBlob(entry.id);
}

bool isAsNoted(const git_index_entry &entry, std::uint32_t mode, const struct stat &status)
{
    return entry.mode == mode && entry.file_size == static_cast<std::uint32_t>(status.st_size) &&
           isSameTime(entry.mtime, status.st_mtim) && isSameTime(entry.ctime, status.st_ctim) &&
           entry.ino == static_cast<std::uint32_t>(status.st_ino) &&
           entry.uid == static_cast<std::uint32_t>(status.st_uid) &&
           entry.gid == static_cast<std::uint32_t>(status.st_gid) &&
           !isEmptyButNotNoted(entry, status);
}

bool isNormal(const git_index_entry &entry)
{
    return GIT_INDEX_ENTRY_STAGE(&entry) == GIT_INDEX_STAGE_NORMAL;
}

bool isCompared(const git_index_entry &entry)
{
    return (entry.flags & GIT_INDEX_ENTRY_VALID) == 0 &&
           (entry.flags_extended & GIT_INDEX_ENTRY_SKIP_WORKTREE) == 0;
}

/// The second in which the index file was written, or 0, before all entries.
std::int32_t timeOf(git_index *index)
{
    struct stat status = {};
    const char *const path = git_index_path(index);
    return path != nullptr && ::stat(path, &status) == 0
               ? static_cast<std::int32_t>(status.st_mtim.tv_sec)
               : 0;
}

/// Returns 0 or the error. After an error tries once more, so that a temporary one does not hide a
/// file.
int readStatus(const char *path, struct stat &status)
{
    if (::lstat(path, &status) == 0)
    {
        return 0;
    }
    if (errno != ENOENT && errno != ENOTDIR && ::lstat(path, &status) == 0)
    {
        return 0;
    }
    return errno;
}

/// Looks at the entries of one index, in their order.
class Look
{
  public:
    Look(std::string_view workdir, git_index *index)
        : path_(workdir.begin(), workdir.end()), rootSize_(path_.size()), indexTime_(timeOf(index))
    {
    }

    std::optional<ChangedFile> at(const git_index_entry &entry)
    {
        const git_index_entry *const last = std::exchange(last_, &entry);
        if (!isNormal(entry))
        {
            // The entry without a conflict comes first.
            const bool hasBoth =
                last != nullptr && isNormal(*last) && std::strcmp(last->path, entry.path) == 0;
            dependOnOrder_ = dependOnOrder_ || hasBoth || isForAttributes(entry.path);
            hasConflicts_ = true;
            return std::nullopt;
        }
        return isCompared(entry) && entry.mode != GIT_FILEMODE_COMMIT ? compare(entry)
                                                                      : std::nullopt;
    }

    bool dependOnOrder() const noexcept
    {
        return dependOnOrder_;
    }
    bool hasConflicts() const noexcept
    {
        return hasConflicts_;
    }

  private:
    std::optional<ChangedFile> compare(const git_index_entry &entry)
    {
        const int error = readStatus(pathOf(entry), status_);
        if (error == ENOENT || error == ENOTDIR)
        {
            return ChangedFile{entry.path, GIT_FILEMODE_UNREADABLE, isFile(entry.mode), false};
        }
        const std::uint32_t mode = modeOf(status_);
        if (error != 0 || mode == GIT_FILEMODE_UNREADABLE)
        {
            dependOnOrder_ = dependOnOrder_ || isForAttributes(entry.path);
            return std::nullopt;
        }
        // What is in a file with attributes decides about other files too.
        const bool isDoubtful = entry.mtime.seconds >= indexTime_ && isForAttributes(entry.path);
        if (isAsNoted(entry, mode, status_) && !isDoubtful)
        {
            return std::nullopt;
        }
        return ChangedFile{entry.path, mode, isFile(mode) && isFile(entry.mode),
                           isEmptyFile(status_)};
    }

    /// In a buffer that only grows, because this runs for each file.
    const char *pathOf(const git_index_entry &entry)
    {
        const std::size_t size = std::strlen(entry.path) + 1;
        path_.resize(std::max(path_.size(), rootSize_ + size));
        std::memcpy(path_.data() + rootSize_, entry.path, size);
        return path_.data();
    }

    std::vector<char> path_;
    std::size_t rootSize_;
    struct stat status_ = {};
    std::int32_t indexTime_;
    const git_index_entry *last_ = nullptr;
    bool dependOnOrder_ = false;
    bool hasConflicts_ = false;
};

} // namespace

ChangedFiles::ChangedFiles(git_repository *repository, git_index *index)
{
    const char *const workdir = git_repository_workdir(repository);
    if (workdir == nullptr)
    {
        return;
    }
    Look look(workdir, index);
    const std::size_t count = git_index_entrycount(index);
    for (std::size_t i = 0; i < count; ++i)
    {
        if (auto changed = look.at(*git_index_get_byindex(index, i)))
        {
            files_.push_back(*std::move(changed));
        }
    }
    dependOnOrder_ = look.dependOnOrder();
    hasConflicts_ = look.hasConflicts();
}

bool isForAttributes(const std::string &path) noexcept
{
    // A file system may ignore case.
    return ::strcasecmp(path.c_str() + (path.rfind('/') + 1), ".gitattributes") == 0;
}

} // namespace vclink::git

// SPDX-License-Identifier: MIT
#include "main/files/indexRefresh.hpp"

#include <cerrno>
#include <cstddef>
#include <cstdint>
#include <ctime>
#include <string>
#include <tuple>
#include <vector>

#include <fcntl.h>
#include <git2/errors.h>
#include <git2/index.h>
#include <git2/repository.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/raiseSystemError.hpp"
#include "main/files/EmptiedFiles.hpp"
#include "main/files/IdentifiedFiles.hpp"
#include "util/path/foldersAbove.hpp"
#include "util/repository/repository.hpp"

namespace vclink::git
{
namespace
{

bool isIndexed(git_index *index, const char *path)
{
    std::size_t position = 0;
    const GitResult<void> found = call(git_index_find, &position, index, path);
    if (found.has_error() && found.error().getCode() == GIT_ENOTFOUND)
    {
        return false;
    }
    found.value();
    return true;
}

/// Returns why a folder above the file cannot be listed (the refresh misses its files then), or 0
/// if all can.
int findHidingFolder(const std::string &workdir, const std::string &path)
{
    int error = 0;
    anyFolderAbove(path,
                   [&](const std::string &name)
                   {
                       const std::string folder = workdir + name;
                       error =
                           faccessat(AT_FDCWD, folder.c_str(), R_OK, AT_EACCESS) != 0 ? errno : 0;
                       return error != 0;
                   });
    return error;
}

/// Returns why the file cannot be read, or could not before, or 0 if it can or does not exist.
int findObstacle(const std::string &workdir, const std::string &path)
{
    struct stat status = {};
    if (lstat((workdir + path).c_str(), &status) == 0)
    {
        const int error = findHidingFolder(workdir, path);
        // If it can be seen, the refresh would have staged a file or link. Anything else, such as a
        // folder, means that the tracked file is gone.
        const bool isMissed =
            (S_ISREG(status.st_mode) || S_ISLNK(status.st_mode)) && !hasLinkAbove(workdir, path);
        return error == 0 && isMissed ? EIO : error;
    }
    return errno == ENOENT || errno == ENOTDIR ? 0 : errno;
}

/// A file that cannot be examined may exist. git fails for it too.
void refuseUnreadable(const std::string &workdir, const std::string &path)
{
    const int error = findObstacle(workdir, path);
    if (error != 0)
    {
        raiseSystemError(error, "could not read '" + path + "', which is tracked");
    }
}

bool isOfTime(const git_index_entry &entry, const timespec &time)
{
    return entry.mtime.seconds == time.tv_sec &&
           entry.mtime.nanoseconds == static_cast<std::uint32_t>(time.tv_nsec);
}

bool isBefore(const timespec &left, const timespec &right)
{
    return std::tie(left.tv_sec, left.tv_nsec) < std::tie(right.tv_sec, right.tv_nsec);
}

void refuseUnreadableAmongDropped(git_repository *repository, git_index *index, git_index *before)
{
    const std::string workdir = git_repository_workdir(repository);
    const std::size_t count = git_index_entrycount(before);
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_index_entry *const entry = git_index_get_byindex(before, i);
        if (!isIndexed(index, entry->path))
        {
            refuseUnreadable(workdir, entry->path);
        }
    }
}

} // namespace

void refreshIndex(git_repository *repository, git_index *index, const ChangedFiles &changed,
                  const std::vector<std::string> &removed, HeldEntries &held)
{
    const std::size_t countBefore = git_index_entrycount(index);
    stageEmptiedFiles(repository, index, changed.files());
    held.holdLeftOut(index);
    check(git_index_update_all, index, nullptr, nullptr, nullptr);
    held.giveBack(index);
    stageIdentifiedFiles(repository, index, changed.files());
    if (git_index_entrycount(index) < countBefore)
    {
        const OwnedHandle<git_index> before = openIndex(git_index_path(index));
        refuseUnreadableAmongDropped(repository, index, before.get());
    }
    // Some programs save a file by removing and creating it. If it exists again,
    // git_index_update_all has passed over it, because it was not tracked any more.
    const std::string workdir = git_repository_workdir(repository);
    for (const std::string &path : removed)
    {
        refuseUnreadable(workdir, path);
    }
}

void markSavedSince(git_repository *repository, git_index *index)
{
    const char *const indexPath = git_index_path(index);
    // The copy of the index was made when it was locked, by the clock of its file system.
    struct stat ofIndex = {};
    if (stat(indexPath, &ofIndex) != 0)
    {
        raiseSystemError(errno, std::string("could not read the index '") + indexPath + "'");
    }
    std::string path = git_repository_workdir(repository);
    const std::size_t rootSize = path.size();
    const std::size_t count = git_index_entrycount(index);
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_index_entry *const entry = git_index_get_byindex(index, i);
        const bool isOfThatSecond = entry->mtime.seconds >= ofIndex.st_mtim.tv_sec;
        if (!isOfThatSecond || entry->mode == GIT_FILEMODE_COMMIT)
        {
            continue;
        }
        path.replace(rootSize, std::string::npos, entry->path);
        struct stat ofFile = {};
        const bool isSaved = lstat(path.c_str(), &ofFile) == 0 &&
                             !isBefore(ofFile.st_ctim, ofIndex.st_ctim) &&
                             !isOfTime(*entry, ofFile.st_mtim);
        if (isSaved)
        {
            // As git and libgit2 mark a file to be compared by its content. git_index_add would
            // also remove entries that collide with this one, as `a` and `a/b` do. libgit2 declares
            // its entries read-only, but its order and look-ups do not use the size.
            const_cast<git_index_entry *>(entry)->file_size = 0;
        }
    }
}

} // namespace vclink::git

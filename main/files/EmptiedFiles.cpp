// SPDX-License-Identifier: MIT
#include "main/files/EmptiedFiles.hpp"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstddef>
#include <cstdint>
#include <iterator>
#include <memory>

#include <git2/index.h>
#include <git2/pathspec.h>
#include <git2/repository.h>
#include <git2/version.h>
#include <sys/stat.h>

#include "error/errorUtil/GitResult.hpp"

namespace vclink::git
{
namespace
{

constexpr bool endsAtEmptiedFiles = LIBGIT2_VER_MAJOR == 1 && LIBGIT2_VER_MINOR < 6;

constexpr std::array<unsigned char, sizeof(git_oid::id)> emptyBlob{
    0xe6, 0x9d, 0xe2, 0x9b, 0xb2, 0xd1, 0xd6, 0x43, 0x4b, 0x8b,
    0x29, 0xae, 0x77, 0x5a, 0xd8, 0xc2, 0xe4, 0x8c, 0x53, 0x91};

/// A missing file has no mode. An error is tried again once, so that a passing error does not hide
/// a file. If it persists, libgit2 cannot read the file either.
struct stat statusAt(const std::string &path)
{
    struct stat status = {};
    if (::lstat(path.c_str(), &status) != 0 && errno != ENOENT && errno != ENOTDIR &&
        ::lstat(path.c_str(), &status) != 0)
    {
        return {};
    }
    return status;
}

bool hasLinkAbove(const std::string &workdir, const std::string &path)
{
    for (auto end = path.find('/'); end != std::string::npos; end = path.find('/', end + 1))
    {
        if (S_ISLNK(statusAt(workdir + path.substr(0, end)).st_mode))
        {
            return true;
        }
    }
    return false;
}

bool isCompared(const git_index_entry &entry)
{
    return GIT_INDEX_ENTRY_STAGE(&entry) == GIT_INDEX_STAGE_NORMAL &&
           (entry.flags & GIT_INDEX_ENTRY_VALID) == 0 &&
           (entry.flags_extended & GIT_INDEX_ENTRY_SKIP_WORKTREE) == 0;
}

/// Whether the entry is that of an empty file of this mode.
bool isAsNoted(const git_index_entry &entry, const struct stat &status)
{
    const bool isExecutable = (status.st_mode & S_IXUSR) != 0;
    return std::equal(emptyBlob.begin(), emptyBlob.end(), std::begin(entry.id.id)) &&
           entry.mode == (isExecutable ? GIT_FILEMODE_BLOB_EXECUTABLE : GIT_FILEMODE_BLOB);
}

bool isEmptied(const std::string &workdir, const git_index_entry &entry)
{
    const struct stat status = statusAt(workdir + entry.path);
    return S_ISREG(status.st_mode) && status.st_size == 0 && !isAsNoted(entry, status) &&
           !hasLinkAbove(workdir, entry.path);
}

/// One lstat() for each file, where libgit2 needs many system calls.
std::vector<std::string> findEmptied(git_repository *repository, git_index *index)
{
    std::vector<std::string> paths;
    const char *const folder = git_repository_workdir(repository);
    if (!endsAtEmptiedFiles || folder == nullptr)
    {
        return paths;
    }
    const std::string workdir = folder;
    const std::size_t count = git_index_entrycount(index);
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_index_entry &entry = *git_index_get_byindex(index, i);
        if (isCompared(entry) && isEmptied(workdir, entry))
        {
            paths.emplace_back(entry.path);
        }
    }
    return paths;
}

using OwnedPathspec = std::unique_ptr<git_pathspec, void (*)(git_pathspec *)>;

OwnedPathspec makePathspec(const git_strarray &listed)
{
    git_pathspec *raw = nullptr;
    const GitResult<void> made = call(git_pathspec_new, &raw, &listed);
    OwnedPathspec pathspec(raw, git_pathspec_free);
    check(made);
    return pathspec;
}

/// git_index_add would also remove entries that collide with this one, as `a` and `a/b` do. libgit2
/// declares its entries read-only. Its order and its look-ups do not use this flag, and the
/// releases that need it do not change any more.
void setAssumedUnchanged(git_index *index, const std::string &path, bool isAssumed) noexcept
{
    const git_index_entry *const entry =
        git_index_get_bypath(index, path.c_str(), GIT_INDEX_STAGE_NORMAL);
    if (entry != nullptr)
    {
        auto &flags = const_cast<git_index_entry *>(entry)->flags;
        flags = static_cast<std::uint16_t>(isAssumed ? flags | GIT_INDEX_ENTRY_VALID
                                                     : flags & ~GIT_INDEX_ENTRY_VALID);
    }
}

} // namespace

void stageEmptiedFiles(git_repository *repository, git_index *index)
{
    for (const std::string &path : findEmptied(repository, index))
    {
        check(git_index_add_bypath, index, path.c_str());
    }
}

EmptiedFiles::EmptiedFiles(git_repository *repository, git_index *index, const git_strarray &listed)
{
    const std::vector<std::string> emptied = findEmptied(repository, index);
    if (emptied.empty())
    {
        return;
    }
    const OwnedPathspec pathspec = makePathspec(listed);
    const bool isCaseIgnored = (git_index_caps(index) & GIT_INDEX_CAPABILITY_IGNORE_CASE) != 0;
    const std::uint32_t flags = isCaseIgnored ? GIT_PATHSPEC_IGNORE_CASE : GIT_PATHSPEC_DEFAULT;
    for (const std::string &path : emptied)
    {
        if (git_pathspec_matches_path(pathspec.get(), flags, path.c_str()) != 0)
        {
            check(git_index_add_bypath, index, path.c_str());
        }
        else
        {
            setAssumedUnchanged(index, path, true);
            held_.push_back(path);
        }
    }
}

void EmptiedFiles::giveBack(git_index *index) const noexcept
{
    for (const std::string &path : held_)
    {
        setAssumedUnchanged(index, path, false);
    }
}

} // namespace vclink::git

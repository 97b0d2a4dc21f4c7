// SPDX-License-Identifier: MIT
#include "util/repository/repository.hpp"

#include <cerrno>
#include <filesystem>
#include <initializer_list>
#include <string>
#include <system_error>

#include <git2.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/gitString.hpp"
#include "error/errorUtil/raiseGitError.hpp"
#include "error/errorUtil/raiseSystemError.hpp"
#include "util/path/isSameFolder.hpp"
#include "util/repository/fatalPatterns.hpp"

namespace vclink::git
{
namespace
{

/// libgit2 treats an unreadable index file as a missing one. If such an index is written or
/// committed, every file is removed from it.
void readAgainIfEmpty(git_index *index)
{
    const char *const path = git_index_path(index);
    if (git_index_entrycount(index) != 0 || path == nullptr)
    {
        return;
    }
    struct stat status = {};
    if (::stat(path, &status) == 0)
    {
        check(git_index_read, index, 1);
    }
    else if (errno != ENOENT)
    {
        raiseSystemError(errno, std::string("could not read the index '") + path + "'");
    }
}

/// libgit2 treats an unreadable file as a missing one.
bool isThere(const std::string &path, struct stat &status)
{
    if (::stat(path.c_str(), &status) == 0)
    {
        return true;
    }
    if (errno != ENOENT && errno != ENOTDIR)
    {
        raiseSystemError(errno, "could not read '" + path + "'");
    }
    return false;
}

bool isThere(const std::string &path)
{
    struct stat status = {};
    return isThere(path, status);
}

bool isFilled(const std::string &path)
{
    struct stat status = {};
    return isThere(path, status) && status.st_size != 0;
}

/// Makes the folder the working tree. A linked working tree that was copied or moved still names
/// its old place, and core.worktree can name any folder: files there are not the host's.
void useWorkingTree(git_repository *repository, const std::string &folder)
{
    const char *const workdir = git_repository_workdir(repository);
    if (workdir == nullptr || folder + '/' == workdir || isSameFolder(folder, workdir))
    {
        return;
    }
    if (git_repository_is_worktree(repository) == 0)
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_REPOSITORY,
                      "the working tree of '" + folder + "' is '" + workdir +
                          "': open that one, or correct core.worktree");
    }
    check(git_repository_set_workdir, repository, folder.c_str(), 0);
}

constexpr std::initializer_list<const char *> filesOfMerge{"MERGE_HEAD", "MERGE_MODE", "MERGE_MSG"};

/// What else git_repository_state_cleanup removes, except for the log of a bisection.
constexpr std::initializer_list<const char *> filesOfOthers{
    "REVERT_HEAD", "CHERRY_PICK_HEAD", "rebase-merge", "rebase-apply", "sequencer"};

/// Removes files and folders from git's folder.
void removeState(git_repository *repository, std::initializer_list<const char *> names)
{
    for (const char *const name : names)
    {
        const std::string path = git_repository_path(repository) + std::string(name);
        if (::unlink(path.c_str()) == 0 || errno == ENOENT)
        {
            continue;
        }
        std::error_code error(errno, std::generic_category());
        if (error == std::errc::is_a_directory)
        {
            std::filesystem::remove_all(path, error);
        }
        if (error)
        {
            raiseSystemError(error.value(), "could not remove '" + path + "'");
        }
    }
}

void endOperation(git_repository *repository)
{
    const bool isSeries = isInSeries(repository);
    const bool isBisection = isThere(git_repository_path(repository) + std::string("BISECT_LOG"));
    const int state =
        isSeries || isBisection ? readRepositoryState(repository) : GIT_REPOSITORY_STATE_NONE;
    if (isSeries && (state == GIT_REPOSITORY_STATE_NONE || state == GIT_REPOSITORY_STATE_MERGE))
    {
        removeState(repository, filesOfMerge);
        return;
    }
    if (isBisection && state != GIT_REPOSITORY_STATE_BISECT)
    {
        removeState(repository, filesOfMerge);
        removeState(repository, filesOfOthers);
        return;
    }
    check(git_repository_state_cleanup, repository);
    // Otherwise the next commit would be part of the same merge.
    if (hasMergeHead(repository))
    {
        check(git_repository_state_cleanup, repository);
    }
}

} // namespace

bool isRepository(const upath &path)
{
    const std::string folder = toGitString(path.string());
    const GitResult<void> probe = call(git_repository_open_ext, nullptr, folder.c_str(),
                                       GIT_REPOSITORY_OPEN_NO_SEARCH, nullptr);
    if (probe.has_error() && probe.error().getCode() == GIT_ENOTFOUND)
    {
        return false;
    }
    probe.value();
    return true;
}

OwnedHandle<git_repository> openRepository(const upath &root)
{
    const std::string folder = toGitString(root.string());
    OwnedHandle<git_repository> repository =
        acquire<git_repository>(git_repository_open_ext, folder.c_str(),
                                GIT_REPOSITORY_OPEN_NO_SEARCH, nullptr)
            .value();
    useWorkingTree(repository.get(), folder);
    return repository;
}

OwnedHandle<git_repository> openWorkingCopy(const upath &root)
{
    OwnedHandle<git_repository> repository = openRepository(root);
    refuseFatalPatterns(repository.get());
    return repository;
}

int findRepositoryState(git_repository *repository)
{
    git_error_clear();
    const int state = git_repository_state(repository);
    // Otherwise the commit that concludes a merge would lose the other side.
    return state == GIT_REPOSITORY_STATE_NONE && hasMergeHead(repository)
               ? git_repository_state(repository)
               : state;
}

int readRepositoryState(git_repository *repository)
{
    const int state = findRepositoryState(repository);
    if (state < 0)
    {
        check(makeResult(state));
    }
    return state;
}

bool hasMergeHead(git_repository *repository)
{
    return isThere(git_repository_path(repository) + std::string("MERGE_HEAD"));
}

bool isInSeries(git_repository *repository)
{
    return isFilled(git_repository_path(repository) + std::string("sequencer/todo"));
}

void cleanUpRepositoryState(git_repository *repository)
{
    endOperation(repository);
    // Otherwise git would take the next commit for the resolution of these conflicts, and its
    // message from the squash.
    removeState(repository, {"MERGE_RR", "SQUASH_MSG"});
}

bool isShallow(git_repository *repository)
{
    // libgit2 1.9 makes an empty one in each fetch, and leaves it behind if the fetch then fails.
    return isFilled(git_repository_commondir(repository) + std::string("shallow"));
}

OwnedHandle<git_index> getRepositoryIndex(git_repository *repository)
{
    OwnedHandle<git_index> index = acquire<git_index>(git_repository_index, repository).value();
    readAgainIfEmpty(index.get());
    return index;
}

OwnedHandle<git_index> openIndex(const char *path)
{
    OwnedHandle<git_index> index = acquire<git_index>(git_index_open, path).value();
    readAgainIfEmpty(index.get());
    return index;
}

void writeIndex(git_index *index)
{
    check(git_index_write, index);
}

git_oid writeIndexTree(git_index *index)
{
    git_oid id{};
    check(git_index_write_tree, &id, index);
    return id;
}

OwnedHandle<git_tree> lookupTree(git_repository *repository, const git_oid *id)
{
    return acquire<git_tree>(git_tree_lookup, repository, id).value();
}

GitResult<OwnedHandle<git_object>> revparseObject(git_repository *repository,
                                                  const std::string &spec)
{
    return acquire<git_object>(git_revparse_single, repository, asGitString(spec));
}

const git_oid *revparseId(const std::string &spec, git_repository *repository)
{
    // Copies the id first: libgit2 does not cache blobs and objects over 4 KiB, so releasing the
    // object can free the id in it.
    thread_local git_oid copy;
    const OwnedHandle<git_object> object = revparseObject(repository, spec).value();
    git_oid_cpy(&copy, git_object_id(object.get()));
    return &copy;
}

git_oid readHeadId(git_repository *repository)
{
    git_oid id{};
    check(git_reference_name_to_id, &id, repository, "HEAD");
    return id;
}

GitResult<OwnedHandle<git_commit>> lookupCommitByName(const char *name, git_repository *repository)
{
    const auto reference = acquire<git_reference>(git_reference_dwim, repository, name);
    if (reference.has_error())
    {
        return reference.error();
    }
    return acquire<git_commit>(git_commit_lookup, repository,
                               git_reference_target(reference.value().get()));
}

} // namespace vclink::git

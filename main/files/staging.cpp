// SPDX-License-Identifier: MIT
// GitAdapter::addFiles, removeFiles and markResolved: changes of the index alone.
#include <git2/index.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/gitString.hpp"
#include "error/raise.hpp"
#include "fl/filesystem/operations.hpp"
#include "main/files/GitAdapter.hpp"
#include "main/files/IdentifiedFiles.hpp"
#include "main/files/foldersInIndex.hpp"
#include "main/files/otherCase.hpp"
#include "main/files/prepareAddition.hpp"
#include "util/lock/IndexLock.hpp"
#include "util/path/PathspecArray.hpp"
#include "util/repository/fatalPatterns.hpp"
#include "util/repository/repository.hpp"
#include "util/repository/settings.hpp"
#include "vclink/git/messageIdentifiers.hpp"
#include "vclink/util/generateFileReport.hpp"

namespace vclink::git
{
namespace
{

/// Makes libgit2 process every path that matches.
int acceptAllPaths(const char * /*path*/, const char * /*matchedPathspec*/, void * /*adapter*/)
{
    return 0;
}

/// Makes libgit2 skip files that a sparse checkout leaves out: nobody has deleted them.
int skipLeftOut(const char *path, const char * /*matchedPathspec*/, void *index)
{
    const git_index_entry *const entry =
        git_index_get_bypath(static_cast<git_index *>(index), path, GIT_INDEX_STAGE_NORMAL);
    const bool isLeftOut =
        entry != nullptr && (entry->flags_extended & GIT_INDEX_ENTRY_SKIP_WORKTREE) != 0;
    return isLeftOut ? 1 : 0;
}

void refuseNuls(const std::vector<upath> &files)
{
    for (const upath &file : files)
    {
        static_cast<void>(toGitString(file.string()));
    }
}

} // namespace

void GitAdapter::addFiles(const std::vector<upath> &files)
{
    std::vector<upath> toAdd;
    std::vector<upath> refused;
    for (const auto &[path, state] : getFileStates(files))
    {
        (state.getState() == FileState::Unversioned ? toAdd : refused).push_back(path);
    }
    if (!refused.empty())
    {
        raise(shared_vclink::git::AlreadyAdded(vclink::util::generateFileReport(refused)));
    }
    addToIndex(toAdd);
}

void GitAdapter::removeFiles(const std::vector<upath> &files)
{
    std::vector<upath> toRemove;
    for (const auto &[path, state] : getFileStates(files))
    {
        if (state.getState() != FileState::Deleted)
        {
            toRemove.push_back(path);
        }
    }
    if (toRemove.empty())
    {
        raise(shared_vclink::git::NoFilesToRemove());
    }
    removeFromIndex(toRemove, LeftOutFiles::Removed);
}

void GitAdapter::markResolved(const upath &file)
{
    if (fl::filesystem::exists(file))
    {
        addToIndex({file});
    }
    else
    {
        removeFromIndex({file}, LeftOutFiles::Kept);
    }
}

void GitAdapter::addToIndex(const std::vector<upath> &files)
{
    if (files.empty())
    {
        return;
    }
    refuseNuls(files);
    const OwnedHandle<git_repository> repository = openWorkingCopy(root_);
    refuseUnreadableSettings(repository.get());
    IndexLock lock(repository.get());
    const OwnedHandle<git_index> index = getRepositoryIndex(repository.get());
    refuseFatalPatternsInFolders(repository.get(), index.get());
    const PathspecArray pathspec = makeFilePathspec(files, root_);
    refuseOtherCase(index.get(), pathspec.array());
    HeldEntries held;
    const std::vector<ChangedFile> changed =
        prepareAddition(repository.get(), index.get(), pathspec.array(), held);
    check(git_index_add_all, index.get(), getArrayPointer(pathspec), GIT_INDEX_ADD_DEFAULT,
          acceptAllPaths, this);
    held.giveBack(index.get());
    stageIdentifiedFiles(repository.get(), index.get(), changed);
    takeOutBelowFiles(index.get(), pathspec);
    writeIndex(index.get());
    lock.publish();
}

void GitAdapter::removeFromIndex(const std::vector<upath> &files, LeftOutFiles leftOut)
{
    if (files.empty())
    {
        return;
    }
    refuseNuls(files);
    const OwnedHandle<git_repository> repository = openWorkingCopy(root_);
    IndexLock lock(repository.get());
    const OwnedHandle<git_index> index = getRepositoryIndex(repository.get());
    const PathspecArray pathspec = makeFilePathspec(files, root_);
    refuseOtherCase(index.get(), pathspec.array());
    if (leftOut == LeftOutFiles::Kept)
    {
        check(git_index_remove_all, index.get(), getArrayPointer(pathspec), skipLeftOut,
              index.get());
    }
    else
    {
        check(git_index_remove_all, index.get(), getArrayPointer(pathspec), acceptAllPaths, this);
    }
    writeIndex(index.get());
    lock.publish();
}

} // namespace vclink::git

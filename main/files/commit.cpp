// SPDX-License-Identifier: MIT
// GitAdapter::commit: a commit of all tracked files, which also concludes a merge.
#include <chrono>
#include <string>
#include <vector>

#include <git2/commit.h>
#include <git2/errors.h>
#include <git2/index.h>
#include <git2/object.h>
#include <git2/oid.h>
#include <git2/repository.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "fl/i18n/convert.hpp"
#include "main/files/CommitSubmodules.hpp"
#include "main/files/GitAdapter.hpp"
#include "main/files/commitIdentity.hpp"
#include "main/files/indexRefresh.hpp"
#include "main/files/otherCase.hpp"
#include "main/files/stageChangedFiles.hpp"
#include "main/mergeState/MergeMarker.hpp"
#include "main/mergeState/interruptedMerge.hpp"
#include "main/mergeState/mergeHead.hpp"
#include "main/mergeState/unfinishedOperation.hpp"
#include "util/lock/IndexLock.hpp"
#include "util/lock/referenceLocks.hpp"
#include "util/repository/fatalPatterns.hpp"
#include "util/repository/repository.hpp"
#include "util/repository/settings.hpp"

namespace vclink::git
{
namespace
{

int collectMergeHead(const git_oid *id, void *payload) noexcept
{
    try
    {
        static_cast<std::vector<git_oid> *>(payload)->push_back(*id);
        return 0;
    }
    catch (...)
    {
        return parkCallbackException();
    }
}

std::vector<OwnedHandle<git_commit>> lookupMergeHeads(git_repository *repository)
{
    std::vector<git_oid> ids;
    check(git_repository_mergehead_foreach, repository, collectMergeHead, &ids);
    refuseDamagedMergeHead(repository);
    std::vector<OwnedHandle<git_commit>> commits;
    commits.reserve(ids.size());
    for (const git_oid &id : ids)
    {
        commits.push_back(acquire<git_commit>(git_commit_lookup, repository, &id).value());
    }
    return commits;
}

/// A merge has written its index just now, and given up the lock in between: another process, such
/// as `git status`, can hold it for a moment.
IndexLock lockIndex(git_repository *repository, bool isMerge)
{
    constexpr std::chrono::seconds patience{1};
    return isMerge ? IndexLock(repository, IndexTime::Fraction, patience) : IndexLock(repository);
}

/// Throws if the commit was not written. If libgit2 cannot write the commit's object, for example
/// on a full disk, it reports success and moves no branch. The only signs are that the object does
/// not exist, and the error record, which stays until the next call. Returns any other failure.
GitResult<OwnedHandle<git_object>> lookUpWritten(git_repository *repository, const git_oid &id)
{
    const GitError failure(GIT_ERROR);
    auto commit = acquire<git_object>(git_object_lookup, repository, &id, GIT_OBJECT_COMMIT);
    if (commit.has_error() && commit.error().getCode() == GIT_ENOTFOUND)
    {
        GitErrorPolicy::throwIfError(failure);
    }
    return commit;
}

} // namespace

void GitAdapter::commit(const upath & /*folder*/, const ustring &message)
{
    const OwnedHandle<git_repository> repository = openWorkingCopy(root_);
    // A merge has looked at them before it began.
    if (expectedMerge_ == nullptr)
    {
        refuseUnreadableSettings(repository.get());
    }
    // From here no other process commits, merges or ends a merge in this working copy.
    IndexLock lock = lockIndex(repository.get(), expectedMerge_ != nullptr);
    // If HEAD has no commit, for any reason, the new commit is a root commit.
    const GitResult<OwnedHandle<git_commit>> head = lookupCommitByName("HEAD", repository.get());
    std::vector<OwnedHandle<git_commit>> mergeHeads;
    std::vector<const git_commit *> parents;
    const git_commit *const headCommit = head.has_value() ? head.value().get() : nullptr;
    if (headCommit != nullptr)
    {
        parents.push_back(headCommit);
    }
    const int state = readRepositoryState(repository.get());
    if (state == GIT_REPOSITORY_STATE_MERGE)
    {
        mergeHeads = lookupMergeHeads(repository.get());
        for (const auto &mergeHead : mergeHeads)
        {
            parents.push_back(mergeHead.get());
        }
    }
    if (expectedMerge_ != nullptr)
    {
        refuseOtherParents(*expectedMerge_, parents);
    }
    else
    {
        refuseCommitWithAutostash(repository.get());
        refuseCommitWithPatches(repository.get(), state);
        if (state == GIT_REPOSITORY_STATE_NONE)
        {
            removeMergeMarker(repository.get());
        }
        else
        {
            refuseCommitWithoutMergeHead(repository.get(), state);
        }
    }
    if (expectedMerge_ == nullptr && headCommit != nullptr && mergeHeads.size() == 1)
    {
        refuseInterruptedMerge(repository.get(), parents.front(), parents.back());
    }
    createCommit(repository.get(), message, headCommit, parents, lock);
    expectMerge(nullptr);
}

void GitAdapter::expectMerge(const MergeSides *sides) noexcept
{
    expectedMerge_ = sides;
}

void GitAdapter::refreshForCommit(git_repository *repository, git_index *index,
                                  const git_commit *head,
                                  const std::vector<const git_commit *> &parents) const
{
    const ChangedFiles changed(repository, index);
    refuseOtherCase(index, changed);
    HeldEntries held;
    // Before anything else is changed in memory: after a failure the index is read again.
    const std::vector<std::string> removed =
        stageChangedFiles(repository, index, changed, changed.files(), held);
    const CommitSubmodules submodules(repository, index, parents);
    submodules.resolve(index);
    if (expectedMerge_ != nullptr)
    {
        submodules.takeOut(index);
    }
    refreshIndex(repository, index, changed, removed, held);
    // Without HEAD it is unknown which commit the user has checked out on purpose.
    const std::size_t ours = head != nullptr ? 1 : 0;
    if (expectedMerge_ != nullptr || parents.size() > ours)
    {
        submodules.restore(index, expectedMerge_ != nullptr ? nullptr : head);
    }
}

void GitAdapter::createCommit(git_repository *repository, const ustring &message,
                              const git_commit *head,
                              const std::vector<const git_commit *> &parents, IndexLock &lock)
{
    // First, so that nothing has changed if there is no identity.
    const OwnedHandle<git_signature> signature = makeSignature(repository);
    const OwnedHandle<git_index> index = getRepositoryIndex(repository);
    refuseFatalPatternsInFolders(repository, index.get());
    refreshForCommit(repository, index.get(), head, parents);
    if (expectedMerge_ != nullptr)
    {
        markSavedSince(repository, index.get());
    }
    writeIndex(index.get());
    // For libgit2 it ends at the first NUL.
    const std::string text = fl::i18n::ustring_to_utf8(message);
    const git_oid treeId = writeIndexTree(index.get());
    const OwnedHandle<git_tree> tree = lookupTree(repository, &treeId);
    // Before HEAD moves: with an older index the next commit would undo this one.
    lock.publish();
    git_oid id{};
    // libgit2's parameter is not completely const.
    auto parentPointers = parents;
    check(retryWhileLocked(repository,
                           [&]
                           {
                               return call(git_commit_create, &id, repository, "HEAD",
                                           signature.get(), signature.get(), "UTF-8", text.c_str(),
                                           tree.get(), parentPointers.size(),
                                           parentPointers.data());
                           }));
    const GitResult<OwnedHandle<git_object>> written = lookUpWritten(repository, id);
    // The commit exists, even if its object cannot be read now.
    cleanUpRepositoryState(repository);
    written.value();
}

} // namespace vclink::git

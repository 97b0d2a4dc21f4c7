// SPDX-License-Identifier: MIT
#include "main/checkout/CheckoutWatch.hpp"

#include <array>
#include <vector>

#include <fcntl.h>
#include <git2.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/checkout/FilesAgainstFolders.hpp"
#include "main/checkout/askRules.hpp"
#include "main/checkout/conflictLocks.hpp"
#include "main/checkout/gitlinks.hpp"
#include "main/checkout/mountPoints.hpp"
#include "main/checkout/obstaclesAhead.hpp"
#include "main/checkout/overlookedEdits.hpp"
#include "main/checkout/severalBases.hpp"
#include "main/mergeState/MergeBases.hpp"
#include "util/repository/ChangedFiles.hpp"
#include "util/repository/fatalPatterns.hpp"
#include "util/repository/repository.hpp"

namespace vclink::git
{
namespace
{

using ChangeRule = Finding (*)(WorkingCopy &, const TreeChange &);

// A file that stays a file needs only the first array of each pair.
constexpr std::array<ChangeRule, 2> switchRules{findBlockedWay, findSpecialFile};
constexpr std::array<ChangeRule, 11> otherSwitchRules{findIgnoredLink,
                                                      findFalselyIgnored,
                                                      findForeignInFolder,
                                                      findMissingFolder,
                                                      findSubmodule,
                                                      findFileForSubmodule,
                                                      findFolderOfOtherUse,
                                                      findFolderForDeletedFile,
                                                      findStagedBelowSubmodule,
                                                      findMissingFileOfOtherKind,
                                                      findUnwritableFolder};
constexpr std::array<ChangeRule, 5> unforcedRules{findStagedSubmodule, findStagedDeletion,
                                                  findStagedContent, findStagedThoughIgnored,
                                                  findOverlookedEdit};
constexpr std::array<ChangeRule, 4> mergeRules{findBlockedWayOfMerge, findUntracked,
                                               findSubmoduleAfterSibling,
                                               findUnwritableFolderOfConflict};
constexpr std::array<ChangeRule, 5> otherMergeRules{findFileForSubmodule, findSubmodule,
                                                    findFolderForDeletedFile, findUntrackedOfHead,
                                                    findUnwritableFolder};

OwnedHandle<git_tree> treeOf(git_repository *repository, const git_oid *commitId)
{
    const OwnedHandle<git_commit> commit =
        acquire<git_commit>(git_commit_lookup, repository, commitId).value();
    return acquire<git_tree>(git_commit_tree, commit.get()).value();
}

Finding firstOf(Finding left, Finding right)
{
    return !left || (right && right->path < left->path) ? right : left;
}

} // namespace

CheckoutWatch::CheckoutWatch(CheckoutKind kind, git_repository *repository,
                             git_checkout_options &record)
    : kind_(kind), repository_(repository), record_(record),
      isForced_((record.checkout_strategy & GIT_CHECKOUT_FORCE) != 0), first_(record.notify_cb),
      firstPayload_(record.notify_payload), progress_(record.progress_cb),
      progressPayload_(record.progress_payload), promised_(repository)
{
    const char *const workdir = git_repository_workdir(repository);
    root_ = workdir != nullptr ? workdir : "";
    path_ = root_;
    record.notify_cb = pass;
    record.notify_payload = this;
    record.progress_cb = passProgress;
    record.progress_payload = this;
    // Also for a link or a FIFO that appears later.
    record.file_open_flags = O_CREAT | O_TRUNC | O_WRONLY | O_NOFOLLOW | O_NONBLOCK;
}

WorkingCopy &CheckoutWatch::lookAtWorkingCopy()
{
    WorkingCopy &copy = copy_.emplace(repository_);
    refuseFatalPatternsInFolders(repository_, copy.index());
    // Otherwise libgit2 reads HEAD again. Without an index it must: that is a first checkout.
    if (copy.hasIndex())
    {
        record_.baseline = copy.head();
    }
    return copy;
}

void CheckoutWatch::lookBeforeSwitch(const git_object *target)
{
    WorkingCopy &copy = lookAtWorkingCopy();
    const OwnedHandle<git_object> peeled =
        acquire<git_object>(git_object_peel, target, GIT_OBJECT_TREE).value();
    const OwnedHandle<git_tree> tree = lookupTree(repository_, git_object_id(peeled.get()));
    Finding found;
    visitTreeChanges(repository_, copy.head(), tree.get(),
                     [&](const TreeChange &change)
                     {
                         found = judgeSwitch(copy, change);
                         return !found;
                     });
    if (!found)
    {
        found = findMountPoint(mountPointsBelow(root_), copy.head(), tree.get());
    }
    if (found)
    {
        refuse(*found);
    }
    if (!switched_.isEmpty())
    {
        baseline_ = switched_.makeBaseline(copy);
        record_.baseline_index = baseline_.get();
    }
}

Finding CheckoutWatch::judgeSwitch(WorkingCopy &copy, const TreeChange &change)
{
    const bool isOther = !staysFile(change);
    if (Finding found = ask(switchRules, copy, change))
    {
        return found;
    }
    if (Finding found = isOther ? ask(otherSwitchRules, copy, change) : Finding())
    {
        return found;
    }
    if (Finding found = isForced_ ? Finding() : ask(unforcedRules, copy, change))
    {
        return found;
    }
    const bool isInTheWay = isOther && switched_.note(copy, change) && isForced_;
    return isInTheWay ? inTheWay(change.path, Standing::Folder) : Finding();
}

void CheckoutWatch::lookBeforeMerge(const git_oid *theirs)
{
    WorkingCopy &copy = lookAtWorkingCopy();
    const git_oid ours = readHeadId(repository_);
    const OwnedHandle<git_tree> after = treeOf(repository_, theirs);
    const std::vector<OwnedHandle<git_tree>> bases =
        readTrees(repository_, MergeBases(repository_, &ours, theirs));
    const std::vector<std::string> mounts = mountPointsBelow(root_);
    const ChangedFiles changed(repository_, copy.index());
    Finding first = changed.hasConflicts() ? findUnmerged(copy) : Finding();
    first = firstOf(first, firstOf(findHiddenEdit(copy), findEditBeforeMerge(copy, changed)));
    Finding yielding;
    bool mayBeRenamed = false;
    for (const OwnedHandle<git_tree> &before : bases)
    {
        Finding found;
        RenamedLocks renamed;
        FilesAgainstFolders againstFolders;
        visitTreeChanges(repository_, before.get(), after.get(),
                         [&](const TreeChange &change)
                         {
                             found = judgeMerge(copy, change, after.get());
                             renamed.note(copy, change);
                             againstFolders.note(copy, change, after.get());
                             attributes_.noteChange(change.path);
                             if (!staysFile(change))
                             {
                                 merged_.noteChange(copy, change);
                                 yielding = firstOf(yielding, findYielding(copy, change));
                                 mayBeRenamed = mayBeRenamed || isDeletedByBoth(copy, change);
                             }
                             return !found;
                         });
        if (!found)
        {
            found = renamed.find(repository_, copy, before.get(), after.get());
        }
        if (!found)
        {
            found = againstFolders.find(repository_, copy, before.get(), after.get());
        }
        first = firstOf(firstOf(first, found), findMountPoint(mounts, before.get(), after.get()));
    }
    if (bases.size() > 1)
    {
        first = firstOf(first, findBetweenSides(repository_, copy, bases, after.get()));
    }
    if (mayBeRenamed)
    {
        first = firstOf(first, yielding);
    }
    if (first)
    {
        refuse(*first);
    }
    merged_.stage(copy.index());
    copy.forget();
}

Finding CheckoutWatch::judgeMerge(WorkingCopy &copy, const TreeChange &change,
                                  const git_tree *theirs)
{
    Finding found = ask(mergeRules, copy, change);
    if (!found && !staysFile(change))
    {
        found = ask(otherMergeRules, copy, change);
    }
    if (!found)
    {
        found = findOtherCase(copy, change, theirs);
    }
    if (!found)
    {
        found = findLockOfConflict(repository_, copy, change, theirs);
    }
    // There is no notification of a conflict.
    const bool makesFile = change.after != nullptr && !isGitlink(change.after);
    return !found && makesFile ? promised_.find(change.path, *git_tree_entry_id(change.after))
                               : found;
}

void CheckoutWatch::settle() const
{
    if (failure_ != nullptr)
    {
        std::rethrow_exception(failure_);
    }
    attributes_.settle(repository_);
    if (switched_.isEmpty() && merged_.isEmpty())
    {
        return;
    }
    const OwnedHandle<git_index> index = getRepositoryIndex(repository_);
    switched_.settle(index.get());
    merged_.settle(index.get());
    writeIndex(index.get());
}

void CheckoutWatch::refuse(const Obstacle &obstacle)
{
    check(makeResult(first_(GIT_CHECKOUT_NOTIFY_CONFLICT, obstacle.path.c_str(), nullptr, nullptr,
                            nullptr, firstPayload_)));
    check(makeResult(reportConflict(obstacle)));
}

} // namespace vclink::git

// SPDX-License-Identifier: MIT
#include "main/checkout/CheckoutWatch.hpp"

#include <array>
#include <cstddef>
#include <utility>

#include <fcntl.h>
#include <git2.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "main/checkout/RenamesToFolders.hpp"
#include "main/checkout/conflictLocks.hpp"
#include "main/checkout/gitlinks.hpp"
#include "main/checkout/obstaclesAhead.hpp"
#include "main/mergeState/MergeBases.hpp"
#include "util/repository/repository.hpp"

namespace vclink::git
{
namespace
{

using ChangeRule = Finding (*)(WorkingCopy &, const TreeChange &);
using NoticeRule = Finding (*)(WorkingCopy &, const CheckoutNotice &);

// A file that stays a file needs only the first array of each pair.
constexpr std::array<ChangeRule, 2> switchRules{findBlockedWay, findSpecialFile};
constexpr std::array<ChangeRule, 10> otherSwitchRules{findIgnoredLink,
                                                      findForeignInFolder,
                                                      findMissingFolder,
                                                      findSubmodule,
                                                      findFileForSubmodule,
                                                      findFolderOfOtherUse,
                                                      findFolderForDeletedFile,
                                                      findStagedBelowSubmodule,
                                                      findMissingFileOfOtherKind,
                                                      findUnwritableFolder};
constexpr std::array<ChangeRule, 3> stagedRules{findStagedSubmodule, findStagedDeletion,
                                                findStagedContent};
constexpr std::array<ChangeRule, 3> mergeRules{findBlockedWayOfMerge, findUntracked,
                                               findSubmoduleAfterSibling};
constexpr std::array<ChangeRule, 5> otherMergeRules{findFileForSubmodule, findSubmodule,
                                                    findFolderForDeletedFile, findUntrackedOfHead,
                                                    findUnwritableFolder};
constexpr std::array<NoticeRule, 2> switchNoticeRules{findUnseen, findMissingFile};
constexpr std::array<NoticeRule, 7> mergeNoticeRules{
    findEdit,          findUnseen,           findUntrackedNoticed, findForeignInFolderNoticed,
    findFolderNoticed, findSubmoduleNoticed, findHiddenEditNoticed};

template <class Rules, class Subject>
Finding ask(const Rules &rules, WorkingCopy &copy, const Subject &subject)
{
    for (const auto rule : rules)
    {
        Finding finding = rule(copy, subject);
        if (finding)
        {
            return finding;
        }
    }
    return {};
}

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

int setConflict(const Obstacle &obstacle)
{
    git_error_set_str(GIT_ERROR_CHECKOUT, obstacle.text.c_str());
    return GIT_ECONFLICT;
}

} // namespace

CheckoutWatch::CheckoutWatch(CheckoutKind kind, git_repository *repository,
                             git_checkout_options &record)
    : kind_(kind), repository_(repository), record_(record),
      isForced_((record.checkout_strategy & GIT_CHECKOUT_FORCE) != 0), first_(record.notify_cb),
      firstPayload_(record.notify_payload), progress_(record.progress_cb),
      progressPayload_(record.progress_payload)
{
    const char *const workdir = git_repository_workdir(repository);
    root_ = workdir != nullptr ? workdir : "";
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
    Finding found = ask(switchRules, copy, change);
    const bool isOther = !staysFile(change);
    if (!found && isOther)
    {
        found = ask(otherSwitchRules, copy, change);
    }
    if (!found && !isForced_)
    {
        found = ask(stagedRules, copy, change);
    }
    if (!found && isOther && switched_.note(copy, change) && isForced_)
    {
        found = inTheWay(change.path, Standing::Folder);
    }
    return found;
}

void CheckoutWatch::lookBeforeMerge(const git_oid *theirs)
{
    WorkingCopy &copy = lookAtWorkingCopy();
    const git_oid ours = readHeadId(repository_);
    const OwnedHandle<git_tree> after = treeOf(repository_, theirs);
    const MergeBases bases(repository_, &ours, theirs);
    Finding first = findHiddenEdit(copy);
    Finding yielding;
    bool mayBeRenamed = false;
    // Unrelated histories have the empty tree in common.
    for (std::size_t i = 0; i == 0 || i < bases.size(); ++i)
    {
        const OwnedHandle<git_tree> before =
            bases.size() != 0 ? treeOf(repository_, bases.at(i)) : nullptr;
        Finding found;
        RenamedLocks renamed;
        RenamesToFolders toFolders;
        visitTreeChanges(repository_, before.get(), after.get(),
                         [&](const TreeChange &change)
                         {
                             const bool isOther = !staysFile(change);
                             found = ask(mergeRules, copy, change);
                             if (!found && isOther)
                             {
                                 found = ask(otherMergeRules, copy, change);
                             }
                             if (!found)
                             {
                                 found = findLockOfConflict(repository_, copy, change, after.get());
                             }
                             renamed.note(copy, change);
                             toFolders.note(copy, change);
                             if (isOther)
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
            found = toFolders.find(repository_, copy, before.get(), after.get());
        }
        first = firstOf(first, found);
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

void CheckoutWatch::settleSubmodules() const
{
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
    check(makeResult(setConflict(obstacle)));
}

int CheckoutWatch::pass(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
                        const git_diff_file *target, const git_diff_file *workdir,
                        void *payload) noexcept
{
    auto &watch = *static_cast<CheckoutWatch *>(payload);
    const int code = watch.first_(why, path, baseline, target, workdir, watch.firstPayload_);
    if (code != 0)
    {
        return code;
    }
    try
    {
        return watch.hear({why, path, baseline, target, workdir});
    }
    catch (...)
    {
        return parkCallbackException();
    }
}

/// Runs after the last notification, and before libgit2 writes.
void CheckoutWatch::passProgress(const char *path, std::size_t completed, std::size_t total,
                                 void *payload) noexcept
{
    auto &watch = *static_cast<CheckoutWatch *>(payload);
    watch.remade_.remove();
    if (watch.progress_ != nullptr)
    {
        watch.progress_(path, completed, total, watch.progressPayload_);
    }
}

Finding CheckoutWatch::noteOverwritten(const CheckoutNotice &notice)
{
    const bool makesFile = notice.why == GIT_CHECKOUT_NOTIFY_UPDATED && notice.target != nullptr &&
                           !isGitlink(notice.target);
    if (!makesFile)
    {
        return {};
    }
    const bool isExecutable = notice.target->mode == GIT_FILEMODE_BLOB_EXECUTABLE;
    const std::string reason = remade_.note(path_.assign(root_).append(notice.path), isExecutable);
    return reason.empty()
               ? Finding()
               : Obstacle{notice.path, "the file '" + std::string(notice.path) + "' " + reason};
}

int CheckoutWatch::hear(const CheckoutNotice &notice)
{
    if (notice.path == nullptr)
    {
        return 0;
    }
    if (kind_ == CheckoutKind::Revert)
    {
        const Finding found = clearAll(notice);
        return answer(found ? found : noteOverwritten(notice));
    }
    if (!copy_)
    {
        return 0;
    }
    // The commands of a merge may have run for minutes since the first look.
    if (!std::exchange(hasHeard_, true))
    {
        copy_->forget();
        if (copy_->hasHeadMoved())
        {
            git_error_set_str(GIT_ERROR_REFERENCE, Head::movedText);
            return GIT_EMODIFIED;
        }
    }
    const Finding found = judge(notice);
    return answer(found ? found : noteOverwritten(notice));
}

int CheckoutWatch::answer(const Finding &found)
{
    hasRefused_ = found.has_value();
    return hasRefused_ ? setConflict(*found) : 0;
}

Finding CheckoutWatch::judge(const CheckoutNotice &notice)
{
    Finding found = kind_ == CheckoutKind::Merge ? ask(mergeNoticeRules, *copy_, notice)
                                                 : ask(switchNoticeRules, *copy_, notice);
    if (!found)
    {
        makeWay(notice);
        noteUntracked(notice);
    }
    return found;
}

void CheckoutWatch::noteUntracked(const CheckoutNotice &notice)
{
    if (kind_ != CheckoutKind::Merge || notice.why != GIT_CHECKOUT_NOTIFY_UNTRACKED)
    {
        return;
    }
    std::string name = notice.path;
    if (!name.empty() && name.back() == '/')
    {
        name.pop_back();
        merged_.noteUntracked(*copy_, name);
    }
}

/// Removes what no rule protects and libgit2 would write through or fail at: an ignored link in the
/// place of a new file, and an empty folder in the place of any file that libgit2 has passed.
void CheckoutWatch::makeWay(const CheckoutNotice &notice)
{
    const bool isNew = notice.baseline == nullptr;
    const bool isPast = notice.workdir == nullptr;
    if (notice.why != GIT_CHECKOUT_NOTIFY_UPDATED || notice.target == nullptr ||
        isGitlink(notice.target) || !(isNew || isPast))
    {
        return;
    }
    const std::string name = notice.path;
    const WorkingCopy::Way &way = copy_->wayTo(name);
    if (isNew && way.standing == Standing::Link)
    {
        cleared_.remove(root_ + way.blocker);
        copy_->forget();
    }
    const Standing standing = copy_->at(name);
    if ((isNew && standing == Standing::Link) || (isPast && standing == Standing::Folder))
    {
        cleared_.remove(root_ + name);
    }
}

/// libgit2 itself replaces what it sees in the way of a revert. What it has already passed would
/// stop it in the middle of its writing.
Finding CheckoutWatch::clearAll(const CheckoutNotice &notice)
{
    if (notice.target == nullptr)
    {
        return {};
    }
    const bool isPast = notice.why == GIT_CHECKOUT_NOTIFY_UPDATED && notice.workdir == nullptr;
    if (notice.workdir != nullptr)
    {
        replaced_ = notice.workdir->path;
    }
    const std::string name = notice.path;
    for (auto end = name.find('/'); end != std::string::npos; end = name.find('/', end + 1))
    {
        const std::string above = name.substr(0, end);
        const Standing standing = standingAt(root_ + above);
        if (standing == Standing::Link || standing == Standing::Special)
        {
            cleared_.remove(root_ + above);
        }
        else if (standing == Standing::File && isPast && above != replaced_)
        {
            return inTheWay(above, standing);
        }
    }
    const Standing standing = standingAt(root_ + name);
    const bool isSubmodule = isGitlink(notice.target);
    if (isSubmodule && standing == Standing::File)
    {
        return inTheWay(name, standing);
    }
    const bool isFolder = standing == Standing::Folder && isPast && !isSubmodule;
    if (isFolder || standing == Standing::Link || standing == Standing::Special)
    {
        cleared_.remove(root_ + name);
    }
    return isFolder && standingAt(root_ + name) == Standing::Folder ? inTheWay(name, standing)
                                                                    : Finding();
}

} // namespace vclink::git

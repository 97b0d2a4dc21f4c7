// SPDX-License-Identifier: MIT
// CheckoutWatch: what libgit2 reports during the checkout, before it writes the first file.
#include "main/checkout/CheckoutWatch.hpp"

#include <algorithm>
#include <array>
#include <cstddef>
#include <utility>

#include <git2/checkout.h>
#include <git2/errors.h>

#include "error/errorUtil/callbackException.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "main/checkout/askRules.hpp"
#include "main/checkout/gitlinks.hpp"
#include "main/checkout/mountPoints.hpp"
#include "main/checkout/noticedObstacles.hpp"

namespace vclink::git
{
namespace
{

using NoticeRule = Finding (*)(WorkingCopy &, const CheckoutNotice &);

// Not for what libgit2 has seen in the place of a file of HEAD: the look before the switch has
// judged that.
constexpr std::array<NoticeRule, 2> switchNoticeRules{findUnseen, findMissingFile};
constexpr std::array<NoticeRule, 7> mergeNoticeRules{
    findEdit,          findUnseen,           findUntrackedNoticed, findForeignInFolderNoticed,
    findFolderNoticed, findSubmoduleNoticed, findHiddenEditNoticed};

} // namespace

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
    watch.cleared_.removeNoted();
    if (watch.attributes_.isPending())
    {
        watch.applyAttributes();
    }
    if (watch.progress_ != nullptr)
    {
        watch.progress_(path, completed, total, watch.progressPayload_);
    }
}

void CheckoutWatch::applyAttributes() noexcept
{
    try
    {
        attributes_.apply(repository_);
    }
    catch (...)
    {
        // libgit2 cannot be stopped here.
        failure_ = std::current_exception();
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
    const bool isFolder = notice.target->mode == GIT_FILEMODE_TREE;
    Finding lacking = isFolder ? Finding() : promised_.find(notice.path, notice.target->id);
    if (lacking)
    {
        return lacking;
    }
    const bool isExecutable = notice.target->mode == GIT_FILEMODE_BLOB_EXECUTABLE;
    path_.replace(root_.size(), std::string::npos, notice.path);
    const std::string reason = remade_.note(path_, isExecutable);
    attributes_.note(path_, *notice.target);
    return reason.empty()
               ? Finding()
               : Obstacle{notice.path, "the file '" + std::string(notice.path) + "' " + reason};
}

Finding CheckoutWatch::findMounted(const CheckoutNotice &notice)
{
    if (!mounts_)
    {
        mounts_ = mountPointsBelow(root_);
    }
    return std::find(mounts_->begin(), mounts_->end(), notice.path) != mounts_->end()
               ? Finding(mountedAt(notice.path))
               : Finding();
}

int CheckoutWatch::hear(const CheckoutNotice &notice)
{
    if (notice.path == nullptr)
    {
        return 0;
    }
    if (kind_ == CheckoutKind::Revert)
    {
        Finding found = findMounted(notice);
        found = found ? found : clearAll(notice);
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
    return hasRefused_ ? reportConflict(*found) : 0;
}

Finding CheckoutWatch::judge(const CheckoutNotice &notice)
{
    const bool isSeen = notice.baseline != nullptr && notice.workdir != nullptr;
    if (kind_ != CheckoutKind::Merge && isSeen)
    {
        return {};
    }
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
    if (standing == Standing::Link || standing == Standing::Special)
    {
        cleared_.remove(root_ + name);
    }
    const bool isFolder = standing == Standing::Folder && isPast && !isSubmodule;
    if (isFolder && !isEmptyFolder(root_ + name))
    {
        return inTheWay(name, standing);
    }
    if (isFolder)
    {
        cleared_.removeLater(root_ + name);
    }
    return {};
}

} // namespace vclink::git

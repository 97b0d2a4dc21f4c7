// SPDX-License-Identifier: MIT
#include "main/BasicBranchManager.hpp"

#include <algorithm>
#include <array>
#include <iterator>
#include <set>
#include <string>
#include <string_view>
#include <utility>

#include <git2/branch.h>
#include <git2/checkout.h>
#include <git2/errors.h>
#include <git2/refs.h>
#include <git2/repository.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/gitString.hpp"
#include "error/errorUtil/raiseGitError.hpp"
#include "error/logging/ScopeTrace.hpp"
#include "error/logging/logger.hpp"
#include "main/checkout/CheckoutWatch.hpp"
#include "main/merge/BranchMerger.hpp"
#include "main/mergeState/unfinishedOperation.hpp"
#include "options/gitRecords.hpp"
#include "util/lock/BranchSettings.hpp"
#include "util/lock/IndexLock.hpp"
#include "util/lock/PackedReferences.hpp"
#include "util/lock/referenceLocks.hpp"
#include "util/repository/brokenLinks.hpp"
#include "util/repository/fatalPatterns.hpp"
#include "util/repository/objectIds.hpp"
#include "util/repository/reflogAccess.hpp"
#include "util/repository/repository.hpp"
#include "util/repository/settings.hpp"
#include "util/repository/workingTrees.hpp"

namespace vclink::git
{
namespace
{

constexpr std::string_view branchFolder = "refs/heads/";

/// Adds the branches that libgit2 leaves out because of a broken link.
void addOverlooked(git_branch_t type, git_repository *repository,
                   std::vector<BranchPointer> &branches)
{
    const std::string folder = type == GIT_BRANCH_LOCAL ? "refs/heads" : "refs/remotes";
    std::set<std::string> listed;
    std::transform(branches.begin(), branches.end(), std::inserter(listed, listed.end()),
                   [](const BranchPointer &branch) { return branch.getName(); });
    for (const std::string &name : findReferenceFiles(repository, folder))
    {
        const char *const shortName = name.c_str() + folder.size() + 1;
        // As libgit2, leaves out what is no branch.
        if (listed.count(name) == 0 &&
            acquire<git_reference>(git_branch_lookup, repository, shortName, type).has_value())
        {
            branches.emplace_back(name);
        }
    }
}

/// Those that libgit2's iterator finds.
std::vector<BranchPointer> iterateBranches(git_branch_t type, git_repository *repository)
{
    const OwnedHandle<git_branch_iterator> iterator =
        acquire<git_branch_iterator>(git_branch_iterator_new, repository, type).value();
    std::vector<BranchPointer> branches;
    for (;;)
    {
        git_branch_t found{};
        auto reference = acquire<git_reference>(git_branch_next, &found, iterator.get());
        if (reference.has_error() && reference.error().getCode() == GIT_ITEROVER)
        {
            return branches;
        }
        const OwnedHandle<git_reference> branch = std::move(reference).value();
        if ((static_cast<unsigned>(found) & static_cast<unsigned>(type)) != 0)
        {
            branches.emplace_back(git_reference_name(branch.get()));
        }
    }
}

std::vector<BranchPointer> listBranches(git_branch_t type, git_repository *repository)
{
    const bool isCutShort = hasBrokenReferenceLink(repository);
    std::vector<BranchPointer> branches = iterateBranches(type, repository);
    if (isCutShort)
    {
        addOverlooked(type, repository, branches);
    }
    return branches;
}

OwnedHandle<git_reference> lookupLocalBranch(git_repository *repository, const char *name)
{
    return acquire<git_reference>(git_branch_lookup, repository, name, GIT_BRANCH_LOCAL).value();
}

/// Returns zeros for a symbolic reference.
git_oid targetOf(const git_reference *reference)
{
    const git_oid *const target = git_reference_target(reference);
    return target != nullptr ? *target : git_oid{};
}

/// Returns true if there is a local branch of this name at this commit.
bool isBranchAt(git_repository *repository, const char *name, const git_oid &id)
{
    const GitResult<OwnedHandle<git_reference>> branch =
        acquire<git_reference>(git_branch_lookup, repository, name, GIT_BRANCH_LOCAL);
    return branch.has_value() && isSameId(targetOf(branch.value().get()), id);
}

/// Deletes the reference and its reflog. Leaves the settings to BranchSettings.
GitResult<void> deleteReference(git_repository *repository, git_reference *branch)
{
    const WithoutConfiguration noSettings(repository);
    return call(git_branch_delete, branch);
}

/// Reads the result of a function that returns 1 or 0.
bool isYes(const GitResult<void> &answer)
{
    if (answer.has_value() || answer.error().getCode() < 0)
    {
        check(answer);
        return false;
    }
    return true;
}

/// Refuses what git_repository_set_head would refuse after the files have been written, and a
/// branch that a working tree without its folder has.
void refuseCheckedOutElsewhere(git_repository *repository, const git_reference *branch)
{
    const std::string name = git_reference_name(branch);
    const bool isElsewhere =
        isYes(call(git_branch_is_checked_out, branch)) || isCheckedOutElsewhere(repository, name);
    if (isElsewhere && !isYes(call(git_branch_is_head, branch)))
    {
        raiseUsedElsewhere("switch to", name);
    }
}

/// Refuses the files of another reference: a tag, or refs/stash, can have the branch's short name,
/// and libgit2 finds these first.
void refuseOtherReference(const git_reference *branch, const git_object *target,
                          const std::string &name)
{
    const OwnedHandle<git_object> commit =
        acquire<git_object>(git_reference_peel, branch, GIT_OBJECT_COMMIT).value();
    const auto found = acquire<git_object>(git_object_peel, target, GIT_OBJECT_COMMIT);
    const int code = found.has_error() ? found.error().getCode() : 0;
    // A tag can name something else.
    const bool isCommit = code != GIT_EINVALIDSPEC && code != GIT_EPEEL;
    const bool isSame =
        isCommit && isSameId(*git_object_id(commit.get()), *git_object_id(found.value().get()));
    if (!isSame)
    {
        raiseGitError(GIT_EAMBIGUOUS, GIT_ERROR_REFERENCE,
                      "'" + name +
                          "' is also another reference, which comes before the branch: switch with "
                          "'git switch', or rename one of them");
    }
}

/// Another process may move the branch while its files are written, which takes time. HEAD must not
/// name it then: the next commit would undo what the branch got.
class SwitchTarget
{
  public:
    SwitchTarget(git_repository *repository, const git_reference *branch)
        : repository_(repository), name_(git_reference_name(branch)), id_(currentId())
    {
    }

    const char *name() const noexcept
    {
        return name_;
    }

    /// @param state what the switch leaves
    void refuseMoved(const std::string &state) const
    {
        if (!isSameId(currentId(), id_))
        {
            raiseGitError(GIT_EMODIFIED, GIT_ERROR_REFERENCE,
                          "another process has moved '" + std::string(name_) + "' meanwhile; " +
                              state);
        }
    }

  private:
    git_oid currentId() const
    {
        git_oid id{};
        check(git_reference_name_to_id, &id, repository_, name_);
        return id;
    }

    git_repository *repository_;
    const char *name_;
    git_oid id_;
};

} // namespace

BasicBranchManager::BasicBranchManager(GitAdapter &adapter)
    : adapter_(adapter), optionsFactory_(adapter.getOptionsFactory()),
      callbacks_(&adapter.getCallbacks())
{
}

BasicBranchManager::~BasicBranchManager() = default;

std::vector<BranchPointer> BasicBranchManager::getLocalBranches() const
{
    return listBranches(GIT_BRANCH_LOCAL, adapter_.getRepository().get());
}

std::vector<BranchPointer> BasicBranchManager::getRemoteBranches() const
{
    return listBranches(GIT_BRANCH_REMOTE, adapter_.getRepository().get());
}

std::string BasicBranchManager::getHeadRevision() const
{
    return getRevision("HEAD");
}

std::string BasicBranchManager::getRevision(const std::string &revision) const
{
    refuseNul(revision);
    const OwnedHandle<git_repository> repository = adapter_.getRepository();
    std::array<char, idTextSize> digits{};
    git_oid_fmt(digits.data(), revparseId(revision, repository.get()));
    return std::string(digits.data(), digits.size());
}

git_oid BasicBranchManager::getRevisionId(const std::string &revision) const
{
    refuseNul(revision);
    const OwnedHandle<git_repository> repository = adapter_.getRepository();
    return *revparseId(revision, repository.get());
}

void BasicBranchManager::switchBranch(const BranchName &name)
{
    const ScopeTrace trace(
        logger(), "virtual void vclink::git::BasicBranchManager::switchBranch(const BranchName&)",
        "main/BasicBranchManager", 107);
    writeRecord(SeverityParameter, " branch=", name);
    const char *const shortName = asGitString(name);
    const OwnedHandle<git_repository> repository = adapter_.getRepository();
    IndexLock lock(repository.get());
    const OwnedHandle<git_reference> branch = lookupLocalBranch(repository.get(), shortName);
    const SwitchTarget switchTarget(repository.get(), branch.get());
    const OwnedHandle<git_object> target = revparseObject(repository.get(), name).value();
    refuseOtherReference(branch.get(), target.get(), name);
    refuseSwitchThroughLink(repository.get());
    refuseCheckedOutElsewhere(repository.get(), branch.get());
    refuseSwitchInUnfinishedOperation(repository.get());
    refuseFatalPatterns(repository.get());
    refuseUnreadableSettings(repository.get());
    const CheckoutOptions options = optionsFactory_->makeCheckoutOptions();
    git_checkout_options record = toGitCheckoutOptions(options, callbacks_->checkoutCallbacks());
    CheckoutWatch watch(CheckoutKind::Switch, repository.get(), record);
    watch.lookBeforeSwitch(target.get());
    refuseUnwritableReflog(repository.get(), "HEAD");
    awaitUnlocked(repository.get(), "HEAD");
    switchTarget.refuseMoved("nothing has been changed, try again");
    check(git_checkout_tree, repository.get(), target.get(), &record);
    watch.settle();
    lock.publish();
    // After the checkout, so that HEAD stays if the checkout fails.
    check(retryWhileLocked(
        repository.get(),
        [&]
        {
            switchTarget.refuseMoved("its files have been written, but HEAD has not moved: see "
                                     "'git status'");
            return call(git_repository_set_head, repository.get(), switchTarget.name());
        }));
}

void BasicBranchManager::createBranch(const BranchParameters &parameters)
{
    const std::string name = parameters.getName();
    const std::string startPoint = parameters.getStartPoint();
    refuseNul(name);
    refuseNul(startPoint);
    const OwnedHandle<git_repository> repository = adapter_.getRepository();
    const OwnedHandle<git_commit> commit =
        lookupCommitByName(asGitString(startPoint), repository.get()).value();
    retryWhileLocked(repository.get(),
                     [&]
                     {
                         return acquire<git_reference>(git_branch_create, repository.get(),
                                                       asGitString(name), commit.get(), 0);
                     })
        .value();
}

void BasicBranchManager::deleteBranch(const BranchName &name)
{
    const char *const shortName = asGitString(name);
    OwnedHandle<git_repository> repository = adapter_.getRepository();
    // Still asked how long to wait.
    OwnedHandle<git_repository> earlier;
    bool isFirstTry = true;
    git_oid id{};
    const auto deleteOnce = [&]
    {
        if (!std::exchange(isFirstTry, false))
        {
            // After a look at locked packed references, a handle treats the branch as deleted and
            // reports success.
            earlier = std::exchange(repository, adapter_.getRepository());
        }
        const OwnedHandle<git_reference> branch = lookupLocalBranch(repository.get(), shortName);
        id = targetOf(branch.get());
        const char *const reference = git_reference_name(branch.get());
        refuseDeletionBehindLink(repository.get(), reference);
        refuseDeletionInUnfinishedOperation(repository.get(), reference);
        awaitUnlocked(repository.get(), reference);
        refuseUnremovableReflog(repository.get(), reference);
        BranchSettings settings(repository.get(), reference + branchFolder.size());
        GitResult<void> deleted = deleteReference(repository.get(), branch.get());
        if (deleted.has_value())
        {
            settings.remove();
        }
        return deleted;
    };
    PackedReferences packed(repository.get());
    const auto lock = [&packed] { return packed.lock(); };
    // First, so that a permanent lock fails before anything has changed.
    check(retryWhileLocked(repository.get(), lock));
    do
    {
        packed.release();
        check(retryWhileLocked(repository.get(), deleteOnce));
        check(retryWhileLocked(repository.get(), lock));
    } while (packed.haveChanged() && isBranchAt(repository.get(), shortName, id));
}

BranchPointer BasicBranchManager::getCurrentBranch() const
{
    const OwnedHandle<git_repository> repository = adapter_.getRepository();
    const OwnedHandle<git_reference> head =
        acquire<git_reference>(git_repository_head, repository.get()).value();
    const char *name = nullptr;
    check(git_branch_name, &name, head.get());
    return BranchPointer(name);
}

void BasicBranchManager::merge(BranchName name)
{
    const ScopeTrace trace(
        logger(),
        "virtual void vclink::git::BasicBranchManager::merge(vclink::git::BranchManager::"
        "BranchName)",
        "main/BasicBranchManager", 151);
    writeRecord(SeverityParameter, " branchName=", name);
    BranchMerger(adapter_, optionsFactory_, *callbacks_).performMerge(name);
}

std::string BasicBranchManager::getRepositoryState() const
{
    const OwnedHandle<git_repository> repository = adapter_.getRepository();
    // The simple query, which cannot fail: only merges and commits must look more closely.
    return describeRepositoryState(git_repository_state(repository.get()));
}

std::string describeRepositoryState(int state)
{
    // In the order of git_repository_state_t.
    static constexpr std::array<const char *, 12> texts{
        "Normal",        "Conflicts",           "Conflicts", "Conflicts",          "Conflicts",
        "Conflicts",     "Bisecting",           "Rebase",    "Rebase interactive", "Rebase w/merge",
        "Apply mailbox", "Rebase/Apply mailbox"};
    const bool isKnown = state >= 0 && static_cast<std::size_t>(state) < texts.size();
    return isKnown ? texts[static_cast<std::size_t>(state)] : std::string();
}

BranchManager::~BranchManager() = default;

std::unique_ptr<BranchManager> BranchManager::create(vclink::CMAdapter &adapter)
{
    return std::make_unique<BasicBranchManager>(dynamic_cast<GitAdapter &>(adapter));
}

} // namespace vclink::git

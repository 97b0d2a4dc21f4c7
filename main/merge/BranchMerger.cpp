// SPDX-License-Identifier: MIT
#include "main/merge/BranchMerger.hpp"

#include <initializer_list>
#include <stdexcept>
#include <utility>

#include <git2/annotated_commit.h>
#include <git2/checkout.h>
#include <git2/errors.h>
#include <git2/graph.h>
#include <git2/merge.h>
#include <git2/object.h>
#include <git2/refs.h>
#include <git2/repository.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/gitString.hpp"
#include "error/errorUtil/raiseGitError.hpp"
#include "error/errorUtil/rethrowAsGitException.hpp"
#include "error/logging/logger.hpp"
#include "error/raise.hpp"
#include "main/checkout/CheckoutWatch.hpp"
#include "options/gitRecords.hpp"
#include "util/lock/IndexLock.hpp"
#include "util/lock/referenceLocks.hpp"
#include "util/repository/Head.hpp"
#include "util/repository/fatalPatterns.hpp"
#include "util/repository/reflogAccess.hpp"
#include "util/repository/repository.hpp"
#include "util/repository/settings.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::git
{
namespace
{

std::string nameBits(unsigned bits, std::initializer_list<std::pair<unsigned, const char *>> names)
{
    std::string text;
    for (const auto &[bit, name] : names)
    {
        if ((bits & bit) != 0)
        {
            text += name;
            text += ' ';
        }
    }
    return text;
}

/// The branch may have moved since the analysis, and must not lose commits.
void refuseMovedBranch(git_repository *repository, const git_reference *head, const git_oid *target)
{
    const git_oid *const current = git_reference_target(head);
    const GitResult<void> ahead = call(git_graph_descendant_of, repository, target, current);
    if (ahead.has_value())
    {
        raiseGitError(GIT_EMODIFIED, GIT_ERROR_MERGE,
                      "the current branch has moved since the merge began");
    }
    // 1 means that it is ahead.
    if (ahead.error().getCode() < 0)
    {
        ahead.value();
    }
}

} // namespace

BranchMerger::BranchMerger(GitAdapter &adapter, std::shared_ptr<GitOptionsFactory> optionsFactory,
                           GitCallbacks &callbacks)
    : adapter_(adapter), optionsFactory_(std::move(optionsFactory)), callbacks_(&callbacks)
{
}

void BranchMerger::performMerge(const BranchName &name)
{
    try
    {
        refuseNul(name);
        const OwnedHandle<git_repository> repository = adapter_.getRepository();
        decide(name, repository.get());
    }
    catch (...)
    {
        rethrowAsGitException(shared_vclink::git::MergeFailed(name));
    }
}

void BranchMerger::decide(const BranchName &name, git_repository *repository)
{
    refuseOtherStates(repository);
    refuseFatalPatterns(repository);
    refuseUnreadableSettings(repository);
    const git_oid *const id = revparseId(name, repository);
    const OwnedHandle<git_annotated_commit> theirs =
        acquire<git_annotated_commit>(git_annotated_commit_lookup, repository, id).value();
    git_merge_analysis_t analysis{};
    git_merge_preference_t preference{};
    const git_annotated_commit *heads[] = {theirs.get()};
    // Intentionally ignores the result: after a failure no bit is set, and the merge itself fails.
    static_cast<void>(git_merge_analysis(&analysis, &preference, repository, heads, 1));
    writeRecord(SeverityDiagnostic,
                "Merge Analysis: ", [=] { return mergeAnalysisToText(analysis); });
    writeRecord(SeverityDiagnostic,
                "Merge Preference: ", [=] { return mergePreferenceToText(preference); });
    if ((analysis & GIT_MERGE_ANALYSIS_UP_TO_DATE) != 0)
    {
        return;
    }
    if ((analysis & GIT_MERGE_ANALYSIS_UNBORN) != 0)
    {
        throw std::runtime_error("GIT_MERGE_ANALYSIS_UNBORN");
    }
    const bool canFastForward = (analysis & GIT_MERGE_ANALYSIS_FASTFORWARD) != 0;
    if (canFastForward && (preference & GIT_MERGE_PREFERENCE_NO_FASTFORWARD) == 0)
    {
        fastForward(repository, theirs.get());
        return;
    }
    if (!canFastForward && (preference & GIT_MERGE_PREFERENCE_FASTFORWARD_ONLY) != 0)
    {
        raise(shared_vclink::git::MergePreferenceFastForward());
    }
    threeWayMerge(name, repository, theirs.get());
}

void BranchMerger::awaitWritableBranch(git_repository *repository, const git_reference *head)
{
    const char *const name = git_reference_name(head);
    refuseUnwritableReflog(repository, "HEAD");
    refuseUnwritableReflog(repository, name);
    awaitUnlocked(repository, name);
}

void BranchMerger::refuseOtherStates(git_repository *repository)
{
    if (findRepositoryState(repository) != GIT_REPOSITORY_STATE_NONE || isInSeries(repository))
    {
        raise(shared_vclink::git::UnableToMergeBadRepositoryState());
    }
}

void BranchMerger::fastForward(git_repository *repository, git_annotated_commit *theirs)
{
    IndexLock lock(repository);
    refuseOtherStates(repository);
    const OwnedHandle<git_reference> head =
        acquire<git_reference>(git_repository_head, repository).value();
    const git_oid *const id = git_annotated_commit_id(theirs);
    refuseMovedBranch(repository, head.get(), id);
    const Head headThen(head.get());
    const OwnedHandle<git_object> target =
        acquire<git_object>(git_object_lookup, repository, id, GIT_OBJECT_COMMIT).value();
    CheckoutOptions options = optionsFactory_->makeCheckoutOptions();
    options.checkoutStrategy = GIT_CHECKOUT_SAFE;
    git_checkout_options record = toGitCheckoutOptions(options, callbacks_->checkoutCallbacks());
    CheckoutWatch watch(CheckoutKind::Switch, repository, record);
    watch.lookBeforeSwitch(target.get());
    awaitWritableBranch(repository, head.get());
    // The branch as it was read: libgit2 detects a later change when it moves the branch.
    headThen.refuseMoved(repository);
    check(git_checkout_tree, repository, target.get(), &record);
    watch.settle();
    lock.publish();
    // After the checkout, so that the branch stays if the checkout fails.
    retryWhileLocked(
        repository,
        [&] { return acquire<git_reference>(git_reference_set_target, head.get(), id, nullptr); })
        .value();
}

std::string mergeAnalysisToText(unsigned analysis)
{
    return nameBits(analysis, {{GIT_MERGE_ANALYSIS_UP_TO_DATE, "GIT_MERGE_ANALYSIS_UP_TO_DATE"},
                               {GIT_MERGE_ANALYSIS_UNBORN, "GIT_MERGE_ANALYSIS_UNBORN"},
                               {GIT_MERGE_ANALYSIS_FASTFORWARD, "GIT_MERGE_ANALYSIS_FASTFORWARD"},
                               {GIT_MERGE_ANALYSIS_NORMAL, "GIT_MERGE_ANALYSIS_NORMAL"}});
}

std::string mergePreferenceToText(unsigned preference)
{
    return nameBits(
        preference,
        {{GIT_MERGE_PREFERENCE_NO_FASTFORWARD, "GIT_MERGE_PREFERENCE_NO_FASTFORWARD"},
         {GIT_MERGE_PREFERENCE_FASTFORWARD_ONLY, "GIT_MERGE_PREFERENCE_FASTFORWARD_ONLY"}});
}

} // namespace vclink::git

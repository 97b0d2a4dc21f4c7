// SPDX-License-Identifier: MIT
// BranchMerger::threeWayMerge: git_merge, and what follows it with and without conflicts.
#include <filesystem>
#include <optional>
#include <string>
#include <system_error>

#include <git2/annotated_commit.h>
#include <git2/attr.h>
#include <git2/checkout.h>
#include <git2/errors.h>
#include <git2/index.h>
#include <git2/merge.h>
#include <git2/refs.h>
#include <git2/repository.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/gitString.hpp"
#include "error/logging/logger.hpp"
#include "error/raise.hpp"
#include "fl/i18n/convert.hpp"
#include "main/checkout/CheckoutWatch.hpp"
#include "main/checkout/gitlinks.hpp"
#include "main/merge/BranchMerger.hpp"
#include "main/mergeState/MergeMarker.hpp"
#include "main/mergeState/mergeHead.hpp"
#include "options/gitRecords.hpp"
#include "util/lock/IndexLock.hpp"
#include "util/path/PathspecArray.hpp"
#include "util/path/pathspecEscape.hpp"
#include "util/repository/attributes.hpp"
#include "util/repository/repository.hpp"
#include "util/scope/ScopedCleanup.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::git
{
namespace
{

bool isUnmergeable(git_repository *repository, const char *path)
{
    const git_attr_value_t merge = git_attr_value(readAttribute(repository, path, "merge"));
    const git_attr_value_t text = git_attr_value(readAttribute(repository, path, "text"));
    return merge == GIT_ATTR_VALUE_FALSE ||
           (text == GIT_ATTR_VALUE_FALSE && merge == GIT_ATTR_VALUE_STRING);
}

/// Returns true if our side of a conflict is a submodule, or nothing beside theirs. There is no
/// file to write then, and a checkout could delete the submodule's folder.
bool isOfSubmodule(const git_index_entry *ours, const git_index_entry *theirs)
{
    return isGitlink(ours) || (ours == nullptr && isGitlink(theirs));
}

/// Restores the empty folder of a submodule in conflict that is not populated. libgit2 removes it,
/// and a commit would treat the submodule as deleted.
void bringFolderBack(git_repository *repository, const git_index_entry *ours)
{
    if (isGitlink(ours))
    {
        std::error_code stays;
        std::filesystem::create_directories(
            git_repository_workdir(repository) + std::string(ours->path), stays);
    }
}

std::vector<ustring> listUnmergeable(git_repository *repository, git_index *index)
{
    const OwnedHandle<git_index_conflict_iterator> iterator =
        acquire<git_index_conflict_iterator>(git_index_conflict_iterator_new, index).value();
    std::vector<ustring> paths;
    for (;;)
    {
        const git_index_entry *ancestor = nullptr;
        const git_index_entry *ours = nullptr;
        const git_index_entry *theirs = nullptr;
        const GitResult<void> next =
            call(git_index_conflict_next, &ancestor, &ours, &theirs, iterator.get());
        if (next.has_error() && next.error().getCode() == GIT_ITEROVER)
        {
            return paths;
        }
        next.value();
        std::vector<ustring> ofConflict;
        collectUnmergeable(repository, ofConflict, ancestor);
        collectUnmergeable(repository, ofConflict, ours);
        collectUnmergeable(repository, ofConflict, theirs);
        if (!isOfSubmodule(ours, theirs))
        {
            paths.insert(paths.end(), ofConflict.begin(), ofConflict.end());
        }
        bringFolderBack(repository, ours);
    }
}

/// Returns patterns that match only these names.
std::vector<ustring> makeExactPatterns(const std::vector<ustring> &paths)
{
    std::vector<ustring> patterns;
    patterns.reserve(paths.size());
    for (const ustring &path : paths)
    {
        const std::string name = fl::i18n::ustring_to_utf8(path);
        patterns.push_back(fl::i18n::utf8_to_ustring(escapeExactPathspec(name)));
    }
    return patterns;
}

} // namespace

void collectUnmergeable(git_repository *repository, std::vector<ustring> &paths,
                        const git_index_entry *entry)
{
    if (entry == nullptr || entry->path == nullptr || !isUnmergeable(repository, entry->path))
    {
        return;
    }
    writeRecord(SeverityDiagnostic, "Conflicted entry is not mergeable: ", entry->path);
    paths.push_back(fl::i18n::utf8_to_ustring(entry->path));
}

void BranchMerger::threeWayMerge(const BranchName &name, git_repository *repository,
                                 git_annotated_commit *theirs)
{
    CheckoutOptions options = optionsFactory_->makeCheckoutOptions();
    options.checkoutStrategy = GIT_CHECKOUT_FORCE | GIT_CHECKOUT_ALLOW_CONFLICTS;
    const MergeOptions mergeOptions = optionsFactory_->makeMergeOptions();
    git_checkout_options checkoutRecord =
        toGitCheckoutOptions(options, callbacks_->checkoutCallbacks());
    const git_merge_options mergeRecord = toGitMergeOptions(mergeOptions);
    const git_annotated_commit *heads[] = {theirs};
    // Outlives the lock, so that it exists until the index is in place.
    std::optional<MergeMarker> marker;
    IndexLock lock(repository);
    refuseOtherStates(repository);
    CheckoutWatch watch(CheckoutKind::Merge, repository, checkoutRecord);
    watch.lookBeforeMerge(git_annotated_commit_id(theirs));
    // Otherwise the merge would be complete before its commit fails.
    awaitWritableBranch(repository,
                        acquire<git_reference>(git_repository_head, repository).value().get());
    const MergeSides sides{readHeadId(repository), *git_annotated_commit_id(theirs)};
    marker.emplace(repository, sides);
    check(git_merge, repository, heads, 1U, &mergeRecord, &checkoutRecord);
    restoreMergeHead(repository, sides.theirs);
    watch.settle();
    const OwnedHandle<git_index> index = getRepositoryIndex(repository);
    if (git_index_has_conflicts(index.get()) != 0)
    {
        endWithConflicts(repository, index.get(), checkoutRecord, lock);
    }
    lock.publish();
    marker.reset();
    // The commit acquires it again, for its own repository.
    lock.release();
    commitMerge(name, repository, sides);
}

void BranchMerger::commitMerge(const BranchName &name, git_repository *repository,
                               const MergeSides &sides)
{
    const bool isReference =
        acquire<git_reference>(git_reference_dwim, repository, asGitString(name)).has_value();
    const std::string message = (isReference ? "Merge branch '" : "Merge commit '") + name + "'";
    adapter_.expectMerge(&sides);
    const ScopedCleanup over([this] { adapter_.expectMerge(nullptr); });
    vclink::CMAdapter &adapter = adapter_;
    adapter.commit(upath(), fl::i18n::utf8_to_ustring(message));
}

void BranchMerger::endWithConflicts(git_repository *repository, git_index *index,
                                    const git_checkout_options &options, IndexLock &lock)
{
    const std::vector<ustring> paths = listUnmergeable(repository, index);
    if (!paths.empty())
    {
        git_checkout_options copy = options;
        const PathspecArray pathspec = makeStringPathspec(makeExactPatterns(paths));
        copy.paths = getArray(pathspec);
        copy.checkout_strategy |= GIT_CHECKOUT_USE_OURS;
        check(git_checkout_index, repository, nullptr, &copy);
    }
    lock.publish();
    raise(shared_vclink::git::HasConflicts());
}

} // namespace vclink::git

// SPDX-License-Identifier: MIT
#include "FloorMerge.hpp"

#include <iterator>

#include <git2.h>

#include "error/errorUtil/GitResult.hpp"
#include "options/gitRecords.hpp"

namespace vclink::test
{
namespace
{

using git::acquire;
using git::check;

void commitMerge(git_repository *repository, git_index *index, const git_oid *theirId)
{
    git_oid headId;
    check(git_reference_name_to_id, &headId, repository, "HEAD");
    // As a commit through the library takes in what the working tree holds.
    check(git_index_update_all, index, nullptr, nullptr, nullptr);
    check(git_index_write, index);
    git_oid treeId;
    check(git_index_write_tree, &treeId, index);
    const auto tree = acquire<git_tree>(git_tree_lookup, repository, &treeId).value();
    const auto head = acquire<git_commit>(git_commit_lookup, repository, &headId).value();
    const auto theirs = acquire<git_commit>(git_commit_lookup, repository, theirId).value();
    const auto signature = acquire<git_signature>(git_signature_default, repository).value();
    const git_commit *parents[] = {head.get(), theirs.get()};
    git_oid id;
    check(git_commit_create, &id, repository, "HEAD", signature.get(), signature.get(), nullptr,
          "merge", tree.get(), std::size(parents), parents);
    check(git_repository_state_cleanup, repository);
}

} // namespace

bool mergeWithLibGit2(const GitRepository &repository, const std::string &id)
{
    const auto handle =
        acquire<git_repository>(git_repository_open, repository.path().c_str()).value();
    git_oid theirId;
    check(git_oid_fromstr, &theirId, id.c_str());
    const auto theirs =
        acquire<git_annotated_commit>(git_annotated_commit_lookup, handle.get(), &theirId).value();
    const auto mergeOptions = git::initGitRecord(git_merge_options_init, 1u);
    auto checkoutOptions = git::initGitRecord(git_checkout_options_init, 1u);
    checkoutOptions.checkout_strategy = GIT_CHECKOUT_FORCE | GIT_CHECKOUT_ALLOW_CONFLICTS;
    const git_annotated_commit *heads[] = {theirs.get()};
    check(git_merge, handle.get(), heads, std::size(heads), &mergeOptions, &checkoutOptions);
    const auto index = acquire<git_index>(git_repository_index, handle.get()).value();
    if (git_index_has_conflicts(index.get()) != 0)
    {
        return false;
    }
    commitMerge(handle.get(), index.get(), &theirId);
    return true;
}

} // namespace vclink::test

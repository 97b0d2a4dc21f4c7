// SPDX-License-Identifier: MIT
#include "FloorMerge.hpp"

#include <memory>
#include <stdexcept>

#include <git2.h>

namespace vclink::test
{
namespace
{

template <class Handle> using Owner = std::unique_ptr<Handle, void (*)(Handle *)>;

void check(int code)
{
    if (code != 0)
    {
        const git_error *const error = git_error_last();
        throw std::runtime_error(error != nullptr ? error->message : std::to_string(code));
    }
}

template <class Handle, class Function, class... Arguments>
Owner<Handle> get(void (*release)(Handle *), Function function, Arguments... arguments)
{
    Handle *handle = nullptr;
    check(function(&handle, arguments...));
    return Owner<Handle>(handle, release);
}

void commitMerge(git_repository *repository, git_index *index, const git_oid *theirId)
{
    git_oid headId;
    check(git_reference_name_to_id(&headId, repository, "HEAD"));
    // As a commit through the library takes in what the working tree holds.
    check(git_index_update_all(index, nullptr, nullptr, nullptr));
    check(git_index_write(index));
    git_oid treeId;
    check(git_index_write_tree(&treeId, index));
    const auto tree = get<git_tree>(git_tree_free, git_tree_lookup, repository, &treeId);
    const auto head = get<git_commit>(git_commit_free, git_commit_lookup, repository, &headId);
    const auto theirs = get<git_commit>(git_commit_free, git_commit_lookup, repository, theirId);
    const auto signature =
        get<git_signature>(git_signature_free, git_signature_default, repository);
    const git_commit *parents[] = {head.get(), theirs.get()};
    git_oid id;
    check(git_commit_create(&id, repository, "HEAD", signature.get(), signature.get(), nullptr,
                            "merge", tree.get(), 2, parents));
    check(git_repository_state_cleanup(repository));
}

} // namespace

bool mergeWithLibGit2(const GitRepository &repository, const std::string &id)
{
    const auto handle =
        get<git_repository>(git_repository_free, git_repository_open, repository.path().c_str());
    git_oid theirId;
    check(git_oid_fromstr(&theirId, id.c_str()));
    const auto theirs = get<git_annotated_commit>(
        git_annotated_commit_free, git_annotated_commit_lookup, handle.get(), &theirId);
    git_merge_options mergeOptions;
    check(git_merge_options_init(&mergeOptions, GIT_MERGE_OPTIONS_VERSION));
    git_checkout_options checkoutOptions;
    check(git_checkout_options_init(&checkoutOptions, GIT_CHECKOUT_OPTIONS_VERSION));
    checkoutOptions.checkout_strategy = GIT_CHECKOUT_FORCE | GIT_CHECKOUT_ALLOW_CONFLICTS;
    const git_annotated_commit *heads[] = {theirs.get()};
    check(git_merge(handle.get(), heads, 1, &mergeOptions, &checkoutOptions));
    const auto index = get<git_index>(git_index_free, git_repository_index, handle.get());
    if (git_index_has_conflicts(index.get()) != 0)
    {
        return false;
    }
    commitMerge(handle.get(), index.get(), &theirId);
    return true;
}

} // namespace vclink::test

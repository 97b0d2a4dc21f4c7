// SPDX-License-Identifier: MIT
#include "LibGit2Calls.hpp"

#include "passToLibGit2.hpp"
#include "support/interposition.hpp"

using vclink::test::findNext;
using vclink::test::detail::current;
using vclink::test::detail::pass;
using vclink::test::detail::passAcquiring;
using vclink::test::detail::Passing;
using vclink::test::detail::passReleasing;
using vclink::test::detail::tell;

namespace vclink::test
{

LibGit2Calls::LibGit2Calls()
{
    detail::current = this;
}

LibGit2Calls::~LibGit2Calls()
{
    detail::current = nullptr;
}

} // namespace vclink::test

using vclink::test::LibGit2Calls;

int git_libgit2_init()
{
    const Passing passing("git_libgit2_init");
    if (passing.isNoted() && current->onInit)
        return current->onInit();
    return findNext<decltype(git_libgit2_init)>("git_libgit2_init")();
}

int git_libgit2_shutdown()
{
    const Passing passing("git_libgit2_shutdown");
    if (passing.isNoted() && current->onShutdown)
        return current->onShutdown();
    return findNext<decltype(git_libgit2_shutdown)>("git_libgit2_shutdown")();
}

int git_libgit2_version(int *major, int *minor, int *revision)
{
    const Passing passing("git_libgit2_version");
    if (passing.isNoted() && current->onVersion)
        return current->onVersion(major, minor, revision);
    return findNext<decltype(git_libgit2_version)>("git_libgit2_version")(major, minor, revision);
}

int git_libgit2_features()
{
    const Passing passing("git_libgit2_features");
    if (passing.isNoted() && current->onFeatures)
        return current->onFeatures();
    return findNext<decltype(git_libgit2_features)>("git_libgit2_features")();
}

int git_status_options_init(git_status_options *options, unsigned version)
{
    const Passing passing("git_status_options_init");
    if (passing.isNoted() && current->onStatusOptionsInit)
        return current->onStatusOptionsInit();
    return findNext<decltype(git_status_options_init)>("git_status_options_init")(options, version);
}

int git_repository_open_ext(git_repository **out, const char *path, unsigned flags,
                            const char *ceilings)
{
    tell(&LibGit2Calls::onOpen, path, flags, ceilings);
    if (out == nullptr)
    {
        const Passing passing("git_repository_open_ext(nullptr)");
        return findNext<decltype(git_repository_open_ext)>("git_repository_open_ext")(
            out, path, flags, ceilings);
    }
    return passAcquiring("git_repository_open_ext", git_repository_open_ext, out, path, flags,
                         ceilings);
}

int git_status_foreach_ext(git_repository *repository, const git_status_options *options,
                           git_status_cb callback, void *payload)
{
    const Passing passing("git_status_foreach_ext");
    auto *const real = findNext<decltype(git_status_foreach_ext)>("git_status_foreach_ext");
    if (passing.isNoted() && current->onStatusForeach)
        return current->onStatusForeach(real, repository, options, callback, payload);
    return real(repository, options, callback, payload);
}

void git_repository_free(git_repository *repository)
{
    passReleasing("git_repository_free", repository);
}

int git_repository_index(git_index **out, git_repository *repository)
{
    return passAcquiring("git_repository_index", git_repository_index, out, repository);
}

int git_index_add_all(git_index *index, const git_strarray *pathspec, unsigned flags,
                      git_index_matched_path_cb callback, void *payload)
{
    tell(&LibGit2Calls::onAddAll, pathspec, flags, callback, payload);
    return pass("git_index_add_all", git_index_add_all, index, pathspec, flags, callback, payload);
}

int git_index_remove_all(git_index *index, const git_strarray *pathspec,
                         git_index_matched_path_cb callback, void *payload)
{
    tell(&LibGit2Calls::onRemoveAll, pathspec, callback, payload);
    return pass("git_index_remove_all", git_index_remove_all, index, pathspec, callback, payload);
}

int git_index_write(git_index *index)
{
    return pass("git_index_write", git_index_write, index);
}

void git_index_free(git_index *index)
{
    passReleasing("git_index_free", index);
}

int git_revparse_single(git_object **out, git_repository *repository, const char *text)
{
    tell(&LibGit2Calls::onRevparse, text);
    return passAcquiring("git_revparse_single", git_revparse_single, out, repository, text);
}

int git_reset_default(git_repository *repository, const git_object *target,
                      const git_strarray *pathspec)
{
    tell(&LibGit2Calls::onReset, target, pathspec);
    return pass("git_reset_default", git_reset_default, repository, target, pathspec);
}

int git_checkout_options_init(git_checkout_options *options, unsigned version)
{
    return pass("git_checkout_options_init", git_checkout_options_init, options, version);
}

int git_checkout_index(git_repository *repository, git_index *index,
                       const git_checkout_options *options)
{
    tell(&LibGit2Calls::onCheckout, index, options);
    return pass("git_checkout_index", git_checkout_index, repository, index, options);
}

int git_object_lookup(git_object **out, git_repository *repository, const git_oid *id,
                      git_object_t type)
{
    return passAcquiring("git_object_lookup", git_object_lookup, out, repository, id, type);
}

void git_object_free(git_object *object)
{
    passReleasing("git_object_free", object);
}

int git_reference_dwim(git_reference **out, git_repository *repository, const char *name)
{
    tell(&LibGit2Calls::onDwim, name);
    return passAcquiring("git_reference_dwim", git_reference_dwim, out, repository, name);
}

void git_reference_free(git_reference *reference)
{
    passReleasing("git_reference_free", reference);
}

int git_commit_lookup(git_commit **out, git_repository *repository, const git_oid *id)
{
    return passAcquiring("git_commit_lookup", git_commit_lookup, out, repository, id);
}

void git_commit_free(git_commit *commit)
{
    passReleasing("git_commit_free", commit);
}

int git_repository_state(git_repository *repository)
{
    return pass("git_repository_state", git_repository_state, repository);
}

int git_repository_mergehead_foreach(git_repository *repository,
                                     git_repository_mergehead_foreach_cb callback, void *payload)
{
    return pass("git_repository_mergehead_foreach", git_repository_mergehead_foreach, repository,
                callback, payload);
}

int git_signature_default(git_signature **out, git_repository *repository)
{
    return passAcquiring("git_signature_default", git_signature_default, out, repository);
}

int git_signature_now(git_signature **out, const char *name, const char *email)
{
    return passAcquiring("git_signature_now", git_signature_now, out, name, email);
}

void git_signature_free(git_signature *signature)
{
    passReleasing("git_signature_free", signature);
}

int git_index_update_all(git_index *index, const git_strarray *pathspec,
                         git_index_matched_path_cb callback, void *payload)
{
    tell(&LibGit2Calls::onUpdateAll, pathspec, callback, payload);
    return pass("git_index_update_all", git_index_update_all, index, pathspec, callback, payload);
}

int git_index_open(git_index **out, const char *path)
{
    return passAcquiring("git_index_open", git_index_open, out, path);
}

int git_index_add(git_index *index, const git_index_entry *entry)
{
    return pass("git_index_add", git_index_add, index, entry);
}

int git_index_write_tree(git_oid *out, git_index *index)
{
    return pass("git_index_write_tree", git_index_write_tree, out, index);
}

int git_tree_lookup(git_tree **out, git_repository *repository, const git_oid *id)
{
    return passAcquiring("git_tree_lookup", git_tree_lookup, out, repository, id);
}

void git_tree_free(git_tree *tree)
{
    passReleasing("git_tree_free", tree);
}

int git_commit_create(git_oid *id, git_repository *repository, const char *reference,
                      const git_signature *author, const git_signature *committer,
                      const char *encoding, const char *message, const git_tree *tree,
                      std::size_t parentCount, const git_commit *parents[])
{
    tell(&LibGit2Calls::onCommitCreate, reference, author, committer, encoding, message,
         parentCount);
    return pass("git_commit_create", git_commit_create, id, repository, reference, author,
                committer, encoding, message, tree, parentCount, parents);
}

int git_repository_state_cleanup(git_repository *repository)
{
    return pass("git_repository_state_cleanup", git_repository_state_cleanup, repository);
}

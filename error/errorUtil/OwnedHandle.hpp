// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include <git2.h>

namespace vclink::git
{

/// Releases libgit2 handles. Does not pass a null handle to libgit2.
class GitDeleters
{
  public:
    void operator()(git_annotated_commit *handle) const
    {
        release(git_annotated_commit_free, handle);
    }
    void operator()(git_branch_iterator *handle) const
    {
        release(git_branch_iterator_free, handle);
    }
    void operator()(git_commit *handle) const
    {
        release(git_commit_free, handle);
    }
    void operator()(git_config *handle) const
    {
        release(git_config_free, handle);
    }
    void operator()(git_index *handle) const
    {
        release(git_index_free, handle);
    }
    void operator()(git_index_conflict_iterator *handle) const
    {
        release(git_index_conflict_iterator_free, handle);
    }
    void operator()(git_object *handle) const
    {
        release(git_object_free, handle);
    }
    void operator()(git_odb *handle) const
    {
        release(git_odb_free, handle);
    }
    void operator()(git_odb_object *handle) const
    {
        release(git_odb_object_free, handle);
    }
    void operator()(git_reference *handle) const
    {
        release(git_reference_free, handle);
    }
    void operator()(git_remote *handle) const
    {
        release(git_remote_free, handle);
    }
    void operator()(git_repository *handle) const
    {
        release(git_repository_free, handle);
    }
    void operator()(git_signature *handle) const
    {
        release(git_signature_free, handle);
    }
    void operator()(git_tree *handle) const
    {
        release(git_tree_free, handle);
    }

  private:
    template <class Handle> static void release(void (*free)(Handle *), Handle *handle)
    {
        if (handle != nullptr)
        {
            free(handle);
        }
    }
};

/// An owning libgit2 handle.
template <class Handle> using OwnedHandle = std::unique_ptr<Handle, GitDeleters>;

} // namespace vclink::git

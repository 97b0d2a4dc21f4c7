// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <functional>
#include <map>
#include <set>
#include <string>
#include <vector>

#include <git2.h>

namespace vclink::test
{

/// Stands between the library and libgit2 in a program that links this file: notes the library's
/// calls in order, and lets a test answer in libgit2's place. What libgit2 calls of itself, during
/// one of these calls, is neither noted nor answered. For one thread.
class LibGit2Calls
{
  public:
    /// Begins to note; every call goes on to libgit2.
    LibGit2Calls();
    LibGit2Calls(const LibGit2Calls &) = delete;
    LibGit2Calls &operator=(const LibGit2Calls &) = delete;
    ~LibGit2Calls();

    /// The names of the calls, in order.
    std::vector<std::string> names;
    /// The handles that the calls gave out and did not take back yet.
    std::set<const void *> handles;

    /// The codes to answer in libgit2's place, by the name of the call, with an error record of the
    /// class GIT_ERROR_OS and the text "injected".
    std::map<std::string, int> failing;

    /// Told of each call, before it is made, where it is set.
    std::function<void(const std::string &name)> onCall;

    /// What answers in libgit2's place where it is set. The replacement of the walk is given the
    /// real one as well.
    using Walk = int (*)(git_repository *, const git_status_options *, git_status_cb, void *);
    std::function<int(Walk real, git_repository *, const git_status_options *, git_status_cb,
                      void *)>
        onStatusForeach;
    std::function<int()> onStatusOptionsInit;
    std::function<int()> onInit;
    std::function<int()> onShutdown;
    std::function<int(int *, int *, int *)> onVersion;
    std::function<int()> onFeatures;

    /// Told of the arguments before the call goes on, where it is set.
    std::function<void(const char *path, unsigned flags, const char *ceilings)> onOpen;
    std::function<void(const git_strarray *pathspec, unsigned flags,
                       git_index_matched_path_cb callback, void *payload)>
        onAddAll;
    std::function<void(const git_strarray *pathspec, git_index_matched_path_cb callback,
                       void *payload)>
        onRemoveAll;
    std::function<void(const char *text)> onRevparse;
    std::function<void(const git_object *target, const git_strarray *pathspec)> onReset;
    std::function<void(git_index *index, const git_checkout_options *options)> onCheckout;
    std::function<void(const char *name)> onDwim;
    std::function<void(const git_strarray *pathspec, git_index_matched_path_cb callback,
                       void *payload)>
        onUpdateAll;
    /// What git_commit_create is given but for the repository, with the number of parents.
    std::function<void(const char *reference, const git_signature *author,
                       const git_signature *committer, const char *encoding, const char *message,
                       std::size_t parents)>
        onCommitCreate;
    std::function<void(const char *name)> onRemoteLookup;
    std::function<void(const git_strarray *refspecs, const git_fetch_options *options,
                       const char *reflogMessage)>
        onFetch;
    std::function<void(const git_strarray *refspecs, const git_push_options *options)> onPush;
    std::function<void(git_direction direction, const git_remote_callbacks *callbacks,
                       const git_proxy_options *proxy, const git_strarray *headers)>
        onConnect;
    std::function<void(const char *url, const char *path, const git_clone_options *options)>
        onClone;

    /// What answers in libgit2's place where it is set.
    std::function<int(git_repository **)> cloneInstead;
    std::function<int(const git_remote_head ***heads, std::size_t *count)> listInstead;
};

} // namespace vclink::test

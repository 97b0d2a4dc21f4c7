// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <vector>

#include <git2.h>

namespace vclink::test
{

/// Stands between the library and libgit2 in a program that links this file: notes the library's
/// calls in order, and lets a test answer in libgit2's place. Calls that libgit2 makes of itself
/// may be noted too. For one thread.
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
    /// Told of each opening's arguments.
    std::function<void(const char *path, unsigned flags, const char *ceilings)> onOpen;
};

} // namespace vclink::test

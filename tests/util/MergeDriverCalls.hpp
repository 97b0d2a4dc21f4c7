// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <vector>

#include <git2.h>
#include <git2/sys/merge.h>

namespace vclink::test
{

/// Stands between the merge driver and libgit2 in a program that links this file: notes the calls
/// in order, gives the driver the sides that a test has made, and lets a test answer in libgit2's
/// place. For one thread.
class MergeDriverCalls
{
  public:
    MergeDriverCalls();
    MergeDriverCalls(const MergeDriverCalls &) = delete;
    MergeDriverCalls &operator=(const MergeDriverCalls &) = delete;
    ~MergeDriverCalls();

    /// The names of the calls, in order.
    std::vector<std::string> names;
    /// Told of each call as well.
    std::function<void(const std::string &name)> onCall;

    /// What the source of a merge tells.
    const git_index_entry *ancestor = nullptr;
    const git_index_entry *ours = nullptr;
    const git_index_entry *theirs = nullptr;
    git_repository *repository = nullptr;
    git_merge_file_options options = {};

    /// What answers in libgit2's place where it is set.
    std::function<int()> onSnapshot;
    std::function<int()> onGetEntry;
    std::function<int()> onReadBlob;
    std::function<int()> onSetBuffer;
    std::function<int()> onRegister;
    std::function<int()> onUnregister;
};

} // namespace vclink::test

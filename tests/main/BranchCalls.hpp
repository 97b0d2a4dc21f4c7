// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <map>
#include <string>
#include <vector>

#include <git2.h>

namespace vclink::test
{

/// Stands between the library and libgit2 in a program that links this file, for the calls of
/// branches, merges, attributes and the user's configuration: notes them in order, and lets a test
/// answer in libgit2's place. What libgit2 calls of itself during one of them is neither noted nor
/// answered. For one thread.
class BranchCalls
{
  public:
    /// Begins to note; every call goes on to libgit2.
    BranchCalls();
    BranchCalls(const BranchCalls &) = delete;
    BranchCalls &operator=(const BranchCalls &) = delete;
    ~BranchCalls();

    /// The names of the calls without "git_", in order.
    std::vector<std::string> names;
    /// The records of git_checkout_tree, git_checkout_index and git_merge, in order.
    std::vector<git_checkout_options> checkouts;
    /// The paths of those records.
    std::vector<std::vector<std::string>> checkoutPaths;
    /// The flags of git_attr_get.
    std::vector<unsigned> attributeFlags;
    /// How many merge options had any other field than libgit2 gives them.
    int changedMergeOptions = 0;

    /// The codes to answer in libgit2's place, by the name of the call, with an error record of the
    /// class GIT_ERROR_OS and the text "injected".
    std::map<std::string, int> failing;
    /// What git_attr_value answers, where it is set.
    std::function<int()> onAttributeValue;
};

} // namespace vclink::test

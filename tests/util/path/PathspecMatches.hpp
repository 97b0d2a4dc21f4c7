// SPDX-License-Identifier: MIT
#pragma once

#include <set>
#include <string>
#include <vector>

#include "support/GitRepository.hpp"
#include "util/path/PathspecArray.hpp"

namespace vclink::test
{

/// The files that libgit2's calls take a pathspec to mean, found out by running them. The tree
/// holds the same files, each with any content, and is left as it was.
class PathspecMatches
{
  public:
    /// @param repository committed and clean; libgit2 runs
    explicit PathspecMatches(const GitRepository &repository);

    /// git_status_foreach_ext
    std::set<std::string> inStatus(const git::PathspecArray &pathspec) const;
    /// git_index_add_all, into an index that holds nothing
    std::set<std::string> inAddAll(const git::PathspecArray &pathspec) const;
    /// git_index_remove_all
    std::set<std::string> inRemoveAll(const git::PathspecArray &pathspec) const;
    /// git_index_update_all, with all files changed
    std::set<std::string> inUpdateAll(const git::PathspecArray &pathspec) const;
    /// git_reset_default, with nothing in the index
    std::set<std::string> inResetDefault(const git::PathspecArray &pathspec) const;
    /// git_checkout_index by force, with all files missing
    std::set<std::string> inCheckoutIndex(const git::PathspecArray &pathspec) const;

    /// All of these by name, each with what it matched.
    struct Answer
    {
        std::string call;
        std::set<std::string> names;
    };
    std::vector<Answer> inEveryCall(const git::PathspecArray &pathspec) const;

  private:
    GitRepository repository_;
};

} // namespace vclink::test

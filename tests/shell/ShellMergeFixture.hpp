// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <string>
#include <vector>

#include "ChangeFixture.hpp"

namespace vclink::test
{

/// Base of the tests that merge: an identity, and what makes branches.
class ShellMergeFixture : public ChangeFixture
{
  protected:
    using Files = std::map<std::string, std::string>;

    ShellMergeFixture();

    /// Commits these files on the current branch.
    void commitFiles(const Files &files);
    /// A branch from here with one commit of these files. The current branch stays.
    void makeBranch(const std::string &name, const Files &files);
    /// The branch "other" and the current one, which change different files.
    void diverge();
    /// The branch "other" and the current one, which change "a" both, and one other file each.
    void clash();

    CommandResult run(const std::vector<std::string> &arguments) const;
    /// Runs the program, which has to end with 1 and to write nothing to standard output.
    /// @return what it wrote to standard error
    std::string fail(const std::vector<std::string> &arguments) const;

    std::string head() const;
    std::string state() const;

    /// A copy of the repository, to do the same in with git.
    GitRepository makeTwin() const;
    /// Index, files, and of HEAD the tree, the parents and the message.
    static std::string describe(const GitRepository &repository);
};

} // namespace vclink::test

// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <string>
#include <vector>

#include "ShellFixture.hpp"

namespace vclink::test
{

/// Base of the tests of what changes a working copy: a repository with the files "a", "b",
/// "folder/c" and "folder/deep/d", each holding its name and a line feed, and an ignored
/// "x.ignored".
class ChangeFixture : public ShellFixture
{
  protected:
    ChangeFixture();

    /// Runs the program in the repository. It has to end with 0, and to write nothing, as nobody is
    /// at a terminal, except how to restore what a revert discards.
    void succeed(const std::vector<std::string> &arguments) const;
    /// Runs the program in the repository. It has to end with 1, and to write nothing to standard
    /// output.
    /// @return what it wrote to standard error
    std::string fail(const std::vector<std::string> &arguments) const;
    /// As fail(). It has to leave everything as it was.
    /// @return what it wrote to standard error, without the program's name
    std::string refuse(const std::vector<std::string> &arguments) const;

    /// git's two letters of every file that is not clean, ignored ones left out.
    std::map<std::string, std::string> letters() const;
    /// The names of the files in HEAD.
    std::vector<std::string> committed() const;
    /// Leaves "a" in conflict between two branches, in the midst of a merge, with "b" changed on
    /// the other branch.
    void makeConflict();

    GitRepository repository_ = makeRepository();

  private:
    /// All that a command may change: index, references, state files, files.
    std::string everything() const;
};

} // namespace vclink::test

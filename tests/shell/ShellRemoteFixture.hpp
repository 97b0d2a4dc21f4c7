// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <string>
#include <vector>

#include "ShellFixture.hpp"
#include "transport/GitDaemon.hpp"
#include "transport/ServerOfTheSuite.hpp"

namespace vclink::test
{

/// Base of the tests of what works with a remote: a repository that a daemon serves, with the files
/// "a" and "folder/b", and the working copy that they were pushed from, whose remote "origin" it
/// is.
class ShellRemoteFixture : public ServerOfTheSuite<GitDaemon>, public ShellFixture
{
  protected:
    using References = std::map<std::string, std::string>;

    using ServerOfTheSuite<GitDaemon>::TearDownTestSuite;
    ShellRemoteFixture();

    /// Runs the program in the working copy.
    CommandResult run(const std::vector<std::string> &arguments) const;
    /// As run(). It has to end with 0, and to write nothing, as nobody is at a terminal.
    void succeed(const std::vector<std::string> &arguments) const;
    /// As run(). It has to end with 1, to write nothing to standard output, and to leave the
    /// references of both repositories as they are.
    /// @return what it wrote to standard error, without the program's name
    std::string refuse(const std::vector<std::string> &arguments) const;
    /// What appears on a terminal, in the working copy. The program has to end with 0.
    std::string show(const std::vector<std::string> &arguments) const;
    /// The program as the arguments of another one, on a terminal of this kind.
    static std::vector<std::string> onTerminal(const std::string &terminal,
                                               const std::vector<std::string> &arguments);

    /// Ids by name.
    static References references(const GitRepository &repository);

    GitRepository served_ = server().makeRepository();
    std::string url_ = server().url(served_);
    GitRepository repository_ = makeRepository();
};

} // namespace vclink::test

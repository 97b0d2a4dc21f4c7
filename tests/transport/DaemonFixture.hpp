// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "GitDaemon.hpp"
#include "RemoteFixture.hpp"
#include "ServerOfTheSuite.hpp"

namespace vclink::test
{

/// Base of the fixtures that need one real server. It has a repository with files that take some
/// time to transfer.
class DaemonFixture : public ServerOfTheSuite<GitDaemon>, public RemoteFixture
{
  protected:
    static constexpr int fileCount = 100;
    /// What a clone transfers at least; the files hold noise, which can't be packed.
    static constexpr std::size_t size = 1'000'000;

    using ServerOfTheSuite<GitDaemon>::TearDownTestSuite;
    DaemonFixture();

    /// The repository's address at another port.
    std::string urlAt(std::uint16_t port) const;
    /// Writes the files with other noise into a working copy, and commits them.
    /// @return the id of the commit
    static std::string commitNoise(GitRepository &repository, unsigned seed,
                                   std::size_t bytes = size);
    std::string servedId(const std::string &reference) const;

    GitRepository served_ = server().makeRepository();
    std::string url_ = server().url(served_);
    GitRepository source_ = makeRepository("source");
    std::string commit_;
};

} // namespace vclink::test

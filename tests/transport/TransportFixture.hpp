// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "RemoteFixture.hpp"
#include "servers.hpp"

namespace vclink::test
{

/// Base of the suites that run over every transport. The server has an empty repository, and there
/// is a working copy whose "origin" is the repository's plain path.
class TransportFixture : public RunningServer, public RemoteFixture
{
  protected:
    TransportFixture();
    static void TearDownTestSuite();

    /// Commits a file's new content in the working copy, and gives the commit's id.
    std::string change(const std::string &name, const std::string &bytes);
    /// Lets git push from the working copy to the server, by the plain path.
    void publish(const std::vector<std::string> &refspecs) const;
    /// A clone made by git over the transport, in the test's folder.
    GitRepository cloneWithGit(const std::string &name) const;
    /// The id of a reference on the server, empty where there is none.
    std::string servedId(const std::string &reference) const;

    GitRepository served_ = server().makeRepository();
    std::string url_ = server().url(served_);
    GitRepository source_ = makeRepository("source");
};

} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include <string>

#include <gtest/gtest.h>

#include "servers.hpp"

namespace
{

using vclink::test::allTransports;
using vclink::test::GitRepository;

/// What git itself makes of the servers: a failure here is not the library's.
class Servers : public vclink::test::RunningServer, public vclink::test::GitFixture
{
  protected:
    Servers()
    {
        server().prepareClient();
    }
    static void TearDownTestSuite()
    {
        stopServers();
    }
};

TEST_P(Servers, TakeWhatGitPushesAndGiveItBack)
{
    const GitRepository served = server().makeRepository();
    auto source = makeRepository("source");
    source.write("file", "first\n");
    const std::string first = source.commitAll("first");
    source.git({"push", "--quiet", server().url(served), "HEAD:refs/heads/main"});
    EXPECT_EQ(served.line({"rev-parse", "refs/heads/main"}), first);

    const auto clone = GitRepository::clone(server().url(served), folder() / "clone");
    EXPECT_EQ(clone.read("file"), "first\n");
    EXPECT_EQ(clone.line({"config", "remote.origin.url"}), server().url(served));

    const std::string second = source.commit("second");
    source.git({"push", "--quiet", server().url(served), "HEAD:refs/heads/main"});
    clone.git({"fetch", "--quiet"});
    EXPECT_EQ(clone.line({"rev-parse", "refs/remotes/origin/main"}), second);
}

INSTANTIATE_TEST_SUITE_P(Transports, Servers, allTransports(), testing::PrintToStringParamName());

} // namespace

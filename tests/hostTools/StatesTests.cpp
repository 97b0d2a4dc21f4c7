// SPDX-License-Identifier: MIT
#include "hostTools.hpp"

#include <memory>
#include <string>

#include <gtest/gtest.h>

#include "support/GitFixture.hpp"
#include "support/WithoutLeakChecks.hpp"
#include "support/adapterFor.hpp"

namespace
{

using vclink::test::GitRepository;
using vclink::test::WithoutLeakChecks;

class HostStatesOfFiles : public vclink::test::GitFixture
{
  protected:
    void begin()
    {
        repository_.write("file", "1\n");
        repository_.commitAll("begin");
    }
    vclink::FileStateMap read() const
    {
        return host_tools::readStates(*adapter_);
    }
    /// As in a clone that borrows objects from a repository that is away.
    void lose(const std::string &revision) const
    {
        const std::string id = repository_.line({"rev-parse", revision});
        repository_.remove(".git/objects/" + id.substr(0, 2) + '/' + id.substr(2));
    }

    GitRepository repository_ = makeRepository();
    std::unique_ptr<vclink::CMAdapter> adapter_ = vclink::test::adapterFor(repository_);
};

TEST_F(HostStatesOfFiles, AreReadBeforeTheFirstCommitToo)
{
    EXPECT_TRUE(read().empty());
    repository_.write("new", "");
    EXPECT_EQ(read().size(), 1U);
    repository_.add({"new"});
    EXPECT_EQ(read().begin()->second.getState(), vclink::FileState::Added);
}

TEST_F(HostStatesOfFiles, AreUnknownWhereLibGit2CannotReadTheWorkingCopy)
{
    begin();
    EXPECT_EQ(read().size(), 1U);
    repository_.git({"config", "core.ignorecase", "bogus"});
    EXPECT_THROW(read(), host_tools::StatesUnknown);
}

/// This is no question of states: the failure says what is wrong.
TEST_F(HostStatesOfFiles, FailWhereTheRepositoryCannotBeOpened)
{
    begin();
    repository_.write(".git/config", "[core\n");
    EXPECT_THROW(read(), vclink::git::LibGit2Exception);
}

TEST_F(HostStatesOfFiles, AreUnknownWhereTheCommitOfHeadCannotBeRead)
{
    begin();
    const std::string head = repository_.line({"rev-parse", "HEAD"});
    lose("HEAD");
    // libgit2 leaks the reference.
    const WithoutLeakChecks unchecked;
    EXPECT_THROW(read(), host_tools::StatesUnknown);
    repository_.write(".git/HEAD", head + '\n');
    EXPECT_THROW(read(), host_tools::StatesUnknown);
}

TEST_F(HostStatesOfFiles, AreUnknownWhereTheTreeOfHeadCannotBeRead)
{
    begin();
    repository_.git({"checkout", "--quiet", "--detach"});
    EXPECT_EQ(read().size(), 1U);
    lose("HEAD^{tree}");
    EXPECT_THROW(read(), host_tools::StatesUnknown);
}

} // namespace

// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "RemoteFixture.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"

namespace
{

namespace git = vclink::git;
using testing::Contains;
using testing::StartsWith;
using namespace vclink::test;

class Push : public RemoteFixture, public testing::WithParamInterface<Naming>
{
  protected:
    Push() : RemoteFixture(GetParam())
    {
        repository_.git({"fetch", "--quiet", "origin"});
        repository_.git({"reset", "--quiet", "--hard", "origin/main"});
    }

    /// Pushes, and expects of the references, there and here, what git makes of them.
    void expectAsGitDoes(const std::vector<std::string> &refspecs)
    {
        const auto here = twin();
        const GitRepository there(folder() / "twin of the server");
        std::filesystem::copy(server_.path(), there.path(),
                              std::filesystem::copy_options::recursive);
        here.git({"remote", "set-url", "origin", there.path().string()});
        std::vector<std::string> arguments{"push", "--quiet", "origin"};
        arguments.insert(arguments.end(), refspecs.begin(), refspecs.end());
        here.git(arguments);
        push(refspecs);
        EXPECT_EQ(references(server_), references(there));
        EXPECT_EQ(references(repository_), references(here));
        EXPECT_TRUE(server_.tryGit({"fsck", "--full", "--strict"}).succeeded());
    }

    const std::string refMain = "refs/heads/main";
    const std::string main_ = refMain + ':' + refMain;
};

TEST_P(Push, MakesANewBranchAndMovesOneForward)
{
    const std::string id = commit("file", "changed\n");
    repository_.git({"tag", "v1"});
    const std::string name = "refs/heads/feature/gr\xC3\xBC\xC3\x9F";
    expectAsGitDoes({main_, "refs/heads/main:" + name, "refs/tags/v1:refs/tags/v1"});
    for (const auto &reference : {refMain, name})
        EXPECT_EQ(idOf(reference, server_), id);
    EXPECT_EQ(idOf("origin/main"), id);
}

TEST_P(Push, RefusesABranchThatCannotBeMovedForward)
{
    const std::string there = publish("file", "of the author again\n");
    repository_.git({"fetch", "--quiet", "origin"});
    commit("file", "of the working copy\n");
    const auto before = references(server_);
    const auto failure = failureOf([this] { push({main_}); });
    EXPECT_EQ(failure.code, GIT_ENONFASTFORWARD);
    EXPECT_EQ(failure.errorClass, GIT_ERROR_REFERENCE);
    EXPECT_EQ(failure.text, "cannot push non-fastforwardable reference");
    EXPECT_EQ(references(server_), before);
    EXPECT_EQ(idOf("origin/main"), there);
}

TEST_P(Push, RefusesABranchWhoseCommitsAreNotHere)
{
    const std::string there = publish("file", "of the author again\n");
    commit("file", "of the working copy\n");
    const auto failure = failureOf([this] { push({main_, "refs/heads/main:refs/heads/other"}); });
    EXPECT_EQ(failure.code, GIT_ENONFASTFORWARD);
    EXPECT_EQ(idOf(refMain, server_), there);
    EXPECT_FALSE(server_.tryGit({"rev-parse", "--verify", "refs/heads/other"}).succeeded());
}

TEST_P(Push, MovesABranchByForce)
{
    publish("file", "of the author again\n");
    repository_.git({"fetch", "--quiet", "origin"});
    const std::string id = commit("file", "of the working copy\n");
    push({'+' + main_});
    EXPECT_EQ(idOf(refMain, server_), id);
}

TEST_P(Push, DeletesABranch)
{
    author_.git({"push", "--quiet", "server", "main:gone"});
    repository_.git({"fetch", "--quiet", "origin"});
    push({":refs/heads/gone"});
    EXPECT_FALSE(server_.tryGit({"rev-parse", "--verify", "refs/heads/gone"}).succeeded());
    EXPECT_FALSE(repository_.tryGit({"rev-parse", "--verify", "origin/gone"}).succeeded());
}

TEST_P(Push, OfAnEmptyListTakesWhatIsConfiguredOrNothing)
{
    const auto before = references(server_);
    const std::string id = commit("file", "changed\n");
    push({});
    EXPECT_EQ(references(server_), before);
    repository_.git({"config", "remote.origin.push", "refs/heads/main:refs/heads/configured"});
    push({});
    EXPECT_EQ(idOf("refs/heads/configured", server_), id);
    EXPECT_NE(idOf(refMain, server_), id);
}

TEST_P(Push, TakesFullNamesOfBranchesThatAreHereOnly)
{
    const auto before = references(server_);
    commit("file", "changed\n");
    for (const auto *refspec : {"main:main", "refs/heads/no:refs/heads/no"})
        EXPECT_LT(failureOf([&] { push({refspec}); }).code, 0) << refspec;
    EXPECT_EQ(references(server_), before);
}

/// The server's side of a local remote is libgit2 itself, which runs no hooks: a lock rejects.
TEST_P(Push, CountsAReferenceThatTheServerRejectsAsDone)
{
    const std::string before = idOf(refMain, server_);
    server_.write("refs/heads/main.lock", "");
    const std::string id = commit("file", "changed\n");
    const LogCapture log(git::SeverityParameter);
    EXPECT_NO_THROW(push({main_, "refs/heads/main:refs/heads/other"}));
    EXPECT_THAT(log.messages(),
                Contains(testing::AllOf(StartsWith(" refnameStr=refs/heads/main statusStr="),
                                        testing::HasSubstr("lock"))));
    EXPECT_THAT(log.messages(), Contains(" refnameStr=refs/heads/other statusStr="));
    EXPECT_EQ(idOf(refMain, server_), before);
    EXPECT_EQ(idOf("refs/heads/other", server_), id);
}

TEST_P(Push, ToAWorkingCopyIsRefusedByLibGit2)
{
    repository_.git({"remote", "set-url", "origin", nameOf(author_)});
    commit("file", "changed\n");
    const auto failure = failureOf([this] { push({main_}); });
    EXPECT_EQ(failure.code, GIT_EBAREREPO);
    EXPECT_EQ(failure.text, "local push doesn't (yet) support pushing to non-bare repos.");
}

TEST_P(Push, TellsWhatItDoes)
{
    commit("file", "changed\n");
    const LogCapture log(git::SeverityParameter);
    push({main_});
    const auto messages = log.messages();
    EXPECT_THAT(messages, Contains(" len=1"));
    EXPECT_THAT(messages, Contains(StartsWith(" stage=0 current=")));
    EXPECT_THAT(messages, Contains(" refnameStr=refs/heads/main statusStr="));
}

/// Nothing of the server's is to be said here, and that is the only poll point.
TEST_P(Push, IsNotCancelledWhileTheServerSaysNothing)
{
    const std::string id = commit("file", "changed\n");
    interactor_->cancel();
    EXPECT_NO_THROW(push({main_}));
    EXPECT_EQ(idOf(refMain, server_), id);
}

TEST_P(Push, LeavesTheWorkingCopyAsItIs)
{
    commit("file", "changed\n");
    repository_.write("untracked", "x");
    auto before = stateOf(repository_);
    push({main_});
    auto after = stateOf(repository_);
    before.references.clear();
    after.references.clear();
    EXPECT_EQ(after, before);
}

INSTANTIATE_TEST_SUITE_P(Locally, Push, testing::Values(Naming::PlainPath, Naming::FileUrl));

} // namespace

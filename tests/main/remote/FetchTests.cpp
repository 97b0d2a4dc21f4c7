// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "RemoteFixture.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"

namespace
{

namespace git = vclink::git;
using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;
using namespace vclink::test;

class Fetch : public RemoteFixture, public testing::WithParamInterface<Naming>
{
  protected:
    Fetch() : RemoteFixture(GetParam())
    {
    }

    /// Fetches, and expects of the references what git makes of them.
    void expectAsGitDoes(const std::vector<std::string> &refspecs = {}) const
    {
        const auto copy = twin();
        std::vector<std::string> arguments{"fetch", "--quiet", "origin"};
        arguments.insert(arguments.end(), refspecs.begin(), refspecs.end());
        copy.git(arguments);
        fetch(refspecs);
        EXPECT_EQ(references(repository_), references(copy));
        EXPECT_TRUE(repository_.tryGit({"fsck", "--full", "--strict"}).succeeded());
    }
    /// The author's annotated tag of what is checked out there.
    void tagWithWords(const std::string &name)
    {
        author_.git({"-c", "user.name=A", "-c", "user.email=a@b", "tag", "-m", "words", name});
    }
    std::vector<std::string> remoteBranches() const
    {
        return split(
            repository_.git({"for-each-ref", "--format=%(refname:lstrip=3)", "refs/remotes"}));
    }
};

TEST_P(Fetch, TakesANewBranch)
{
    expectAsGitDoes();
    EXPECT_EQ(idOf("origin/main"), idOf("main", author_));
    author_.git({"checkout", "--quiet", "-b", "feature/gr\xC3\xBC\xC3\x9F"});
    publish("new", "x");
    expectAsGitDoes();
    EXPECT_THAT(remoteBranches(), ElementsAre("feature/gr\xC3\xBC\xC3\x9F", "main"));
}

TEST_P(Fetch, MovesABranchAlsoWhereItWasRewritten)
{
    fetch();
    std::string id = publish("file", "changed\n");
    expectAsGitDoes();
    EXPECT_EQ(idOf("origin/main"), id);
    author_.git({"checkout", "--quiet", "--orphan", "other"});
    author_.git({"branch", "-D", "--quiet", "main"});
    author_.git({"checkout", "--quiet", "--orphan", "main"});
    id = publish("file", "from the beginning\n");
    expectAsGitDoes();
    EXPECT_EQ(idOf("origin/main"), id);
    const auto before = stateOf(repository_);
    fetch();
    EXPECT_EQ(stateOf(repository_), before) << "there is nothing new";
}

TEST_P(Fetch, KeepsBranchesThatAreDeletedThereUnlessPruningIsConfigured)
{
    author_.git({"push", "--quiet", "server", "main:gone"});
    fetch();
    for (const auto *name : {"gone", "main"})
        server_.git({"update-ref", "-d", std::string("refs/heads/") + name});
    expectAsGitDoes();
    EXPECT_THAT(remoteBranches(), ElementsAre("gone", "main"));
    repository_.git({"config", "remote.origin.prune", "true"});
    expectAsGitDoes();
    EXPECT_THAT(references(repository_), IsEmpty());
}

TEST_P(Fetch, TakesTagsOfWhatItTakes)
{
    author_.git({"tag", "light"});
    tagWithWords("heavy");
    author_.git({"push", "--quiet", "server", "--tags"});
    expectAsGitDoes();
    EXPECT_EQ(idOf("light"), idOf("main", author_));
    EXPECT_EQ(idOf("heavy"), idOf("heavy", author_));
}

/// Within this machine libgit2 takes whatever references there are, which git does not.
TEST_P(Fetch, TakesEveryTagOfARepositoryOnThisMachine)
{
    author_.git({"checkout", "--quiet", "--detach"});
    author_.write("elsewhere", "x");
    author_.commitAll("on no branch");
    author_.git({"tag", "elsewhere"});
    author_.git({"push", "--quiet", "server", "elsewhere"});
    fetch();
    EXPECT_EQ(idOf("elsewhere"), idOf("elsewhere", author_));
}

TEST_P(Fetch, TakesRefspecsAsTheyStand)
{
    const std::string id = publish("file", "changed\n");
    author_.git({"push", "--quiet", "server", "main:gr\xC3\xBC\xC3\x9F"});
    expectAsGitDoes({"+refs/heads/gr\xC3\xBC\xC3\x9F:refs/heads/\xE6\x9D\xB1",
                     "refs/heads/main:refs/own/main"});
    EXPECT_EQ(idOf("refs/heads/\xE6\x9D\xB1"), id);
    EXPECT_EQ(idOf("refs/own/main"), id);
}

TEST_P(Fetch, OfAnEmptyListTakesWhatIsConfigured)
{
    author_.git({"push", "--quiet", "server", "main:other"});
    repository_.git({"config", "remote.origin.fetch", "+refs/heads/other:refs/own/other"});
    expectAsGitDoes();
    EXPECT_EQ(idOf("refs/own/other"), idOf("main", author_));
    EXPECT_THAT(remoteBranches(), IsEmpty());
}

TEST_P(Fetch, RefusesARefspecThatIsNone)
{
    const NothingChanges nothing(repository_);
    EXPECT_LT(failureOf([this] { fetch({"refs/heads/*:refs/own/main"}); }).code, 0);
}

TEST_P(Fetch, LeavesBranchesAndFilesAsTheyAre)
{
    commit("own", "x");
    repository_.write("own", "edited");
    repository_.write("untracked", "x");
    const auto before = stateOf(repository_);
    fetch();
    auto after = stateOf(repository_);
    EXPECT_NE(after.references, before.references);
    after.references = before.references;
    EXPECT_EQ(after, before);
}

/// git refuses it. The refspecs are the host's and the user's.
TEST_P(Fetch, MovesABranchThatIsCheckedOutIfARefspecNamesIt)
{
    fetch({"refs/heads/main:refs/remotes/origin/main"});
    repository_.git({"reset", "--quiet", "--hard", "origin/main"});
    const auto before = stateOf(repository_);
    const std::string id = publish("file", "changed\n");
    EXPECT_THAT(repository_.tryGit({"fetch", "origin", "refs/heads/main:refs/heads/main"}).errors,
                HasSubstr("refusing to fetch into"));
    fetch({"refs/heads/main:refs/heads/main"});
    EXPECT_EQ(currentBranch(), "refs/heads/main");
    EXPECT_EQ(idOf("main"), id);
    EXPECT_EQ(stateOf(repository_).workingTree, before.workingTree);
    EXPECT_EQ(stateOf(repository_).index, before.index);
}

TEST_P(Fetch, LeavesAReferenceThatCannotBeFastForwardedAndDoesNotFail)
{
    fetch();
    repository_.git({"branch", "topic", "origin/main"});
    repository_.git({"checkout", "--quiet", "topic"});
    const std::string own = commit("own", "x");
    repository_.git({"checkout", "--quiet", "--detach"});
    publish("file", "changed\n");
    fetch({"refs/heads/main:refs/heads/topic"});
    EXPECT_EQ(idOf("topic"), own);
    fetch({"+refs/heads/main:refs/heads/topic"});
    EXPECT_EQ(idOf("topic"), idOf("main", author_));
}

/// The reflog of the reference holds libgit2's own words.
TEST_P(Fetch, TellsItsTransferAndEachReferenceThatItMoves)
{
    author_.git({"push", "--quiet", "server", "main:other"});
    const LogCapture log(git::SeverityParameter | git::SeverityProgress | git::SeverityDiagnostic |
                         git::SeverityException);
    fetch();
    for (const auto *name : {" ref=refs/remotes/origin/main", " ref=refs/remotes/origin/other"})
        EXPECT_THAT(log.messages(git::SeverityParameter), Contains(name));
    EXPECT_THAT(log.messages(git::SeverityProgress),
                Contains(StartsWith("Transfer Progress (Objects / Bytes): 3")));
    EXPECT_THAT(log.messages(git::SeverityDiagnostic), IsEmpty());
    EXPECT_THAT(log.messages(git::SeverityException), IsEmpty());
    EXPECT_TRUE(interactor_->progress.calls.empty());
    EXPECT_THAT(repository_.git({"reflog", "show", "refs/remotes/origin/main"}),
                HasSubstr("fetch"));
}

TEST_P(Fetch, ThatFailsLeavesTheRepositoryAsItWas)
{
    fetch();
    publish("file", "changed\n");
    repository_.write(".git/refs/remotes/origin/main.lock", "");
    const auto before = stateOf(repository_);
    EXPECT_THAT(failureOf([this] { fetch(); }).text, HasSubstr("main.lock"));
    EXPECT_EQ(stateOf(repository_), before);
    repository_.remove(".git/refs/remotes/origin/main.lock");
    expectAsGitDoes();
}

INSTANTIATE_TEST_SUITE_P(Locally, Fetch, testing::Values(Naming::PlainPath, Naming::FileUrl));

} // namespace

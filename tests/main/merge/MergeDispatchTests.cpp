// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "support/Sentence.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;

/// Which kind of merge is made of what is possible and what `merge.ff` prefers.
class MergeDispatch : public MergeFixture
{
  protected:
    void tag(const std::string &name, const std::string &message) const
    {
        repository_.git({"-c", "user.name=x", "-c", "user.email=x@y", "tag", "-a", "-m", message,
                         name, "topic"});
    }
    /// Expects HEAD at the branch, with no new commit, as git has it.
    void expectFastForward()
    {
        const std::string target = idOf("topic");
        expectAsGit();
        EXPECT_EQ(idOf("main"), target);
        EXPECT_EQ(currentBranch(), "refs/heads/main");
        EXPECT_THAT(status(), IsEmpty());
    }
    void expectOnlyFastForwardIsAllowed() const
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOfMerge("topic"),
                  textOf(shared_vclink::git::MergePreferenceFastForward()));
    }
};

enum class MergeKind
{
    FastForward,
    MergeCommit,
    Refused
};

/// What `merge.ff` says of a branch that is ahead, and of one that has diverged.
struct Preference : Sentence
{
    const char *value;
    MergeKind ahead;
    MergeKind diverged;
};

class MergePreference : public MergeDispatch, public testing::WithParamInterface<Preference>
{
  protected:
    void expect(MergeKind kind)
    {
        if (GetParam().value != nullptr)
            prefer(GetParam().value);
        if (kind == MergeKind::FastForward)
            expectFastForward();
        else if (kind == MergeKind::MergeCommit)
        {
            expectCleanAsGit();
            EXPECT_EQ(currentBranch(), "refs/heads/main");
        }
        else
            expectOnlyFastForwardIsAllowed();
    }
};

TEST_P(MergePreference, DecidesOfABranchThatIsAhead)
{
    makeAhead();
    expect(GetParam().ahead);
}

TEST_P(MergePreference, DecidesOfABranchThatHasDiverged)
{
    makeDiverged();
    expect(GetParam().diverged);
}

/// A word that means nothing counts as none.
const Preference preferences[]{
    {{"Missing"}, nullptr, MergeKind::FastForward, MergeKind::MergeCommit},
    {{"Banana"}, "banana", MergeKind::FastForward, MergeKind::MergeCommit},
    {{"True"}, "true", MergeKind::FastForward, MergeKind::MergeCommit},
    {{"Yes"}, "yes", MergeKind::FastForward, MergeKind::MergeCommit},
    {{"False"}, "false", MergeKind::MergeCommit, MergeKind::MergeCommit},
    {{"Zero"}, "0", MergeKind::MergeCommit, MergeKind::MergeCommit},
    {{"Only"}, "only", MergeKind::FastForward, MergeKind::Refused},
};

INSTANTIATE_TEST_SUITE_P(Of, MergePreference, testing::ValuesIn(preferences),
                         testing::PrintToStringParamName());

TEST_F(MergeDispatch, UpToDateDoesNothingWhateverIsPreferred)
{
    makeAhead();
    repository_.git({"merge", "--quiet", "topic"});
    for (const auto *value : {"true", "false", "only"})
    {
        prefer(value);
        const NothingChanges nothing(repository_);
        for (const auto *name : {"topic", "main", "HEAD", "HEAD~1"})
            EXPECT_NO_THROW(merge(name));
    }
}

TEST_F(MergeDispatch, ThePreferenceMayStandInTheUsersFile)
{
    makeDiverged();
    GitRepository(environment().home()).write(".gitconfig", "[merge]\n\tff = only\n");
    expectOnlyFastForwardIsAllowed();
    prefer("true");
    EXPECT_NO_THROW(merge("topic"));
}

TEST_F(MergeDispatch, AnUnbornBranchIsRefusedWhateverIsPreferred)
{
    repository_.git({"checkout", "--quiet", "--orphan", "unborn"});
    repository_.git({"rm", "-r", "--quiet", "--force", "."});
    for (const auto *value : {"true", "only"})
    {
        prefer(value);
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOfMerge("main"), "GIT_MERGE_ANALYSIS_UNBORN");
    }
}

TEST_F(MergeDispatch, ADetachedHeadMovesAlone)
{
    makeAhead();
    makeBranch("other", writes("ours", "x"));
    repository_.git({"checkout", "--quiet", "--detach"});
    const std::string main = idOf("main");
    expectAsGit();
    EXPECT_EQ(idOf("HEAD"), idOf("topic"));
    expectAsGit("other");
    EXPECT_THAT(parents(), ElementsAre(idOf("topic"), idOf("other")));
    EXPECT_EQ(idOf("main"), main);
    EXPECT_EQ(currentBranch(), "");
}

TEST_F(MergeDispatch, TakesALongCommitInEitherWay)
{
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    repository_.write("new", "x");
    repository_.commitAll(std::string(9000, 'x'));
    repository_.git({"checkout", "--quiet", "main"});
    expectFastForward();
    repository_.git({"reset", "--quiet", "--hard", "HEAD~1"});
    repository_.write("ours", "x");
    repository_.commitAll(std::string(9000, 'y'));
    expectCleanAsGit();
}

/// The look-up of the commit does not peel a tag; git does.
TEST_F(MergeDispatch, RefusesAnAnnotatedTagOrAFileByItsRightId)
{
    makeDiverged();
    tag("annotated", "m");
    tag("long", std::string(9000, 'x'));
    const NothingChanges nothing(repository_);
    const Failure failure{GIT_ENOTFOUND, GIT_ERROR_INVALID,
                          "the requested type does not match the type in the ODB"};
    for (const auto *name : {"annotated", "long", "HEAD:file"})
        EXPECT_EQ(failureOfMerge(name), textOf(failure)) << name;
    EXPECT_EQ(branches().getRevision("long"), idOf("long"));
}

TEST_F(MergeDispatch, TakesTheTagWhereABranchHasTheSameNameAsGitDoes)
{
    makeDiverged();
    makeBranch("third", writes("third", "x"));
    repository_.git({"tag", "topic", "third"});
    expectAsGit();
    EXPECT_TRUE(std::filesystem::exists(repository_ / "third"));
    EXPECT_FALSE(std::filesystem::exists(repository_ / "theirs"));
}

/// libgit2 reads the base of two histories without one as nothing; git refuses such a merge.
TEST_F(MergeDispatch, MergesHistoriesThatHaveNothingInCommon)
{
    repository_.git({"checkout", "--quiet", "--orphan", "topic"});
    repository_.git({"rm", "-r", "--quiet", "--force", "."});
    repository_.commitAll(writes("theirs", "x"), "theirs");
    repository_.git({"checkout", "--quiet", "main"});
    EXPECT_FALSE(makeTwin().tryGit({"merge", "--quiet", "--no-edit", "topic"}).succeeded());
    const std::string ours = idOf("main");
    EXPECT_NO_THROW(merge("topic"));
    EXPECT_THAT(parents(), ElementsAre(ours, idOf("topic")));
    EXPECT_TRUE(std::filesystem::exists(repository_ / "theirs"));
    EXPECT_TRUE(std::filesystem::exists(repository_ / "file"));
}

TEST_F(MergeDispatch, WorksInALinkedWorktree)
{
    makeDiverged();
    const std::string linked = folder() / "linked";
    repository_.git({"worktree", "add", "--quiet", "-b", "second", linked});
    const GitRepository worktree(linked);
    const auto adapter = makeAdapter(linked);
    const std::string main = idOf("main");
    EXPECT_NO_THROW(git::BranchManager::create(*adapter)->merge("topic"));
    EXPECT_EQ(idOf("second^1"), main);
    EXPECT_EQ(idOf("second^2"), idOf("topic"));
    EXPECT_EQ(idOf("main"), main);
    EXPECT_EQ(worktree.git({"status", "--porcelain"}), "");
}

TEST_F(MergeDispatch, OneAfterAnotherWorks)
{
    makeDiverged();
    makeBranch("second", writes("second", "x"));
    makeBranch("third", writes("third", "x"), "main~1");
    EXPECT_NO_THROW(merge("topic"));
    EXPECT_NO_THROW(merge("second"));
    EXPECT_NO_THROW(merge("third"));
    for (const auto *name : {"ours", "theirs", "second", "third"})
        EXPECT_TRUE(std::filesystem::exists(repository_ / name)) << name;
    EXPECT_THAT(status(), IsEmpty());
    EXPECT_EQ(repository_.git({"fsck", "--strict", "--no-dangling"}), "");
}

} // namespace

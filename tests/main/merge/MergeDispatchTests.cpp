// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "support/Descriptors.hpp"
#include "support/LogCapture.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::test::GitRepository;
using vclink::test::LogCapture;
using vclink::test::NothingChanges;
using vclink::test::textOf;

/// Which kind of merge is made of what is possible and what `merge.ff` prefers.
class MergeDispatch : public vclink::test::MergeFixture
{
  protected:
    void expectNothingHappens(const std::string &name) const
    {
        const NothingChanges nothing(repository_);
        EXPECT_NO_THROW(merge(name));
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
    /// Expects a new commit with two parents, as git has it.
    void expectMergeCommit()
    {
        const std::string ours = idOf("main");
        expectAsGit();
        EXPECT_THAT(parents(), ElementsAre(ours, idOf("topic")));
        EXPECT_EQ(currentBranch(), "refs/heads/main");
        EXPECT_THAT(status(), IsEmpty());
        EXPECT_EQ(branches().getRepositoryState(), "Normal");
    }
    void expectOnlyFastForwardIsAllowed() const
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOfMerge("topic"),
                  textOf(shared_vclink::git::MergePreferenceFastForward()));
    }
};

TEST_F(MergeDispatch, UpToDateDoesNothing)
{
    makeAhead();
    repository_.git({"merge", "--quiet", "topic"});
    expectNothingHappens("topic");
    expectNothingHappens("main");
    expectNothingHappens("HEAD");
    expectNothingHappens("HEAD~1");
}

TEST_F(MergeDispatch, UpToDateDoesNothingWhateverIsPreferred)
{
    makeAhead();
    repository_.git({"merge", "--quiet", "topic"});
    for (const auto *value : {"true", "false", "only"})
    {
        prefer(value);
        expectNothingHappens("topic");
    }
}

TEST_F(MergeDispatch, AheadFastForwardsWithoutAPreference)
{
    makeAhead();
    expectFastForward();
}

TEST_F(MergeDispatch, AheadFastForwardsWhenThatIsPreferred)
{
    makeAhead();
    prefer("true");
    expectFastForward();
}

TEST_F(MergeDispatch, AheadFastForwardsWhenOnlyThatIsAllowed)
{
    makeAhead();
    prefer("only");
    expectFastForward();
}

TEST_F(MergeDispatch, AheadMakesAMergeCommitWhenFastForwardsAreNotWanted)
{
    makeAhead();
    prefer("false");
    expectMergeCommit();
    EXPECT_EQ(message(), "Merge branch 'topic'");
}

TEST_F(MergeDispatch, DivergedMakesAMergeCommitWithoutAPreference)
{
    makeDiverged();
    expectMergeCommit();
}

TEST_F(MergeDispatch, DivergedMakesAMergeCommitWhenFastForwardsArePreferred)
{
    makeDiverged();
    prefer("true");
    expectMergeCommit();
}

TEST_F(MergeDispatch, DivergedMakesAMergeCommitWhenFastForwardsAreNotWanted)
{
    makeDiverged();
    prefer("false");
    expectMergeCommit();
}

TEST_F(MergeDispatch, DivergedIsRefusedWhenOnlyFastForwardsAreAllowed)
{
    makeDiverged();
    prefer("only");
    expectOnlyFastForwardIsAllowed();
}

TEST_F(MergeDispatch, ThePreferenceMayStandInTheUsersFile)
{
    makeDiverged();
    GitRepository(environment().home()).write(".gitconfig", "[merge]\n\tff = only\n");
    expectOnlyFastForwardIsAllowed();
    prefer("true");
    EXPECT_NO_THROW(merge("topic"));
}

/// Yes and on mean true, a word that means nothing counts as none.
TEST_F(MergeDispatch, ThePreferenceMayBeSpeltInOtherWords)
{
    makeAhead();
    prefer("0");
    expectMergeCommit();
    repository_.git({"reset", "--quiet", "--hard", "HEAD~1"});
    prefer("yes");
    EXPECT_NO_THROW(merge("topic"));
    EXPECT_EQ(idOf("main"), idOf("topic"));
}

TEST_F(MergeDispatch, AWordThatMeansNothingIsNoPreference)
{
    makeAhead();
    prefer("banana");
    EXPECT_NO_THROW(merge("topic"));
    EXPECT_EQ(idOf("main"), idOf("topic"));
}

TEST_F(MergeDispatch, AnUnbornBranchIsRefused)
{
    repository_.git({"checkout", "--quiet", "--orphan", "unborn"});
    repository_.git({"rm", "-r", "--quiet", "--force", "."});
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOfMerge("main"), "GIT_MERGE_ANALYSIS_UNBORN");
    }
    prefer("only");
    const NothingChanges nothing(repository_);
    EXPECT_EQ(failureOfMerge("main"), "GIT_MERGE_ANALYSIS_UNBORN");
}

TEST_F(MergeDispatch, ADetachedHeadFastForwards)
{
    makeAhead();
    repository_.git({"checkout", "--quiet", "--detach"});
    const std::string main = idOf("main");
    expectAsGit();
    EXPECT_EQ(idOf("HEAD"), idOf("topic"));
    EXPECT_EQ(idOf("main"), main);
    EXPECT_EQ(currentBranch(), "");
}

TEST_F(MergeDispatch, ADetachedHeadTakesAMergeCommit)
{
    makeDiverged();
    repository_.git({"checkout", "--quiet", "--detach"});
    const std::string main = idOf("main");
    expectAsGit();
    EXPECT_THAT(parents(), ElementsAre(main, idOf("topic")));
    EXPECT_EQ(idOf("main"), main);
    EXPECT_EQ(currentBranch(), "");
}

TEST_F(MergeDispatch, TakesAnyRevisionText)
{
    makeDiverged();
    repository_.git({"tag", "light", "topic"});
    repository_.git({"-c", "user.name=x", "-c", "user.email=x@y", "tag", "-a", "-m", "m",
                     "annotated", "topic"});
    repository_.git({"update-ref", "refs/remotes/origin/topic", "topic"});
    const std::string base = idOf("main");
    for (const std::string &name :
         {std::string("light"), std::string("origin/topic"), std::string("refs/heads/topic"),
          idOf("topic"), idOf("topic").substr(0, 7), std::string("topic^0"),
          std::string("topic^{commit}"), std::string("annotated^{commit}")})
    {
        EXPECT_NO_THROW(merge(name)) << name;
        EXPECT_THAT(parents(), ElementsAre(base, idOf("topic"))) << name;
        repository_.git({"reset", "--quiet", "--hard", base});
    }
}

/// The look-up of the commit does not peel a tag; git does.
TEST_F(MergeDispatch, RefusesAnAnnotatedTagItself)
{
    makeDiverged();
    repository_.git({"-c", "user.name=x", "-c", "user.email=x@y", "tag", "-a", "-m", "m",
                     "annotated", "topic"});
    const NothingChanges nothing(repository_);
    EXPECT_EQ(
        failureOfMerge("annotated"),
        textOf(vclink::test::Failure{GIT_ENOTFOUND, GIT_ERROR_INVALID,
                                     "the requested type does not match the type in the ODB"}));
}

TEST_F(MergeDispatch, TakesALongCommitAndNamesItRight)
{
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    repository_.write("new", "x");
    repository_.commitAll(std::string(9000, 'x'));
    const std::string target = idOf("topic");
    repository_.git({"checkout", "--quiet", "main"});
    EXPECT_NO_THROW(merge("topic"));
    EXPECT_EQ(idOf("main"), target);
}

TEST_F(MergeDispatch, TakesALongCommitIntoAMergeCommit)
{
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    repository_.write("new", "x");
    repository_.commitAll(std::string(9000, 'x'));
    repository_.git({"checkout", "--quiet", "main"});
    repository_.write("ours", "x");
    repository_.commitAll(std::string(9000, 'y'));
    expectMergeCommit();
}

TEST_F(MergeDispatch, RefusesALongTagByItsRightId)
{
    makeDiverged();
    repository_.git({"-c", "user.name=x", "-c", "user.email=x@y", "tag", "-a", "-m",
                     std::string(9000, 'x'), "annotated", "topic"});
    const NothingChanges nothing(repository_);
    EXPECT_EQ(
        failureOfMerge("annotated"),
        textOf(vclink::test::Failure{GIT_ENOTFOUND, GIT_ERROR_INVALID,
                                     "the requested type does not match the type in the ODB"}));
    EXPECT_EQ(branches().getRevision("annotated"), idOf("annotated"));
}

TEST_F(MergeDispatch, RefusesAFileByItsRightId)
{
    makeDiverged();
    const NothingChanges nothing(repository_);
    EXPECT_EQ(
        failureOfMerge("HEAD:file"),
        textOf(vclink::test::Failure{GIT_ENOTFOUND, GIT_ERROR_INVALID,
                                     "the requested type does not match the type in the ODB"}));
}

TEST_F(MergeDispatch, TakesTheTagWhereABranchHasTheSameNameAsGitDoes)
{
    makeDiverged();
    makeBranch("third", [this] { repository_.write("third", "x"); });
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
    repository_.write("theirs", "x");
    repository_.commitAll("theirs");
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
    makeBranch("second", [this] { repository_.write("second", "x"); });
    makeBranch(
        "third", [this] { repository_.write("third", "x"); }, "main~1");
    EXPECT_NO_THROW(merge("topic"));
    EXPECT_NO_THROW(merge("second"));
    EXPECT_NO_THROW(merge("third"));
    for (const auto *name : {"ours", "theirs", "second", "third"})
        EXPECT_TRUE(std::filesystem::exists(repository_ / name)) << name;
    EXPECT_THAT(status(), IsEmpty());
    EXPECT_EQ(repository_.git({"fsck", "--strict", "--no-dangling"}), "");
}

TEST_F(MergeDispatch, LeavesNoDescriptorOpen)
{
    makeDiverged();
    makeBranch("ahead", [this] { repository_.write("new", "x"); });
    merge("main");
    const vclink::test::NoDescriptorLeak noLeak;
    merge("main");
    merge("ahead");
    merge("topic");
    failureOfMerge("missing");
}

} // namespace

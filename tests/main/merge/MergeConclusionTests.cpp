// SPDX-License-Identifier: MIT
#include <string>
#include <utility>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/files/CommitFixture.hpp"

namespace
{

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;
using namespace vclink::test;

const std::string missingMergeHead = "1234567890123456789012345678901234567890";

/// A commit that ends a merge which is under way, and what becomes of the conflicts in it.
class MergeConclusion : public CommitFixture
{
  protected:
    /// Makes a branch off main whose commit adds one file of the same name.
    void makeBranch(const std::string &name)
    {
        repository_.git({"checkout", "--quiet", "-b", name, "main"});
        repository_.write(name, "x");
        repository_.commitAll(name);
        repository_.git({"checkout", "--quiet", "main"});
    }
    /// Begins a merge without conflicts and does not commit it.
    void beginCleanMerge(const std::vector<std::string> &branches)
    {
        for (const auto &branch : branches)
            makeBranch(branch);
        repository_.commitAll(writes("ours", "x"), "ours");
        std::vector<std::string> arguments{"merge", "--quiet", "--no-commit"};
        arguments.insert(arguments.end(), branches.begin(), branches.end());
        repository_.git(arguments);
    }
    void expectNothingUnderWay() const
    {
        auto underWay = stateOf(repository_).underWay;
        underWay.erase("ORIG_HEAD");
        EXPECT_THAT(underWay, IsEmpty());
        EXPECT_EQ(repository_.git({"status"}).find("merging"), std::string::npos);
    }
};

TEST_F(MergeConclusion, HasTheMergeHeadAsItsSecondParent)
{
    beginCleanMerge({"theirs"});
    const std::string head = idOf("HEAD");
    commit();
    EXPECT_THAT(parents(), ElementsAre(head, idOf("theirs")));
    EXPECT_THAT(namesIn(), ElementsAre("file", "other", "ours", "sub/inside", "theirs"));
    expectNothingUnderWay();
    EXPECT_THAT(status(), IsEmpty());
    EXPECT_EQ(repository_.git({"fsck", "--strict", "--no-dangling"}), "");
}

TEST_F(MergeConclusion, OfTwoHeadsHasThreeParentsInTheOrderOfTheMergeHeads)
{
    beginCleanMerge({"one", "two"});
    const std::string head = idOf("HEAD");
    for (const auto &[first, second] : {std::pair("one", "two"), std::pair("two", "one")})
    {
        repository_.write(".git/MERGE_HEAD", idOf(first) + '\n' + idOf(second) + '\n');
        commit();
        EXPECT_THAT(parents(), ElementsAre(head, idOf(first), idOf(second)));
        EXPECT_THAT(namesIn(), ElementsAre("file", "one", "other", "ours", "sub/inside", "two"));
        expectNothingUnderWay();
        repository_.git({"reset", "--quiet", "--soft", head});
    }
}

TEST_F(MergeConclusion, HoldsWhatChangedSinceTheMergeBegan)
{
    beginCleanMerge({"theirs"});
    repository_.write("theirs", "changed\n");
    repository_.remove("other");
    repository_.write("new", "x");
    commit();
    EXPECT_EQ(committed("theirs"), "changed\n");
    EXPECT_THAT(namesIn(), ElementsAre("file", "ours", "sub/inside", "theirs"));
    EXPECT_THAT(status(), ElementsAre("?? new"));
}

TEST_F(MergeConclusion, LeavesTheMessageOfTheMergeBehind)
{
    beginCleanMerge({"theirs"});
    ASSERT_NE(repository_.read(".git/MERGE_MSG").find("Merge"), std::string::npos);
    commit("my own");
    EXPECT_EQ(repository_.line({"log", "-1", "--format=%B"}), "my own");
    EXPECT_EQ(repository_.line({"log", "--walk-reflogs", "-1", "--format=%gs"}),
              "commit (merge): my own");
}

TEST_F(MergeConclusion, OnADetachedHeadWorks)
{
    makeBranch("theirs");
    repository_.git({"checkout", "--quiet", "--detach"});
    repository_.git({"merge", "--quiet", "--no-commit", "--no-ff", "theirs"});
    const std::string head = idOf("HEAD");
    commit();
    EXPECT_THAT(parents(), ElementsAre(head, idOf("theirs")));
    EXPECT_EQ(idOf("main"), head);
    expectNothingUnderWay();
}

TEST_F(MergeConclusion, InALinkedWorktreeEndsThatOnesMerge)
{
    makeBranch("theirs");
    const std::string linked = folder() / "linked";
    repository_.git({"worktree", "add", "--quiet", "-b", "second", linked});
    const GitRepository worktree(linked);
    worktree.git({"merge", "--quiet", "--no-commit", "--no-ff", "theirs"});
    commitIn(worktree);
    EXPECT_EQ(idOf("second^2"), idOf("theirs"));
    EXPECT_THAT(stateOf(worktree).underWay, Not(Contains(testing::Key("MERGE_HEAD"))));
}

TEST_F(MergeConclusion, TakesFilesInConflictAsTheyStand)
{
    beginMerge({"file", "sub/inside"});
    const std::string head = idOf("HEAD");
    repository_.write("file", "merged\n");
    const std::string standing = repository_.read("sub/inside");
    ASSERT_NE(standing.find(">>>>>>> theirs"), std::string::npos);
    commit();
    EXPECT_EQ(committed("file"), "merged\n");
    EXPECT_EQ(committed("sub/inside"), standing);
    EXPECT_EQ(repository_.read("sub/inside"), standing);
    EXPECT_THAT(parents(), ElementsAre(head, idOf("theirs")));
    EXPECT_EQ(repository_.git({"ls-files", "--unmerged"}), "");
    EXPECT_THAT(status(), IsEmpty());
    expectNothingUnderWay();
}

/// libgit2 takes it as deleted, all stages of it.
TEST_F(MergeConclusion, DropsAConflictWhereNoFileOrAFolderStands)
{
    beginMerge({"file", "other"});
    repository_.remove("file");
    repository_.remove("other");
    repository_.write("other/new", "x");
    commit();
    EXPECT_THAT(namesIn(), ElementsAre("sub/inside"));
    EXPECT_EQ(repository_.git({"ls-files"}), "sub/inside\n");
    EXPECT_THAT(status(), ElementsAre("?? other/new"));
    expectNothingUnderWay();
}

TEST_F(MergeConclusion, TakesTheirFileThatWeDeletedWhereItStands)
{
    repository_.git({"branch", "theirs"});
    repository_.commitAll(removes("file"), "ours");
    repository_.git({"checkout", "--quiet", "theirs"});
    repository_.commitAll(writes("file", "theirs\n"), "theirs");
    repository_.git({"checkout", "--quiet", "main"});
    EXPECT_FALSE(repository_.tryGit({"merge", "--quiet", "theirs"}).succeeded());
    ASSERT_EQ(split(repository_.git({"ls-files", "--unmerged"})).size(), 2U);
    commit();
    EXPECT_EQ(committed("file"), "theirs\n");
    expectNothingUnderWay();
}

TEST_F(MergeConclusion, DropsAConflictOfOneStageWhereNoFileStands)
{
    const std::string id = idOf("HEAD:file");
    for (const std::string stage : {"1", "2", "3"})
    {
        repository_.git({"reset", "--quiet", "--hard", "main"});
        const std::string nothing = "0 0000000000000000000000000000000000000000\tfile\n";
        repository_.command({"update-index", "--index-info"})
            .input(nothing + "100644 " + id + ' ' + stage + "\tfile\n")
            .run();
        ASSERT_EQ(repository_.git({"ls-files", "--unmerged"}),
                  "100644 " + id + ' ' + stage + "\tfile\n");
        repository_.remove("file");
        commit();
        EXPECT_THAT(namesIn(), ElementsAre("other", "sub/inside")) << stage;
        repository_.git({"reset", "--quiet", "--hard", "HEAD^"});
    }
}

TEST_F(MergeConclusion, FailsWithAMergeHeadThatIsNone)
{
    beginMerge({"file"});
    const std::string theirs = idOf("theirs");
    const Failure garbage{GIT_ERROR, GIT_ERROR_INVALID, "unable to parse OID - invalid length"};
    const Failure missing{GIT_ENOTFOUND, GIT_ERROR_ODB,
                          "object not found - no match for id (" + missingMergeHead + ")"};
    const Failure cutShort{GIT_ERROR, GIT_ERROR_MERGE, "no EOL at line 1"};
    const Failure noCommit{GIT_ENOTFOUND, GIT_ERROR_INVALID,
                           "the requested type does not match the type in the ODB"};
    const std::vector<std::pair<std::string, Failure>> heads{
        {"garbage\n", garbage},
        {theirs + "\ngarbage\n", garbage},
        {theirs, cutShort},
        {missingMergeHead + '\n', missing},
        {theirs + '\n' + missingMergeHead + '\n', missing},
        {idOf("HEAD:other") + '\n', noCommit}};
    for (const auto &[content, failure] : heads)
    {
        SCOPED_TRACE(content);
        repository_.write(".git/MERGE_HEAD", content);
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOf([this] { commit(); }), failure);
    }
}

/// libgit2 reads up to the first NUL, and reports no error.
TEST_F(MergeConclusion, FailsWithAMergeHeadThatIsFilledWithNuls)
{
    beginMerge({"file"});
    const std::string theirs = idOf("theirs") + '\n';
    const std::string nuls(theirs.size(), '\0');
    std::string manyLines;
    for (int line = 0; line < 200; ++line)
        manyLines += theirs;
    const Failure damaged{GIT_ERROR, GIT_ERROR_MERGE,
                          "MERGE_HEAD is damaged, and the commit would lack the history of the "
                          "other side: write the id of the merged commit into '" +
                              (repository_ / ".git/MERGE_HEAD").string() +
                              "', or abort the merge with 'git merge --abort'"};
    for (const std::string &content : {nuls, theirs + nuls, manyLines + nuls, nuls + theirs})
    {
        SCOPED_TRACE(content.size());
        repository_.write(".git/MERGE_HEAD", content);
        EXPECT_FALSE(repository_.tryGit({"commit", "--quiet", "--all", "--no-edit"}).succeeded());
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOf([this] { commit(); }), damaged);
    }
    repository_.write(".git/MERGE_HEAD", theirs);
    commit();
    EXPECT_EQ(parents().size(), 2U);
}

TEST_F(MergeConclusion, FailsWithAMergeHeadThatCannotBeRead)
{
    beginMerge({"file"});
    giveAway();
    const std::string file = repository_ / ".git/MERGE_HEAD";
    const auto before = stateOf(repository_);
    const auto index = indexStampOf(repository_);
    repository_.setMode(".git/MERGE_HEAD", 0000);
    EXPECT_EQ(commitAsItsOwner(),
              "-14 2 failed open - '" + file + "' is locked: Permission denied");
    repository_.setMode(".git/MERGE_HEAD", 0644);
    EXPECT_EQ(stateOf(repository_), before);
    EXPECT_EQ(indexStampOf(repository_), index);
}

TEST_F(MergeConclusion, TakesNoParentFromAnEmptyMergeHead)
{
    beginMerge({"file"});
    const std::string head = idOf("HEAD");
    repository_.write(".git/MERGE_HEAD", "");
    commit();
    EXPECT_THAT(parents(), ElementsAre(head));
    expectNothingUnderWay();
}

TEST_F(MergeConclusion, TakesAMergeHeadAsOftenAsItIsListed)
{
    beginMerge({"file"});
    const std::string head = idOf("HEAD");
    const std::string theirs = idOf("theirs");
    repository_.write(".git/MERGE_HEAD", theirs + '\n' + theirs + '\n');
    commit();
    EXPECT_THAT(split(repository_.git({"log", "-1", "--format=%P"})),
                ElementsAre(head + ' ' + theirs + ' ' + theirs));
}

TEST_F(MergeConclusion, WithoutACommitAtHeadHasTheMergeHeadAsItsOnlyParent)
{
    const std::string main = idOf("main");
    repository_.git({"checkout", "--quiet", "--orphan", "second"});
    repository_.write(".git/MERGE_HEAD", main + '\n');
    commit();
    EXPECT_THAT(parents(), ElementsAre(main));
    expectNothingUnderWay();
}

} // namespace

// SPDX-License-Identifier: MIT
#include "support/RepositoryState.hpp"

#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "support/Change.hpp"
#include "support/GitFixture.hpp"

namespace
{

using namespace vclink::test;

class RepositoryStateTest : public GitFixture
{
  protected:
    RepositoryStateTest()
    {
        repository_.write("file", "content\n");
        repository_.write("sub/other", "content\n");
        repository_.write("long", std::string(10'000, 'x'));
        repository_.commitAll("first");
    }

    std::string id(const std::string &name) const
    {
        return repository_.line({"hash-object", name});
    }

    GitRepository repository_ = makeRepository();
};

/// That a comparison of two of them can fail, whatever changes.
TEST_F(RepositoryStateTest, TellsEachChange)
{
    const std::string stages = "0 " + std::string(40, '0') + "\tfile\n100644 " + id("file") +
                               " 2\tfile\n100644 " + id("file") + " 3\tfile\n";
    const std::vector<Change> changes{
        writes("file", "CONTENT\n"),
        writes("long", std::string(9'999, 'x') + 'y'),
        makesExecutable("file"),
        links("file", "link"),
        [](const GitRepository &copy) { copy.makeFolder("empty"); },
        runsGit({"update-index", "--skip-worktree", "file"}),
        runsGit({"update-index", "--assume-unchanged", "file"}),
        [&](const GitRepository &copy) {
            copy.command({"update-index", "--index-info"}).input(stages).run();
        },
        runsGit({"rm", "--quiet", "--cached", "file"}),
        runsGit({"branch", "other"}),
        runsGit({"symbolic-ref", "HEAD", "refs/heads/other"}),
        runsGit({"checkout", "--quiet", "--detach"}),
        writes(".git/MERGE_HEAD", "x\n"),
        writes(".git/index.lock", "")};
    for (const auto &change : changes)
    {
        const RepositoryState before = stateOf(repository_);
        EXPECT_EQ(stateOf(repository_), before);
        change(repository_);
        EXPECT_NE(stateOf(repository_), before) << &change - changes.data();
    }
    const RepositoryState state = stateOf(repository_);
    EXPECT_EQ(state.workingTree.at("file"), "755 CONTENT\n");
    EXPECT_EQ(state.workingTree.at("link"), "link to file");
    EXPECT_EQ(state.workingTree.at("empty"), "755 folder");
    EXPECT_EQ(state.index.count("file"), 0U);
    EXPECT_EQ(state.underWay.at("MERGE_HEAD"), "x\n");
    EXPECT_EQ(state.head, repository_.git({"rev-parse", "HEAD"}));
}

TEST_F(RepositoryStateTest, TellsFlagsAndStagesOfAnIndexEntry)
{
    repository_.git({"update-index", "--skip-worktree", "file"});
    EXPECT_EQ(stateOf(repository_).index.at("file"), "S 100644 " + id("file") + " 0");
    repository_.git({"update-index", "--assume-unchanged", "file"});
    EXPECT_EQ(stateOf(repository_).index.at("file"), "s 100644 " + id("file") + " 0");
    repository_.command({"update-index", "--index-info"})
        .input("0 " + std::string(40, '0') + "\tfile\n100644 " + id("file") + " 2\tfile\n100644 " +
               id("file") + " 3\tfile\n")
        .run();
    EXPECT_EQ(stateOf(repository_).index.at("file"),
              "M 100644 " + id("file") + " 2\nM 100644 " + id("file") + " 3");
}

TEST_F(RepositoryStateTest, OfARepositoryWithoutACommitCanBeTaken)
{
    const auto empty = makeRepository("empty");
    EXPECT_EQ(stateOf(empty).head, "refs/heads/main\n");
    EXPECT_TRUE(stateOf(empty).index.empty());
}

TEST_F(RepositoryStateTest, LeavesTheIndexFileAlone)
{
    const auto before = indexStampOf(repository_);
    stateOf(repository_);
    EXPECT_EQ(indexStampOf(repository_), before);
}

TEST_F(RepositoryStateTest, HasAStampForAFileWrittenWithTheSameBytes)
{
    const auto before = indexStampOf(repository_);
    repository_.git({"update-index", "--force-write-index"});
    EXPECT_EQ(indexStampOf(repository_).bytes, before.bytes);
    EXPECT_NE(indexStampOf(repository_), before);
    EXPECT_EQ(stampOf(repository_ / "missing"), FileStamp());
    EXPECT_NE(stampOf(repository_ / "file"), stampOf(repository_ / "sub/other"));
}

} // namespace

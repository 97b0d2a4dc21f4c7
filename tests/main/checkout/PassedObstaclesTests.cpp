// SPDX-License-Identifier: MIT
// Obstacles of a merge that libgit2 does not report because its walk has passed them, or because it
// treats them as its own.
#include <filesystem>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::IsEmpty;
using namespace vclink::test;

class PassedObstacles : public ObstacleFixture
{
  protected:
    /// "n-b" sorts between "n" and "n/".
    void theyWriteBesideANeighbour(const std::vector<std::string> &names)
    {
        repository_.commitAll(writes("n-b", "x"), "neighbour");
        theyWrite(names);
    }
};

TEST_F(PassedObstacles, AreNotIgnoredLinksWhichAreReplacedAsGitDoes)
{
    theyWriteBesideANeighbour({"n-b", "n/new"});
    ignore("n");
    repository_.symlink("../outside", "n");
    expectCleanAsGit();
    expectNothingOutsideChanged();
}

TEST_F(PassedObstacles, AreFoldersWithIgnoredFilesWhereAFileComes)
{
    theyWriteBesideANeighbour({"n", "n-b"});
    ignore("mine");
    repository_.write("n/mine", "mine\n");
    expectMergeRefused(inTheWay("folder 'n'"));
    repository_.remove("n");
    expectCleanAsGit();
}

TEST_F(PassedObstacles, AreIgnoredFoldersWhereAFileComes)
{
    theyWriteBesideANeighbour({"n", "n-b"});
    ignore("n");
    repository_.write("n/mine", "mine\n");
    expectMergeRefused(inTheWay("folder 'n'"));
}

TEST_F(PassedObstacles, AreNotEmptyFoldersInThePlaceOfAFileThatComesBack)
{
    repository_.write("n", "x");
    theyWriteBesideANeighbour({"n-b"});
    repository_.remove("n");
    repository_.makeFolder("n");
    merge("topic");
    EXPECT_EQ(repository_.read("n"), "x");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(PassedObstacles, AreNotTrackedFoldersThatBecomeAFile)
{
    repository_.commitAll(writes("d-b", "x"), "neighbour");
    const Change change = removes("d") + writesEach({"d", "d-b"}, "theirs\n");
    makeBranch("ahead", change);
    diverge(writes("ours", "x"), change);
    ignore("mine");
    repository_.write("d/mine", "mine\n");
    expectMergeRefused(inChangedFolder("file 'd/mine'"));
    repository_.remove("d/mine");
    expectCleanAsGit();
    EXPECT_EQ(repository_.read("d"), "theirs\n");
    repository_.git({"reset", "--quiet", "--hard", "ahead~1"});
    branches().switchBranch("ahead");
    EXPECT_EQ(repository_.read("d"), "theirs\n");
    EXPECT_THAT(status(), IsEmpty());
}

/// There is no merge base to tell that the submodule comes, and libgit2 would take the link for its
/// folder.
TEST_F(PassedObstacles, AreLinksWhereAnUnrelatedHistoryHasASubmodule)
{
    const std::string id = idOf("main");
    repository_.git({"checkout", "--quiet", "--orphan", "topic"});
    repository_.git({"rm", "-r", "--quiet", "--force", "."});
    repository_.git({"update-index", "--add", "--cacheinfo", "160000," + id + ",n/module"});
    repository_.commit("unrelated");
    repository_.git({"checkout", "--quiet", "--force", "main"});
    repository_.symlink("../../outside", "n/module");
    expectMergeRefused(inTheWay("symbolic link 'n/module'"));
    repository_.remove("n");
    merge("topic");
    EXPECT_EQ(idOf("HEAD:n/module"), id);
}

/// A conflict is written there, and libgit2 reports none.
TEST_F(PassedObstacles, AreIgnoredFifosWhereWeDeletedAFileThatTheyChanged)
{
    diverge(removes("d/f"), writes("d/f", "theirs\n"));
    ignore("f");
    makeFifo(repository_ / "d/f");
    expectMergeRefused(inTheWay("FIFO, socket or device 'd/f'"));
    EXPECT_TRUE(fs::is_fifo(repository_ / "d/f"));
}

TEST_F(PassedObstacles, AreNotStagedFilesThatAreWhatTheyHave)
{
    diverge(writes("ours", "x"), writes("d/new", "theirs\n"));
    repository_.write("d/new", "theirs\n");
    repository_.add({"d/new"});
    merge("topic");
    EXPECT_THAT(parents(), testing::SizeIs(2));
    EXPECT_THAT(status(), IsEmpty());
}

} // namespace

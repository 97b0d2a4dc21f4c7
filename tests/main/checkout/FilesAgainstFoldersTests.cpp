// SPDX-License-Identifier: MIT
#include "main/checkout/FilesAgainstFolders.hpp"

#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"

namespace
{

using testing::ElementsAre;
using namespace vclink::test;

/// One side has a file where the other has a folder. "old" and "second" can be renamed.
class RenamesToFolders : public ObstacleFixture
{
  protected:
    RenamesToFolders()
    {
        repository_.commitAll(writes("old", "1\n2\n3\n4\n5\n6\n7\n8\n") +
                                  writes("second", "a\nb\nc\nd\ne\nf\ng\nh\n"),
                              "files to rename");
    }

    /// Replaces the folder "d" by "old".
    const Change replacesFolder_ = removes("d") + moves("old", "d");

    void expectNameRefused(const std::string &name) const
    {
        expectMergeRefused(refusal("'" + name +
                                   "' is a renamed file of one side and a folder of "
                                   "the other: merge with 'git merge'"));
    }
    void expectInsideRefused(const std::string &name = "file/inside") const
    {
        expectMergeRefused(refusal("'" + name +
                                   "' is a renamed file of one side, in a folder that is a file of "
                                   "the other: merge with 'git merge'"));
    }
};

TEST_F(RenamesToFolders, RefuseTheMergeIfTheyAreTheirs)
{
    diverge(writes("new/inside", "ours\n"), moves("old", "new"));
    expectNameRefused("new");
    // The files that are missing would be restored.
    repository_.remove("new");
    expectNameRefused("new");
}

TEST_F(RenamesToFolders, RefuseTheMergeIfTheyAreOurs)
{
    diverge(moves("old", "new"), writes("new/deep/inside", "theirs\n"));
    expectNameRefused("new");
}

TEST_F(RenamesToFolders, RefuseTheMergeIfTheirFolderIsAFileThatWeChanged)
{
    diverge(writes("file", "ours\n"),
            removes("file") + makesFolder("file") + moves("old", "file/inside"));
    expectInsideRefused();
}

TEST_F(RenamesToFolders, RefuseTheMergeIfOurFolderIsAFileThatTheyChanged)
{
    diverge(removes("file") + makesFolder("file") + moves("old", "file/inside"),
            writes("file", "theirs\n"));
    expectInsideRefused();
}

/// libgit2 would delete the folder's files, and then fail.
TEST_F(RenamesToFolders, RefuseTheMergeIfTheyReplacedTheFolderByAFile)
{
    diverge(moves("old", "d/inside"), removes("d") + writes("d", "theirs\n"));
    expectInsideRefused("d/inside");
}

/// libgit2 would leave both files out of the merge.
TEST_F(RenamesToFolders, RefuseTheMergeIfWeReplacedTheFolderByAFile)
{
    diverge(removes("d") + writes("d", "ours\n"), moves("old", "d/inside"));
    expectInsideRefused("d/inside");
}

/// libgit2 would leave both files out of the merge.
TEST_F(RenamesToFolders, RefuseTheMergeIfTheFolderIsOfARenameToo)
{
    diverge(moves("old", "new"), makesFolder("new") + moves("second", "new/inside"));
    expectNameRefused("new");
}

TEST_F(RenamesToFolders, RefuseTheMergeIfTheFolderHasOurChange)
{
    diverge(writes("d/f", "ours\n"), replacesFolder_);
    expectNameRefused("d");
}

TEST_F(RenamesToFolders, RefuseTheMergeIfTheFolderHasTheirChange)
{
    diverge(replacesFolder_, writes("d/f", "theirs\n"));
    expectNameRefused("d");
}

TEST_F(RenamesToFolders, RefuseTheMergeIfTheFileHasAlsoChanged)
{
    diverge(removes("old") + writes("new", "1\n2\n3\n4\n5\n6\n7\n8\nours\n"),
            writes("new/inside", "theirs\n"));
    expectNameRefused("new");
}

TEST_F(RenamesToFolders, LeaveANewFileInConflict)
{
    diverge(writes("new/inside", "ours\n"), removes("old") + writes("new", "something else\n"));
    expectConflicts("topic");
    EXPECT_THAT(conflicts(), ElementsAre("3 new"));
    EXPECT_EQ(repository_.read("new/inside"), "ours\n");
}

TEST_F(RenamesToFolders, AreMergedIfTheOtherSideLeftTheFolderAlone)
{
    diverge(writes("other", "ours\n"), replacesFolder_);
    expectCleanAsGit();
}

TEST_F(RenamesToFolders, AreMergedIfTheyAreOursAndTheOtherSideLeftTheFolderAlone)
{
    diverge(replacesFolder_, writes("other", "theirs\n"));
    expectCleanAsGit();
}

/// A folder that one side replaced by a file, and of which the other side changed something.
/// libgit2 sees that only if it is the first file of the folder.
class ChangedFolders : public ObstacleFixture
{
  protected:
    const Change replaces_ = removes("d") + writes("d", "a file\n");
    const Failure refused_ = refusal("'d' is a file of one side and a changed folder of the other: "
                                     "merge with 'git merge'");
};

TEST_F(ChangedFolders, AreRefusedIfWeReplacedThem)
{
    diverge(replaces_, writes("d/g", "theirs\n"));
    expectMergeRefused(refused_);
}

TEST_F(ChangedFolders, AreRefusedIfTheyReplacedThem)
{
    diverge(writes("d/g", "ours\n"), replaces_);
    expectMergeRefused(refused_);
}

TEST_F(ChangedFolders, AreRefusedIfTheirFirstFileIsDeletedToo)
{
    diverge(replaces_, removes("d/f") + writes("d/g", "theirs\n"));
    expectMergeRefused(refused_);
}

TEST_F(ChangedFolders, AreMergedIfFilesWereOnlyDeleted)
{
    diverge(replaces_, removes("d/g"));
    expectCleanAsGit();
}

TEST_F(ChangedFolders, AreInConflictIfTheirFirstFileIsChanged)
{
    diverge(replaces_, writes("d/f", "theirs\n"));
    expectConflicts("topic");
}

/// A name that sorts between that of a file and what is in a folder of the same name. libgit2 would
/// not see the conflict, and leave both out of the merge, or fail halfway.
class FilesBesideSiblings : public RenamesToFolders, public testing::WithParamInterface<std::string>
{
  protected:
    void expectBesideRefused(const std::string &name) const
    {
        expectMergeRefused(refusal(
            "'" + name + "' is a file of one side and a folder of the other, beside '" + name +
            GetParam().substr(0, GetParam().find('/')) + "': merge with 'git merge'"));
    }
    void addSibling(const std::string &name)
    {
        repository_.commitAll(writes(name + GetParam(), "x"), "a sibling");
    }
};

TEST_P(FilesBesideSiblings, AreRefusedIfBothAreNew)
{
    addSibling("new");
    diverge(writes("new", "ours\n"), writes("new/inside", "theirs\n"));
    expectBesideRefused("new");
}

TEST_P(FilesBesideSiblings, AreRefusedInAFolder)
{
    addSibling("d/new");
    diverge(writes("d/new/inside", "ours\n"), writes("d/new", "theirs\n"));
    expectBesideRefused("d/new");
}

TEST_P(FilesBesideSiblings, AreRefusedIfTheSiblingIsNewToo)
{
    diverge(writes("new", "ours\n") + writes("new" + GetParam(), "x"),
            writes("new/inside", "theirs\n"));
    expectBesideRefused("new");
}

TEST_P(FilesBesideSiblings, AreRefusedIfTheyChangedTheFile)
{
    addSibling("file");
    diverge(removes("file") + writes("file/inside", "ours\n"), writes("file", "theirs\n"));
    expectBesideRefused("file");
}

TEST_P(FilesBesideSiblings, AreRefusedIfWeChangedTheFile)
{
    addSibling("file");
    diverge(writes("file", "ours\n"), removes("file") + writes("file/inside", "theirs\n"));
    expectBesideRefused("file");
}

TEST_P(FilesBesideSiblings, AreMergedIfOnlyOneSideHasChangedThem)
{
    addSibling("file");
    addSibling("d");
    diverge(writes("other", "ours\n"),
            removes("file") + writes("file/inside", "x") + removes("d") + writes("d", "y"));
    expectCleanAsGit();
}

INSTANTIATE_TEST_SUITE_P(Beside, FilesBesideSiblings,
                         testing::Values("-1", ".txt", "-folder/inside"),
                         [](const auto &sibling) { return std::to_string(sibling.index); });

} // namespace

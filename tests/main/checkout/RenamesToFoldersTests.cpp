// SPDX-License-Identifier: MIT
#include "main/checkout/RenamesToFolders.hpp"

#include <functional>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"

namespace
{

using testing::ElementsAre;
using Action = std::function<void()>;

/// One side has a file where the other has a folder. "old" and "second" can be renamed.
class RenamesToFolders : public vclink::test::ObstacleFixture
{
  protected:
    RenamesToFolders()
    {
        repository_.write("old", "1\n2\n3\n4\n5\n6\n7\n8\n");
        repository_.write("second", "a\nb\nc\nd\ne\nf\ng\nh\n");
        repository_.commitAll("files to rename");
    }

    /// Replaces the folder "d" by "old".
    Action replacingFolder() const
    {
        return [this]
        {
            repository_.remove("d");
            moving("old", "d")();
        };
    }
    void expectRefused(const std::string &name) const
    {
        expectMergeRefused(refusal("'" + name +
                                   "' is a renamed file of one side and a folder of "
                                   "the other: merge with 'git merge'"));
    }
};

TEST_F(RenamesToFolders, RefuseTheMergeIfTheyAreTheirs)
{
    diverge(writing("new/inside", "ours\n"), moving("old", "new"));
    expectRefused("new");
    // The files that are missing would be restored.
    repository_.remove("new");
    expectRefused("new");
}

TEST_F(RenamesToFolders, RefuseTheMergeIfTheyAreOurs)
{
    diverge(moving("old", "new"), writing("new/deep/inside", "theirs\n"));
    expectRefused("new");
}

/// libgit2 would leave both files out of the merge.
TEST_F(RenamesToFolders, RefuseTheMergeIfTheFolderIsOfARenameToo)
{
    diverge(moving("old", "new"),
            [this]
            {
                repository_.makeFolder("new");
                moving("second", "new/inside")();
            });
    expectRefused("new");
}

TEST_F(RenamesToFolders, RefuseTheMergeIfTheFolderHasOurChange)
{
    diverge(writing("d/f", "ours\n"), replacingFolder());
    expectRefused("d");
}

TEST_F(RenamesToFolders, RefuseTheMergeIfTheFolderHasTheirChange)
{
    diverge(replacingFolder(), writing("d/f", "theirs\n"));
    expectRefused("d");
}

TEST_F(RenamesToFolders, RefuseTheMergeIfTheFileHasAlsoChanged)
{
    diverge(
        [this]
        {
            repository_.remove("old");
            repository_.write("new", "1\n2\n3\n4\n5\n6\n7\n8\nours\n");
        },
        writing("new/inside", "theirs\n"));
    expectRefused("new");
}

TEST_F(RenamesToFolders, LeaveANewFileInConflict)
{
    diverge(writing("new/inside", "ours\n"),
            [this]
            {
                repository_.remove("old");
                repository_.write("new", "something else\n");
            });
    expectConflicts("topic");
    EXPECT_THAT(conflicts(), ElementsAre("3 new"));
    EXPECT_EQ(repository_.read("new/inside"), "ours\n");
}

TEST_F(RenamesToFolders, AreMergedIfTheOtherSideLeftTheFolderAlone)
{
    diverge(writing("other", "ours\n"), replacingFolder());
    expectCleanAsGit();
}

TEST_F(RenamesToFolders, AreMergedIfTheyAreOursAndTheOtherSideLeftTheFolderAlone)
{
    diverge(replacingFolder(), writing("other", "theirs\n"));
    expectCleanAsGit();
}

} // namespace

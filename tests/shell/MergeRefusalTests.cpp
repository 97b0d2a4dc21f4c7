// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellMergeTest.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;
using testing::StartsWith;

/// A merge puts back missing files without a word, and the back end names the first changed one
/// only.
class ShellMergeOverChanges : public ShellMergeTest
{
  protected:
    static std::string refusal(const std::string &names)
    {
        return "Nothing was merged. These files are changed, and a merge could put them back as "
               "they are in\nthe last commit, or be refused:\n" +
               names +
               "Commit the changes first, or throw them away with \"vclink-shell revert\". With "
               "--force the merge\nis tried beside them.\n";
    }
};

TEST_F(ShellMergeOverChanges, IsRefusedAndNamesThem)
{
    diverge();
    repository_.write("folder/c", "edited\n");
    repository_.remove("folder/deep/d");
    repository_.write("untracked", "");
    EXPECT_EQ(refuse({"merge", "other"}), refusal("  folder/c\n  folder/deep/d\n"));
}

TEST_F(ShellMergeOverChanges, IsRefusedWhereALinkHasTakenAFilesPlace)
{
    diverge();
    repository_.remove("folder/c");
    repository_.symlink("../a", "folder/c");
    EXPECT_EQ(refuse({"merge", "other"}), refusal("  folder/c\n"));
}

TEST_F(ShellMergeOverChanges, IsRefusedForAFastForwardToo)
{
    makeBranch("other", {{"a", "theirs\n"}});
    repository_.write("b", "edited\n");
    EXPECT_EQ(refuse({"merge", "other"}), refusal("  b\n"));
}

TEST_F(ShellMergeOverChanges, NamesThemWhateverTheirNames)
{
    commitFiles({{"new\nline", "begin\n"}, {"quo\"te", "begin\n"}});
    diverge();
    repository_.write("new\nline", "edited\n");
    repository_.write("quo\"te", "edited\n");
    EXPECT_EQ(refuse({"merge", "other"}), refusal("  \"new\\nline\"\n  \"quo\\\"te\"\n"));
}

TEST_F(ShellMergeOverChanges, GoesOnWhereNothingIsLost)
{
    diverge();
    repository_.write("untracked", "untracked\n");
    EXPECT_THAT(run({"merge", "other"}).output, StartsWith("Merge commit "));
    EXPECT_EQ(repository_.read("untracked"), "untracked\n");
}

TEST_F(ShellMergeOverChanges, BringsMissingFilesBackByForceButLosesNoChange)
{
    diverge();
    repository_.write("folder/c", "edited\n");
    repository_.remove("folder/deep/d");
    EXPECT_THAT(fail({"merge", "--force", "other"}),
                HasSubstr("the uncommitted changes of 'folder/c' would be lost in the merge"));
    EXPECT_EQ(repository_.read("folder/c"), "edited\n");
    repository_.git({"checkout", "folder/c"});
    EXPECT_THAT(run({"merge", "--force", "other"}).output, StartsWith("Merge commit "));
    EXPECT_EQ(repository_.read("folder/deep/d"), "folder/deep/d\n");
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
}

TEST_F(ShellMergeOverChanges, FastForwardsByForceAndKeepsWhatTheBranchDoesNotTouch)
{
    makeBranch("other", {{"a", "theirs\n"}});
    repository_.write("b", "edited\n");
    EXPECT_THAT(run({"merge", "--force", "other"}).output, StartsWith("Fast-forward to "));
    EXPECT_EQ(repository_.read("b"), "edited\n");
    EXPECT_EQ(repository_.read("a"), "theirs\n");
}

TEST_F(ShellMergeOverChanges, FailsOverStagedChangesAndChangesOfTheSameFilesAlsoByForce)
{
    diverge();
    repository_.write("folder/c", "edited\n");
    repository_.add({"folder/c"});
    EXPECT_EQ(refuse({"merge", "other"}), refusal("  folder/c\n"));
    EXPECT_THAT(fail({"merge", "--force", "other"}), HasSubstr("(code -13, "));
    EXPECT_EQ(letters().at("folder/c"), "M ");
    repository_.git({"reset", "--quiet", "--hard"});
    repository_.write("a", "edited\n");
    EXPECT_THAT(fail({"merge", "--force", "other"}), HasSubstr("(code -13, "));
    EXPECT_EQ(repository_.read("a"), "edited\n");
    EXPECT_EQ(state(), "Normal\n");
}

TEST_F(ShellMergeOverChanges, IsNotRefusedWhenThereIsNothingToDo)
{
    repository_.git({"branch", "old"});
    diverge();
    EXPECT_EQ(run({"merge", "other"}).exitStatus, 0);
    repository_.write("folder/c", "edited\n");
    repository_.remove("b");
    for (const std::string name : {"other", "old", "main", "HEAD", "main~1"})
        EXPECT_EQ(run({"merge", name}).output, "Already up to date.\n") << name;
    EXPECT_EQ(repository_.read("folder/c"), "edited\n");
}

TEST_F(ShellMergeOverChanges, FailsInTheWordsOfTheBackEndWhereItCannotBegin)
{
    repository_.write("a", "edited\n");
    EXPECT_THAT(refuse({"merge", "nothing"}), StartsWith("\"nothing\" could not be merged"));
    repository_.git({"checkout", "--quiet", "a"});
    clash();
    fail({"merge", "other"});
    repository_.write("folder/c", "edited\n");
    EXPECT_THAT(refuse({"merge", "other"}), HasSubstr("A merge cannot begin while"));
}

} // namespace
} // namespace vclink::test

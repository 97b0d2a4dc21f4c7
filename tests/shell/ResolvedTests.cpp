// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"

namespace vclink::test
{
namespace
{

class ShellResolved : public ChangeFixture
{
};

TEST_F(ShellResolved, StagesAFileInConflictAsItStands)
{
    makeConflict();
    repository_.write("a", "solution\n");
    succeed({"resolved", "a"});
    EXPECT_EQ(letters().at("a"), "M ");
    EXPECT_EQ(repository_.git({"show", ":a"}), "solution\n");
}

TEST_F(ShellResolved, RemovesAFileThatIsGone)
{
    makeConflict();
    repository_.remove("a");
    succeed({"resolved", "a"});
    EXPECT_EQ(letters().at("a"), "D ");
}

TEST_F(ShellResolved, MarksOnlyTheFilesInConflictBelowAFolder)
{
    makeConflict();
    repository_.write("folder/c", "edited\n");
    repository_.write("new", "");
    succeed({"resolved", "."});
    EXPECT_EQ(letters().at("a"), "M ");
    EXPECT_EQ(letters().at("folder/c"), " M");
    EXPECT_EQ(letters().at("new"), "??");
}

/// The other branch has a file "dir", the current one has a folder of that name.
class ShellResolvedFolder : public ShellMergeFixture
{
  protected:
    ShellResolvedFolder()
    {
        makeBranch("other", {{"dir", "theirs\n"}});
        commitFiles({{"dir/ours", "ours\n"}});
        fail({"merge", "other"});
        // The file of the other branch, under another name.
        repository_.git({"clean", "--quiet", "--force"});
        repository_.write("dir/ours", "edited\n");
    }
};

TEST_F(ShellResolvedFolder, AddsNoFileThatNobodyNamed)
{
    repository_.write("dir/notes", "");
    const std::string refusal =
        "Nothing was marked as resolved: a folder is in the place of dir, and these files in it "
        "are not tracked:\n  dir/notes\nAdd them first if they belong to the solution. Otherwise "
        "run this, which leaves the folder as it is:\ngit update-index --force-remove dir\n";
    EXPECT_EQ(refuse({"resolved", "dir"}), refusal);
    EXPECT_EQ(refuse({"resolved", "."}), refusal);
    repository_.git({"update-index", "--force-remove", "dir"});
    succeed({"commit", "-m", "Merged"});
    EXPECT_EQ(repository_.git({"ls-tree", "-r", "--name-only", "HEAD", "dir"}), "dir/ours\n");
    EXPECT_EQ(repository_.git({"show", "HEAD:dir/ours"}), "edited\n");
    EXPECT_EQ(letters().at("dir/notes"), "??");
}

TEST_F(ShellResolvedFolder, HasTheFilesThatWereAddedFirst)
{
    repository_.write("dir/notes", "");
    repository_.write("dir/x.ignored", "");
    succeed({"add", "dir/notes"});
    succeed({"resolved", "dir"});
    EXPECT_EQ(repository_.git({"ls-files", "dir"}), "dir/notes\ndir/ours\n");
    EXPECT_EQ(letters().at("dir/ours"), "M ");
}

TEST_F(ShellResolved, StagesAFileThatIsInNoConflictToo)
{
    repository_.write("b", "edited\n");
    repository_.write("new", "");
    succeed({"resolved", "b"});
    succeed({"resolved", "new"});
    EXPECT_EQ(letters().at("b"), "M ");
    EXPECT_EQ(letters().at("new"), "A ");
}

TEST_F(ShellResolved, RefusesWhatItCannotServe)
{
    const std::string refusal = "Nothing was marked as resolved:\n  ";
    EXPECT_EQ(refuse({"resolved", "nothing"}), refusal + "nothing: there is no such file\n");
    EXPECT_EQ(refuse({"resolved", "x.ignored"}), refusal + "x.ignored: it is ignored by Git\n");
    EXPECT_EQ(refuse({"resolved", "folder"}), refusal + "folder: no file in it is in conflict\n");
    EXPECT_EQ(refuse({"resolved", "../x"}), refusal + "../x: it lies outside the working copy " +
                                                repository_.path().string() + "\n");
}

TEST_F(ShellResolved, RefusesANameThatMeansFilesThatWereNotNamed)
{
    repository_.write("[ab]", "");
    repository_.write("b", "edited\n");
    EXPECT_EQ(refuse({"resolved", "[ab]"}),
              "Nothing was marked as resolved.\nA name with *, ? or [ is a pattern, and matches "
              "these files too:\n  b\nName them as well if you want them, or use git for the file "
              "with that name.\n");
}

} // namespace
} // namespace vclink::test

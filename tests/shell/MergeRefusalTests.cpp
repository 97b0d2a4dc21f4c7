// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::AllOf;
using testing::EndsWith;
using testing::HasSubstr;
using testing::StartsWith;

/// The back end refuses a merge that would lose work. The program shows its words, and asks for no
/// states itself.
class ShellMergeOverChanges : public ShellMergeFixture
{
  protected:
    /// Expects that the merge is refused with this text, and leaves the files and the branch.
    void expectRefused(const std::string &text) const
    {
        const std::string before = describe(repository_);
        EXPECT_THAT(fail({"merge", "other"}),
                    AllOf(StartsWith("vclink-shell: \"other\" could not be merged into the current "
                                     "branch.\n"),
                          HasSubstr(text),
                          EndsWith("\nvclink-shell: Nothing was merged. Commit the changes that "
                                   "would be lost, or move the files out of the way, and\nmerge "
                                   "again.\n")));
        EXPECT_EQ(describe(repository_), before);
        EXPECT_EQ(state(), "Normal\n");
    }
};

TEST_F(ShellMergeOverChanges, ShowsWhatTheBackEndRefuses)
{
    diverge();
    repository_.write("folder/c", "edited\n");
    expectRefused("the uncommitted changes of 'folder/c' would be lost in the merge");
    repository_.git({"checkout", "--quiet", "folder/c"});
    repository_.write("new", "untracked\n");
    expectRefused("(code -13, ");
    EXPECT_EQ(repository_.read("new"), "untracked\n");
}

TEST_F(ShellMergeOverChanges, ShowsTheWayOutOfTheBackEnd)
{
    diverge();
    repository_.git({"update-index", "--assume-unchanged", "folder/c"});
    repository_.write("folder/c", "edited\n");
    expectRefused("take the mark away with 'git update-index --no-assume-unchanged' and commit");
}

TEST_F(ShellMergeOverChanges, IsRefusedWhereALinkHasTakenAFilesPlace)
{
    diverge();
    repository_.remove("folder/c");
    repository_.symlink("../a", "folder/c");
    expectRefused("folder/c");
}

TEST_F(ShellMergeOverChanges, IsRefusedOverStagedChangesAndChangesOfTheSameFiles)
{
    diverge();
    repository_.write("folder/c", "edited\n");
    repository_.add({"folder/c"});
    expectRefused("(code -13, ");
    repository_.git({"reset", "--quiet", "--hard"});
    repository_.write("a", "edited\n");
    expectRefused("(code -13, ");
}

TEST_F(ShellMergeOverChanges, NamesTheFilesWithChanges)
{
    const std::string changed = "\nvclink-shell: These files have uncommitted changes:\n  ";
    diverge();
    repository_.write("folder/c", "edited\n");
    repository_.add({"folder/c"});
    expectRefused(changed + "folder/c\nvclink-shell: Nothing");
    repository_.git({"reset", "--quiet", "--hard"});
    repository_.write("a", "edited\n");
    repository_.remove("b");
    expectRefused(changed + "a\n  b\nvclink-shell: Nothing");
}

TEST_F(ShellMergeOverChanges, NamesTheUntrackedFilesWhereTheOtherSideHasSomething)
{
    makeBranch("other", {{"new", "theirs\n"}, {"taken/inside", "theirs\n"}});
    commitFiles({{"b", "ours\n"}});
    repository_.write("new/mine", "mine\n");
    repository_.write("taken", "mine\n");
    repository_.write("folder/new", "mine\n");
    repository_.write("unrelated", "mine\n");
    expectRefused(
        "\nvclink-shell: These files are not tracked, and the other side has something in "
        "their place:\n  new/mine\n  taken\nvclink-shell: Nothing");
}

/// A commit of everything would leave the submodule out.
TEST_F(ShellMergeOverChanges, TellsHowToBringBackASubmoduleThatIsMissing)
{
    GitRepository inner = makeRepository("inner");
    inner.write("file", "1\n");
    const std::string first = inner.commitAll("1");
    inner.write("file", "2\n");
    const std::string second = inner.commitAll("2");
    repository_.git({"submodule", "--quiet", "add", inner.path(), "module"});
    const GitRepository module(repository_ / "module");
    module.git({"checkout", "--quiet", first});
    repository_.commitAll("module");
    repository_.git({"checkout", "--quiet", "-b", "other"});
    module.git({"checkout", "--quiet", second});
    repository_.commitAll("moved");
    repository_.git({"checkout", "--quiet", "main"});
    module.git({"checkout", "--quiet", first});
    commitFiles({{"b", "ours\n"}});
    repository_.remove("module");
    expectRefused("\nvclink-shell: The folders of these submodules are missing:\n  module\nRestore "
                  "them with \"git submodule update --init\" first. A commit would leave these "
                  "submodules out.\nvclink-shell: Nothing");
    repository_.git({"submodule", "--quiet", "update", "--init"});
    EXPECT_THAT(run({"merge", "other"}).output, StartsWith("Merge commit "));
    EXPECT_EQ(repository_.line({"rev-parse", "HEAD:module"}), second);
}

/// Its contents may lack, as those of a submodule do.
TEST_F(ShellMergeOverChanges, SaysThatGitDownloadsWhatAPartialCloneLacks)
{
    diverge();
    const auto source = folder() / "source";
    std::filesystem::rename(repository_.path(), source);
    GitRepository(source).git({"config", "uploadpack.allowFilter", "true"});
    GitRepository(source).git({"clone", "--quiet", "--filter=blob:none", "--no-checkout",
                               "file://" + source.string(), repository_.path().string()});
    repository_.git({"config", "core.sparseCheckout", "true"});
    repository_.write(".git/info/sparse-checkout", "/b\n");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.git({"branch", "other", "origin/other"});
    repository_.git({"config", "user.name", "A"});
    repository_.git({"config", "user.email", "a@example.org"});
    const std::string before = describe(repository_);
    EXPECT_THAT(fail({"merge", "other"}),
                EndsWith("is not in this partial clone, and only git fetches it: use git for this "
                         "(code -13, category 20)\nvclink-shell: Nothing was merged. Use \"git "
                         "merge\" for this, which downloads what is missing.\n"));
    EXPECT_EQ(describe(repository_), before);
    // Downloads what has changed. Left out are also other files.
    repository_.git({"diff", "main~", "main"});
    repository_.git({"diff", "main~", "other"});
    repository_.write("b", "edited\n");
    expectRefused("\nvclink-shell: These files have uncommitted changes:\n  b\nvclink-shell: "
                  "Nothing");
    repository_.git({"checkout", "--quiet", "b"});
    repository_.git({"merge", "--quiet", "other"});
}

TEST_F(ShellMergeOverChanges, GoesOnWhereNothingIsLost)
{
    diverge();
    repository_.write("untracked", "untracked\n");
    repository_.remove("folder/deep/d");
    EXPECT_THAT(run({"merge", "other"}).output, StartsWith("Merge commit "));
    EXPECT_EQ(repository_.read("untracked"), "untracked\n");
    EXPECT_EQ(repository_.read("folder/deep/d"), "folder/deep/d\n");
}

TEST_F(ShellMergeOverChanges, FastForwardsAndKeepsWhatTheBranchDoesNotTouch)
{
    makeBranch("other", {{"a", "theirs\n"}});
    repository_.write("b", "edited\n");
    EXPECT_THAT(run({"merge", "other"}).output, StartsWith("Fast-forward to "));
    EXPECT_EQ(repository_.read("b"), "edited\n");
    EXPECT_EQ(repository_.read("a"), "theirs\n");
}

TEST_F(ShellMergeOverChanges, DoesNothingWhenThereIsNothingToDo)
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
    EXPECT_THAT(refuse({"merge", "nothing"}),
                StartsWith("Nothing was merged: there is no branch and no commit 'nothing'.\n"));
    repository_.git({"checkout", "--quiet", "a"});
    clash();
    fail({"merge", "other"});
    EXPECT_THAT(refuse({"merge", "other"}),
                AllOf(HasSubstr("A merge cannot begin while"),
                      HasSubstr("\nvclink-shell: A merge is under way. Conclude it with "
                                "\"vclink-shell commit\", or undo it with \"git merge "
                                "--abort\".\n")));
}

TEST_F(ShellMergeOverChanges, TakesNoForce)
{
    EXPECT_EQ(run({"merge", "--force", "other"}).exitStatus, 2);
}

} // namespace
} // namespace vclink::test

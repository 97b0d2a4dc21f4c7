// SPDX-License-Identifier: MIT
#include <csignal>
#include <filesystem>

#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;
using testing::AllOf;
using testing::EndsWith;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

const std::string refusedBegin =
    "\nvclink-shell: A merge command refused these files. They may be a mix of both sides without "
    "conflict markers:";
const std::string asideBegin =
    "\nvclink-shell: The merge has renamed these files, because something else has their names:\n";

/// What a merge with conflicts leaves, beside the files in conflict.
class ShellMergeLeftovers : public ShellMergeFixture
{
  protected:
    /// Three files of which each side changes its own end, given to drivers by these attributes.
    void makeDriven(const std::string &attributes)
    {
        const std::string base = "1\n2\n3\n4\n5\n6\n7\n8\n";
        commitFiles(
            {{"one", base}, {"two", base}, {"three", base}, {".gitattributes", attributes}});
        const std::string theirs = base + "theirs\n";
        const std::string ours = "ours\n" + base;
        makeBranch("other", {{"one", theirs}, {"two", theirs}, {"three", theirs}});
        commitFiles({{"one", ours}, {"two", ours}, {"three", ours}});
        repository_.git({"config", "merge.refuses.driver", "false %A"});
        repository_.git({"config", "merge.takes.driver", "true %A"});
    }
};

TEST_F(ShellMergeLeftovers, TellWhichFilesACommandRefused)
{
    makeDriven("one merge=refuses\ntwo merge=takes\nthree merge=refuses\n");
    EXPECT_THAT(fail({"merge", "other"}), EndsWith(refusedBegin + "\n  one\n  three\n"));
    // Which is why they are named.
    EXPECT_EQ(repository_.read("one"), "ours\n1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n");
    EXPECT_EQ(letters().at("one"), "UU");
}

TEST_F(ShellMergeLeftovers, TellThemAlsoOfTheDriverOfFilesWithoutTheAttribute)
{
    makeDriven("two merge=takes\nthree merge=takes\n");
    repository_.git({"config", "merge.default", "refuses"});
    EXPECT_THAT(fail({"merge", "other"}), EndsWith(refusedBegin + "\n  one\n"));
}

TEST_F(ShellMergeLeftovers, DoNotTellOfFilesThatNoCommandWasGiven)
{
    makeDriven("one merge=refuses\nthree merge=refuses\n");
    repository_.remove("one");
    repository_.commitAll("ours is gone");
    EXPECT_THAT(fail({"merge", "other"}), AllOf(HasSubstr("in conflict:\n  one\n  three\n"),
                                                EndsWith(refusedBegin + "\n  three\n")));
}

TEST_F(ShellMergeLeftovers, DoNotTellOfConflictsWithoutACommand)
{
    clash();
    EXPECT_THAT(fail({"merge", "other"}),
                AllOf(Not(HasSubstr(refusedBegin)), Not(HasSubstr(asideBegin))));
}

TEST_F(ShellMergeLeftovers, TellWhichFilesHaveAnotherName)
{
    makeBranch("other", {{"new/inside", "theirs\n"}});
    commitFiles({{"new", "ours\n"}});
    EXPECT_THAT(fail({"merge", "other"}),
                EndsWith(asideBegin + "  new~HEAD\nThey are not in the merge: move each that you "
                                      "want to keep to its place, and add it.\n"));
    EXPECT_EQ(repository_.read("new~HEAD"), "ours\n");
}

TEST_F(ShellMergeLeftovers, TellThemOfBothSides)
{
    makeBranch("other", {{"new", "theirs\n"}});
    commitFiles({{"new/inside", "ours\n"}});
    const std::string theirs = repository_.line({"rev-parse", "other"});
    EXPECT_THAT(fail({"merge", "other"}), HasSubstr(asideBegin + "  new~" + theirs + "\n"));
    EXPECT_EQ(repository_.read("new~" + theirs), "theirs\n");
}

TEST_F(ShellMergeLeftovers, TellThemIfGitIgnoresThem)
{
    makeBranch("other", {{"new/inside", "theirs\n"}, {"f/new/inside", "theirs\n"}});
    commitFiles({{"new", "ours\n"}, {"f/new", "ours\n"}});
    repository_.write(".git/info/exclude", "*~*\n");
    EXPECT_THAT(fail({"merge", "other"}), HasSubstr(asideBegin + "  f/new~HEAD\n  new~HEAD\n"));
}

TEST_F(ShellMergeLeftovers, DoNotTellOfOtherNewFilesWithATilde)
{
    clash();
    for (const std::string name : {"a~", "a~old", "~HEAD", "nothing~HEAD"})
        repository_.write(name, "mine\n");
    EXPECT_THAT(fail({"merge", "other"}), Not(HasSubstr(asideBegin)));
}

TEST_F(ShellMergeLeftovers, NameGitmodulesInConflict)
{
    const std::string base = "[submodule \"s\"]\n\tpath = s\n\turl = ";
    repository_.git({"update-index", "--add", "--cacheinfo", "160000," + head() + ",s"});
    repository_.makeFolder("s");
    repository_.write(".gitmodules", base + "base\n");
    repository_.git({"add", ".gitmodules"});
    repository_.commit("submodule");
    makeBranch("other", {{".gitmodules", base + "theirs\n"}});
    commitFiles({{".gitmodules", base + "ours\n"}});
    const std::string unknown =
        "vclink-shell: The states of the files are not known: .gitmodules is in conflict, and "
        "can't be read before it\nis resolved. Edit it, and mark it with "
        "\"vclink-shell resolved\".\n";
    EXPECT_THAT(fail({"merge", "other"}),
                AllOf(EndsWith(unknown), Not(HasSubstr("No file is in conflict"))));
    EXPECT_EQ(fail({"commit", "-m", "Merge"}), unknown);
    repository_.write(".gitmodules", base + "both\n");
    succeed({"resolved", ".gitmodules"});
    succeed({"commit", "-m", "Merge"});
    EXPECT_EQ(repository_.git({"show", "HEAD:.gitmodules"}), base + "both\n");
    EXPECT_EQ(state(), "Normal\n");
}

/// The merge is killed by a command that it runs.
class ShellInterruptedMerge : public ShellMergeFixture
{
  protected:
    ShellInterruptedMerge()
    {
        commitFiles({{".gitattributes", "a merge=kills\n"}});
        clash();
        repository_.git({"config", "merge.kills.driver", "sh -c \"kill -9 $PPID\""});
        EXPECT_EQ(run({"merge", "other"}).signal, SIGKILL);
        fs::rename(repository_ / ".git/index.lock", folder() / "lock");
    }

    const std::string recognised_ =
        "vclink-shell: A merge was interrupted before all of it was written, and can't be "
        "concluded. \"vclink-shell commit\"\nprints the commands that restore the working copy.";
};

TEST_F(ShellInterruptedMerge, IsRecognised)
{
    const CommandResult state = run({"state"});
    EXPECT_EQ(state.output, "Conflicts\n");
    EXPECT_EQ(state.errors, recognised_ + '\n');
    EXPECT_EQ(state.exitStatus, 0);
    EXPECT_THAT(fail({"merge", "other"}), EndsWith('\n' + recognised_ + '\n'));
}

TEST_F(ShellInterruptedMerge, NamesTheLockThatItHasLeft)
{
    fs::rename(folder() / "lock", repository_ / ".git/index.lock");
    const std::string withLock =
        recognised_ + "\nIf no other program is using Git here, remove .git/index.lock first.\n";
    EXPECT_EQ(run({"state"}).errors, withLock);
    EXPECT_THAT(fail({"merge", "other"}), EndsWith('\n' + withLock));
}

/// The sign of its interruption exists until the back end's next operation.
TEST_F(ShellInterruptedMerge, IsNotTakenForAMergeThatGitHasBegunSince)
{
    repository_.git({"config", "--unset", "merge.kills.driver"});
    repository_.git({"reset", "--quiet", "--hard"});
    EXPECT_EQ(repository_.tryGit({"merge", "--quiet", "other"}).exitStatus, 1);
    EXPECT_TRUE(fs::exists(repository_ / ".git/vclink-merge"));
    const CommandResult state = run({"state"});
    EXPECT_EQ(state.output, "Conflicts\n");
    EXPECT_EQ(state.errors, "");
    EXPECT_THAT(fail({"merge", "other"}),
                EndsWith("\nvclink-shell: A merge is under way. Conclude it with \"vclink-shell "
                         "commit\", or undo it with \"git merge --abort\".\n"));
}

TEST_F(ShellInterruptedMerge, CannotBeConcludedAndTellsTheWayOut)
{
    const std::string before = head();
    for (const std::vector<std::string> &commit :
         {std::vector<std::string>{"commit", "-m", "Merge"},
          std::vector<std::string>{"commit", "--as-is", "-m", "Merge"}})
        EXPECT_THAT(
            fail(commit),
            AllOf(StartsWith("vclink-shell: Nothing was committed: a merge was interrupted "
                             "before all of it was written, and a commit would\nleave the "
                             "rest out. To begin again, run this in the root of the working "
                             "copy:\ngit diff-tree "),
                  EndsWith("git merge --abort\n")));
    EXPECT_THAT(fail({"--lang", "de", "commit", "-m", "Merge"}),
                StartsWith("vclink-shell: Nichts wurde committet: Ein Merge wurde unterbrochen"));
    EXPECT_EQ(head(), before);
}

} // namespace
} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ChangeFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Pair;

class ShellAdd : public ChangeFixture
{
};

TEST_F(ShellAdd, StagesNewFiles)
{
    repository_.write("new", "");
    repository_.write("folder/newer", "");
    repository_.write("other", "");
    succeed({"add", "new", "folder/newer"});
    EXPECT_THAT(letters(),
                ElementsAre(Pair("folder/newer", "A "), Pair("new", "A "), Pair("other", "??")));
}

TEST_F(ShellAdd, StagesTheNewFilesBelowAFolderAndNothingElse)
{
    repository_.write("folder/new", "");
    repository_.write("folder/deep/new", "");
    repository_.write("folder/newer/new", "");
    repository_.write("folder/y.ignored", "");
    repository_.write("folder/c", "edited\n");
    repository_.write("elsewhere", "");
    succeed({"add", "folder/"});
    EXPECT_THAT(letters(), ElementsAre(Pair("elsewhere", "??"), Pair("folder/c", " M"),
                                       Pair("folder/deep/new", "A "), Pair("folder/new", "A "),
                                       Pair("folder/newer/new", "A ")));
}

TEST_F(ShellAdd, StagesAllNewFilesForTheRootFromAnyFolder)
{
    repository_.write("new", "");
    repository_.write("folder/new", "");
    const CommandResult result = runIn(repository_ / "folder/deep", {"add", "../.."});
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_THAT(letters(), ElementsAre(Pair("folder/new", "A "), Pair("new", "A ")));
}

TEST_F(ShellAdd, IsDoneWhereAFolderHoldsNoNewFile)
{
    succeed({"add", "folder", "."});
    EXPECT_THAT(letters(), IsEmpty());
}

TEST_F(ShellAdd, RefusesFilesThatGitKnowsAndAddsNothing)
{
    repository_.write("new", "");
    repository_.write("b", "edited\n");
    EXPECT_EQ(refuse({"add", "new", "b", "a"}),
              "Nothing was added:\n"
              "  b: Git tracks it already: its changes are in the next commit anyway\n"
              "  a: Git tracks it already: its changes are in the next commit anyway\n");
    repository_.remove("a");
    EXPECT_EQ(runIn(repository_ / "folder", {"add", "../a"}).errors,
              "vclink-shell: Nothing was added:\n"
              "  ../a: it is gone from the disk, and from the next commit\n");
}

TEST_F(ShellAdd, NamesTheWayOutOfAConflict)
{
    makeConflict();
    EXPECT_EQ(refuse({"add", "a"}), "Nothing was added:\n  a: it is in conflict: edit it until it "
                                    "is right, then mark it with \"vclink-shell resolved\"\n");
}

TEST_F(ShellAdd, NamesTheTrackedFilesThatAreInTheWayOfANewOne)
{
    repository_.remove("folder");
    repository_.write("folder", "a file\n");
    EXPECT_EQ(refuse({"add", "."}),
              "Nothing was added, because these files are not new to Git:\n  folder/c\n  "
              "folder/deep/d\nvclink-shell: Nothing can be added in their place before you commit. "
              "git can do it: use \"git add\".\n");
    repository_.git({"rm", "--quiet", "-r", "--cached", "folder"});
    repository_.git({"-c", "user.name=Person", "-c", "user.email=person@example.org", "commit",
                     "--quiet", "--message=gone"});
    succeed({"add", "."});
    EXPECT_EQ(repository_.git({"show", ":folder"}), "a file\n");
}

TEST_F(ShellAdd, TracksAgainWhatWasRemoved)
{
    repository_.git({"rm", "--quiet", "--cached", "a", "b", "folder/c"});
    repository_.write("a", "other\n");
    repository_.remove("b");
    succeed({"add", "a"});
    EXPECT_EQ(repository_.git({"show", ":a"}), "other\n");
    succeed({"add", "."});
    EXPECT_THAT(letters(), ElementsAre(Pair("a", "M "), Pair("b", "D ")));
}

TEST_F(ShellAdd, RefusesEachNameThatItCannotServeWithTheReason)
{
    repository_.write("new", "");
    std::filesystem::create_directory(repository_ / "empty");
    repository_.write("shut/y.ignored", "");
    GitRepository(folder().path()).write("outside", "");
    EXPECT_EQ(refuse({"add", "new", "nothing", "x.ignored", "empty", "shut", "../outside",
                      ".git/config", "a/b"}),
              "Nothing was added:\n  nothing: there is no such file\n  x.ignored: it is ignored by "
              "Git\n  empty: it has no files\n  shut: it has only ignored files\n  ../outside: it "
              "lies outside the working copy " +
                  repository_.path().string() +
                  "\n"
                  "  .git/config: it is ignored by Git\n"
                  "  a/b: there is no such file\n");
}

TEST_F(ShellAdd, LeavesOutRepositories)
{
    GitRepository inner = makeRepository("repository/inner");
    inner.write("file", "");
    EXPECT_EQ(refuse({"add", "inner"}),
              "Nothing was added:\n  inner: it is a repository of its own: "
              "use \"git submodule add\"\n");
    EXPECT_EQ(refuse({"add", "."}),
              "Nothing was added, because these are repositories of their own:\n  inner/\n");
    repository_.write("new", "");
    EXPECT_EQ(runIn(repository_.path(), {"add", "."}).errors,
              "vclink-shell: Others were not added, because these are repositories of their "
              "own:\n  inner/\n");
    EXPECT_THAT(letters(), ElementsAre(Pair("inner/", "??"), Pair("new", "A ")));
    inner.commitAll("begin");
    EXPECT_THAT(refuse({"add", "inner"}), HasSubstr("it is a repository of its own"));
}

TEST_F(ShellAdd, DoesNotTakeANameForThePatternOfAnother)
{
    repository_.write("a1", "");
    EXPECT_THAT(refuse({"add", "a[1]"}), HasSubstr("  a[1]: there is no such file\n"));
    EXPECT_THAT(refuse({"add", "*"}), HasSubstr("  *: there is no such file\n"));
}

TEST_F(ShellAdd, SaysThatABackslashCannotBeNamed)
{
    repository_.write("back\\slash", "");
    EXPECT_EQ(
        refuse({"add", "back\\slash"}),
        "Nothing was added:\n  \"back\\\\slash\": a backslash in a name is read as a slash\n");
}

TEST_F(ShellAdd, StagesALinkItselfWhereItHasNoTarget)
{
    repository_.symlink("nowhere", "link");
    succeed({"add", "link"});
    EXPECT_THAT(letters(), ElementsAre(Pair("link", "A ")));
}

TEST_F(ShellAdd, RefusesANameThatMeansFilesThatWereNotNamed)
{
    for (const std::string name : {"a[1].txt", "a1.txt", "x[1]/y", "x1/y"})
        repository_.write(name, "");
    const std::string reason =
        "Nothing was added.\nA name with *, ? or [ is a pattern, and matches these files too:\n  ";
    const std::string way =
        "\nName them as well if you want them, or use git for the file with that name.\n";
    EXPECT_EQ(refuse({"add", "a[1].txt"}), reason + "a1.txt" + way);
    EXPECT_THAT(refuse({"add", "x[1]"}), HasSubstr("  x[1]: a name with *, ? or [ is read"));
    succeed({"add", "a[1].txt", "a1.txt", "x1"});
    EXPECT_EQ(letters().at("a[1].txt"), "A ");
    EXPECT_EQ(letters().at("x1/y"), "A ");
}

TEST_F(ShellAdd, TellsTheLibrarysErrorWhereTheIndexIsLocked)
{
    repository_.write("new", "");
    repository_.write(".git/index.lock", "");
    EXPECT_THAT(refuse({"add", "new"}), HasSubstr("index"));
}

} // namespace
} // namespace vclink::test

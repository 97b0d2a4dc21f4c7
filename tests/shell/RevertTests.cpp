// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ChangeFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;
using testing::StartsWith;

class ShellRevert : public ChangeFixture
{
  protected:
    /// A change of every kind.
    void changeAll()
    {
        repository_.write("a", "edited\n");
        repository_.write("b", "staged\n");
        repository_.add({"b"});
        repository_.git({"rm", "--quiet", "folder/c"});
        repository_.remove("folder/deep/d");
        repository_.write("folder/added", "added\n");
        repository_.add({"folder/added"});
        repository_.write("folder/new", "new\n");
    }
};

TEST_F(ShellRevert, PutsFilesBackAsTheyAreInTheLastCommit)
{
    changeAll();
    succeed({"revert", "a", "b", "folder/c", "folder/deep/d", "folder/added"});
    EXPECT_THAT(letters(), ElementsAre(Pair("folder/added", "??"), Pair("folder/new", "??")));
    for (const std::string name : {"a", "b", "folder/c", "folder/deep/d"})
        EXPECT_EQ(repository_.read(name), name + '\n');
    EXPECT_EQ(repository_.read("folder/added"), "added\n");
}

TEST_F(ShellRevert, PutsBackOnlyWhatIsNamed)
{
    changeAll();
    succeed({"revert", "a"});
    EXPECT_EQ(letters().count("a"), 0U);
    EXPECT_EQ(letters().at("b"), "M ");
    EXPECT_EQ(letters().at("folder/added"), "A ");
}

TEST_F(ShellRevert, PutsBackAllBelowAFolder)
{
    changeAll();
    succeed({"revert", "folder"});
    EXPECT_THAT(letters(), ElementsAre(Pair("a", " M"), Pair("b", "M "), Pair("folder/added", "??"),
                                       Pair("folder/new", "??")));
}

TEST_F(ShellRevert, PutsBackAllForTheRoot)
{
    const std::vector<std::string> odd{"#odd/file", "!odd/file", "odd [1]/file", "#file",
                                       "!file",     "end /file", "past ",        "\xFF/\xFF",
                                       "*",         "new\nline", "tab\t/file",   "[a]"};
    for (const auto &name : odd)
        repository_.write(name, "");
    repository_.commitAll("odd");
    changeAll();
    for (const auto &name : odd)
        repository_.write(name, "edited");
    succeed({"revert", "."});
    EXPECT_THAT(letters(), ElementsAre(Pair("folder/added", "??"), Pair("folder/new", "??")));
}

TEST_F(ShellRevert, PutsBackWhatWasRenamedBelowTheRoot)
{
    repository_.write("long", "a text that is long enough to be found again\n");
    repository_.commitAll("long");
    repository_.git({"mv", "long", "renamed"});
    succeed({"revert", "."});
    EXPECT_THAT(letters(), ElementsAre(Pair("renamed", "??")));
    EXPECT_EQ(repository_.read("long").size(), 45U);
}

TEST_F(ShellRevert, PutsBackBothNamesOfARenamedFile)
{
    repository_.write("long", "a text that is long enough to be found again\n");
    repository_.commitAll("long");
    repository_.git({"mv", "long", "renamed"});
    succeed({"revert", "long", "renamed"});
    EXPECT_THAT(letters(), ElementsAre(Pair("renamed", "??")));
}

TEST_F(ShellRevert, PutsBackAFolderThatIsGoneOrBecameAFile)
{
    repository_.remove("folder");
    succeed({"revert", "folder"});
    EXPECT_THAT(letters(), IsEmpty());
    repository_.remove("folder");
    repository_.write("folder", "a file\n");
    succeed({"revert", "folder"});
    EXPECT_THAT(letters(), IsEmpty());
    EXPECT_EQ(repository_.read("folder/c"), "folder/c\n");
}

TEST_F(ShellRevert, PutsBackAFileThatBecameAFolder)
{
    repository_.remove("a");
    std::filesystem::create_directory(repository_ / "a");
    succeed({"revert", "a"});
    EXPECT_EQ(repository_.read("a"), "a\n");
}

TEST_F(ShellRevert, UnstagesFilesWhereThereIsNoCommitYet)
{
    const GitRepository empty = makeRepository("empty");
    empty.write("new", "text\n");
    empty.add();
    EXPECT_EQ(runIn(empty.path(), {"revert", "new"}).exitStatus, 0);
    EXPECT_EQ(empty.git({"status", "--porcelain"}), "?? new\n");
    EXPECT_EQ(empty.read("new"), "text\n");
}

TEST_F(ShellRevert, IsDoneWhereNothingIsChanged)
{
    succeed({"revert", "a", "folder", "."});
    EXPECT_THAT(letters(), IsEmpty());
}

TEST_F(ShellRevert, KeepsWhatItDiscardsAndSaysHowToRestoreIt)
{
    for (const std::string name : {"b", "folder/c", "added"})
        repository_.write(name, "staged\n");
    repository_.add({"b", "folder/c", "added"});
    repository_.write("a", "edited\n");
    repository_.write("b", "on the disk\n");
    repository_.remove("folder/c");
    const CommandResult result = runIn(repository_ / "folder/deep", {"revert", "../.."});
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "?? added\n");
    const std::vector<std::string> lines = split(result.errors, '\n');
    ASSERT_EQ(lines.size(), 2U) << result.errors;
    EXPECT_THAT(lines[0], StartsWith("To restore what was discarded: git restore --overlay "));
    EXPECT_THAT(lines[1], StartsWith("To restore what was staged: git restore --overlay --staged"));
    for (const std::string &line : lines)
        EXPECT_EQ(Command({"sh", "-c", line.substr(line.find("git "))})
                      .in(repository_ / "folder/deep")
                      .run()
                      .exitStatus,
                  0);
    EXPECT_EQ(repository_.read("a") + repository_.read("b") + repository_.read("folder/c"),
              "edited\non the disk\nstaged\n");
    EXPECT_EQ(repository_.git({"show", ":b"}) + repository_.git({"show", ":added"}),
              "staged\nstaged\n");
    EXPECT_EQ(repository_.read("folder/deep/d"), "folder/deep/d\n");
}

TEST_F(ShellRevert, KeepsWhatIsInThePlaceOfAFile)
{
    repository_.remove("a");
    repository_.write("a/notes", "notes\n");
    repository_.remove("folder");
    repository_.write("folder", "a file\n");
    const std::string line = runIn(repository_.path(), {"revert", "."}).errors;
    EXPECT_EQ(repository_.read("a") + repository_.read("folder/c"), "a\nfolder/c\n");
    const std::string option = "--source=";
    const std::size_t start = line.find(option) + option.size();
    const std::string tree = line.substr(start, line.find(' ', start) - start);
    EXPECT_EQ(repository_.git({"show", tree + ":a/notes"}), "notes\n");
    EXPECT_EQ(repository_.git({"show", tree + ":folder"}), "a file\n");
}

TEST_F(ShellRevert, KeepsNothingWhereNothingIsDiscardedOrWhenToldTo)
{
    repository_.write("added", "added\n");
    repository_.add({"added"});
    repository_.remove("b");
    EXPECT_EQ(runIn(repository_.path(), {"revert", "."}).errors, "");
    repository_.write("a", "edited\n");
    const std::string before = repository_.git({"count-objects"});
    EXPECT_EQ(runIn(repository_.path(), {"revert", "--forget", "a"}).errors, "");
    EXPECT_EQ(repository_.git({"count-objects"}), before);
    EXPECT_EQ(repository_.read("a"), "a\n");
}

TEST_F(ShellRevert, DiscardsNothingThatCannotBeKept)
{
    repository_.write("a", "edited\n");
    const CommandResult result = shell({"revert", "a"})
                                     .in(repository_.path())
                                     .environment("PATH", folder().path().string())
                                     .run();
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.errors,
              "vclink-shell: Nothing was reverted: git can't store what would be discarded. To "
              "discard it for good, use --forget.\n");
    EXPECT_EQ(repository_.read("a"), "edited\n");
    EXPECT_TRUE(std::filesystem::is_empty(environment().temporary()));
}

TEST_F(ShellRevert, RefusesFilesInConflictAndRevertsNothing)
{
    makeConflict();
    repository_.write("folder/c", "edited\n");
    const std::string reason =
        "Nothing was reverted, because these files have unresolved conflicts:\n" +
        (repository_ / "a").string() + '\n';
    EXPECT_EQ(refuse({"revert", "folder/c", "a"}), reason);
    EXPECT_EQ(refuse({"revert", "."}), reason);
}

TEST_F(ShellRevert, RefusesEachNameThatNoTrackedFileHas)
{
    changeAll();
    EXPECT_EQ(refuse({"revert", "a", "folder/new", "nothing", "x.ignored", "/"}),
              "Nothing was reverted:\n"
              "  folder/new: it is not tracked by Git\n"
              "  nothing: there is no such file\n"
              "  x.ignored: it is ignored by Git\n"
              "  /: it lies outside the working copy " +
                  repository_.path().string() + "\n");
}

TEST_F(ShellRevert, RefusesANameThatMeansChangedFilesThatWereNotNamed)
{
    for (const std::string name : {"a[1].txt", "a1.txt"})
        repository_.write(name, "");
    repository_.commitAll("pattern");
    repository_.write("a[1].txt", "edited\n");
    succeed({"revert", "a[1].txt"});
    EXPECT_THAT(letters(), IsEmpty());
    for (const std::string name : {"a[1].txt", "a1.txt"})
        repository_.write(name, "edited\n");
    EXPECT_EQ(refuse({"revert", "a[1].txt"}),
              "Nothing was reverted.\nA name with *, ? or [ is a pattern, and means these files "
              "too:\n  a1.txt\nName them as well if you mean them, or use git for the file with "
              "that name.\n");
    succeed({"revert", "a[1].txt", "a1.txt"});
    EXPECT_THAT(letters(), IsEmpty());
}

} // namespace
} // namespace vclink::test

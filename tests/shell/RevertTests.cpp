// SPDX-License-Identifier: MIT
#include <filesystem>
#include <map>
#include <string>
#include <vector>

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

    /// Does what the lines say that a revert has written.
    static void restore(const std::string &errors, const std::filesystem::path &place)
    {
        for (const std::string &line : split(errors, '\n'))
        {
            if (line.rfind("Before you restore, ", 0) == 0)
            {
                const std::string folder = split(line, '\'')[1];
                std::filesystem::rename(place / folder, place / (folder + ".moved"));
                continue;
            }
            const std::string command = "set -o pipefail; " + line.substr(line.find(": git ") + 2);
            const CommandResult result = Command({"bash", "-c", command}).in(place).run();
            EXPECT_EQ(result.exitStatus, 0) << line << '\n' << result.errors;
        }
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
    EXPECT_THAT(lines[0], StartsWith("To restore what was discarded: git -C ../.. cat-file "));
    EXPECT_THAT(lines[1], StartsWith("To restore what was staged: git -C ../.. restore "));
    restore(result.errors, repository_ / "folder/deep");
    EXPECT_EQ(repository_.read("a") + repository_.read("b"), "edited\non the disk\n");
    EXPECT_EQ(repository_.git({"show", ":b", ":added", ":folder/c"}), "staged\nstaged\nstaged\n");
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
    repository_.write("folder/later", "later\n");
    const std::string command = split(line, '\n').back();
    restore("x: " + command.substr(command.find(": git ") + 2) + " || true", repository_.path());
    EXPECT_EQ(repository_.read("folder/later"), "later\n");
    restore(line, repository_.path());
    EXPECT_EQ(repository_.read("a/notes") + repository_.read("folder"), "notes\na file\n");
    EXPECT_EQ(repository_.read("folder.moved/later"), "later\n");
}

TEST_F(ShellRevert, KeepsTheBytesOfTheDiskThatFiltersChange)
{
    repository_.write(".gitattributes", "*.txt text eol=crlf\n*.id ident\n*.up filter=case\n");
    repository_.git({"config", "filter.case.clean", "tr a-z A-Z"});
    repository_.git({"config", "filter.case.smudge", "tr A-Z a-z"});
    const std::map<std::string, std::string> kept{
        {"lines.txt", "one\r\ntwo\n"}, {"x.id", "$Id: edited$\n"}, {"x.up", "Both Cases\n"},
        {"new\nline \"", "odd\n"},     {"-dash", "dash\n"},        {"\xFF", "byte\n"}};
    for (const auto &[name, text] : kept)
        repository_.write(name, "");
    std::filesystem::create_symlink("nowhere", repository_ / "link");
    repository_.commitAll("filters");
    for (const auto &[name, text] : kept)
        repository_.write(name, text);
    std::filesystem::permissions(repository_ / "x.up", std::filesystem::perms::all);
    std::filesystem::remove(repository_ / "link");
    std::filesystem::create_symlink("to\nnowhere ", repository_ / "link");
    const std::string line = runIn(repository_.path(), {"revert", "."}).errors;
    EXPECT_EQ(std::filesystem::read_symlink(repository_ / "link"), "nowhere");
    restore(line, repository_.path());
    for (const auto &[name, text] : kept)
        EXPECT_EQ(repository_.read(name), text) << name;
    EXPECT_EQ(std::filesystem::status(repository_ / "x.up").permissions(),
              std::filesystem::perms::all);
    EXPECT_EQ(std::filesystem::read_symlink(repository_ / "link"), "to\nnowhere ");
}

TEST_F(ShellRevert, KeepsANewFileUnderTheOldNameOfARenamedOne)
{
    const std::string text = "a text that is long enough to be found again\n";
    repository_.write("long", text);
    repository_.commitAll("long");
    repository_.git({"mv", "long", "renamed"});
    repository_.write("long", text + "new\n");
    const std::string line = runIn(repository_.path(), {"revert", "."}).errors;
    EXPECT_EQ(repository_.read("long"), text);
    restore(line, repository_.path());
    EXPECT_EQ(repository_.read("long"), text + "new\n");
}

TEST_F(ShellRevert, KeepsFilesThatGitWasToldNotToLookAt)
{
    repository_.git({"update-index", "--assume-unchanged", "a"});
    repository_.git({"update-index", "--skip-worktree", "b"});
    for (const std::vector<std::string> &names :
         std::vector<std::vector<std::string>>{{"."}, {"a", "b"}})
    {
        repository_.write("a", "edited a\n");
        repository_.write("b", "edited b\n");
        std::vector<std::string> arguments{"revert"};
        arguments.insert(arguments.end(), names.begin(), names.end());
        const CommandResult result = runIn(repository_.path(), arguments);
        EXPECT_EQ(repository_.read("a") + repository_.read("b"), "a\nb\n");
        restore(result.errors, repository_.path());
        EXPECT_EQ(repository_.read("a") + repository_.read("b"), "edited a\nedited b\n");
    }
}

TEST_F(ShellRevert, SaysHowToRestoreFromWhereThePersonIs)
{
    std::filesystem::rename(repository_.path(), folder() / "it's a\nfolder");
    const GitRepository moved(folder() / "it's a\nfolder");
    moved.write("a", "edited\n");
    const std::string line =
        runIn(folder().path(), {"-C", moved / "folder", "revert", "../a"}).errors;
    EXPECT_EQ(moved.read("a"), "a\n");
    restore(line, folder().path());
    EXPECT_EQ(moved.read("a"), "edited\n");
}

TEST_F(ShellRevert, DiscardsNoRepositoryInThePlaceOfAFile)
{
    repository_.remove("a");
    repository_.write("b", "edited\n");
    const GitRepository inner = makeRepository("repository/a/inner");
    inner.write("work", "");
    EXPECT_EQ(runIn(repository_ / "folder", {"revert", "../a", "../b"}).errors,
              "vclink-shell: Nothing was reverted, because these can't be stored first:\n  ../a: a "
              "repository is in its place\nMove them out of the way, or discard them without a "
              "copy with --forget.\n");
    EXPECT_EQ(repository_.read("b") + inner.read("work"), "edited\n");
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
    EXPECT_EQ(
        result.errors,
        "vclink-shell: Nothing was reverted, because the changes can't be stored first: git can't "
        "read the index, or is not installed.\nTo discard them without a copy, use --forget.\n");
    EXPECT_EQ(repository_.read("a"), "edited\n");
    EXPECT_TRUE(std::filesystem::is_empty(environment().temporary()));
}

TEST_F(ShellRevert, SaysWhyASubmoduleKeepsItsCommit)
{
    GitRepository inner = makeRepository("repository/inner");
    inner.write("file", "");
    inner.commitAll("inner");
    repository_.commitAll("with inner");
    inner.write("file", "more\n");
    inner.commitAll("more");
    const CommandResult result = runIn(repository_.path(), {"revert", "."});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.errors, "vclink-shell: Nothing was reverted, because a submodule keeps its "
                             "commit until \"git submodule update\":\n  inner\n");
}

TEST_F(ShellRevert, RefusesFilesInConflictAndRevertsNothing)
{
    makeConflict();
    repository_.write("folder/c", "edited\n");
    const std::string reason =
        "Nothing was reverted, because these files have unresolved conflicts:\n  a\n";
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
    EXPECT_EQ(
        refuse({"revert", "a[1].txt"}),
        "Nothing was reverted.\nA name with *, ? or [ is a pattern, and matches these files too:\n "
        " a1.txt\nName them as well if you want them, or use git for the file with that name.\n");
    succeed({"revert", "a[1].txt", "a1.txt"});
    EXPECT_THAT(letters(), IsEmpty());
}

} // namespace
} // namespace vclink::test

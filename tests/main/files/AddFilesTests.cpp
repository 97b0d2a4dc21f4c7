// SPDX-License-Identifier: MIT
#include <ostream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"
#include "runScript.hpp"

namespace
{

using shared_vclink::git::AlreadyAdded;
using testing::ElementsAre;
using namespace vclink::test;

class AddFiles : public StagingFixture
{
  protected:
    void expectRefuses(const std::vector<std::string> &refused,
                       const std::vector<std::string> &names) const
    {
        expectRefusal<AlreadyAdded>(inRoot(refused), [&] { add(names); });
    }
};

TEST_F(AddFiles, BeginsToTrackANewFile)
{
    repository_.write("new", "x");
    add({"new"});
    EXPECT_THAT(status(), ElementsAre("A  new"));
    EXPECT_EQ(states(repository_, {"new"}), (States{{"new", "Added"}}));
}

/// What is done in a script of the shell, what is added as `git add` does, and how the index's
/// entry of the first of these begins.
struct AdditionCase
{
    const char *sentence;
    const char *script;
    std::vector<std::string> names;
    const char *entry;
};

void PrintTo(const AdditionCase &row, std::ostream *stream)
{
    *stream << row.script;
}

class AddAsGit : public AddFiles, public testing::WithParamInterface<AdditionCase>
{
};

TEST_P(AddAsGit, Adds)
{
    const std::vector<std::string> &names = GetParam().names;
    runScript(repository_, GetParam().script);
    std::vector<std::string> command{"add", "--"};
    command.insert(command.end(), names.begin(), names.end());
    const RepositoryState expected = stateAfterGit({command});
    add(names);
    EXPECT_EQ(stateOf(repository_), expected);
    EXPECT_THAT(indexOf(repository_).at(names.front()), testing::StartsWith(GetParam().entry));
}

const AdditionCase additionCases[] = {
    {"NewFilesAndNoOthers",
     "mkdir sub/deep; echo x | tee new sub/deep/new >left",
     {"sub/deep/new", "new"},
     "H 100644"},
    {"AnExecutable", "echo x >tool; chmod 755 tool", {"tool"}, "H 100755"},
    {"AnExecutableWhoseBitDoesNotCount",
     "git config core.fileMode false; echo x >tool; chmod 755 tool",
     {"tool"},
     "H 100644"},
    {"LineEndsAsTheAttributesSay",
     "printf '*.txt text eol=crlf\\n*.bin -text\\nauto text=auto\\n' >.gitattributes; "
     "printf 'one\\r\\ntwo\\r\\n' | tee a.txt a.bin >auto",
     {"a.txt", "a.bin", "auto"},
     "H 100644"},
    {"ALinkThatLeadsNowhere", "ln -s nowhere link", {"link"}, "H 120000"},
};

INSTANTIATE_TEST_SUITE_P(It, AddAsGit, testing::ValuesIn(additionCases),
                         [](const auto &row) { return row.param.sentence; });

TEST_F(AddFiles, WorksInARepositoryWithoutACommit)
{
    const auto empty = makeRepository("empty");
    empty.write("new", "x");
    makeAdapter(empty.path())->addFiles({asPath(empty / "new")});
    EXPECT_EQ(empty.git({"status", "--porcelain"}), "A  new\n");
}

TEST_F(AddFiles, WorksInALinkedWorktree)
{
    const std::string linked = folder() / "linked";
    repository_.git({"worktree", "add", "--quiet", linked});
    const GitRepository worktree(linked);
    worktree.write("new", "x");
    const NothingChanges inTheMainOne(repository_);
    makeAdapter(linked)->addFiles({asPath(worktree / "new")});
    EXPECT_EQ(worktree.git({"status", "--porcelain"}), "A  new\n");
}

TEST_F(AddFiles, WorksBelowARootThatIsReachedThroughALink)
{
    repository_.symlink("repository", "../link");
    repository_.write("sub/new", "x");
    repository_.write("left", "x");
    const std::string root = folder() / "link";
    makeAdapter(root)->addFiles({asPath(root + "/sub/new")});
    EXPECT_THAT(status(), ElementsAre("A  sub/new", "?? left"));
}

TEST_F(AddFiles, DoesNothingForAnEmptyListAndOpensNothing)
{
    const NothingChanges nothing(repository_);
    add({});
    EXPECT_NO_THROW(makeAdapter(folder() / "missing")->addFiles({}));
}

TEST_F(AddFiles, RefusesAFileThatGitKnows)
{
    repository_.write("other", "edited");
    const NothingChanges nothing(repository_);
    expectRefuses({"file"}, {"file"});
    expectRefuses({"other"}, {"other"});
}

TEST_F(AddFiles, AddsNothingWhenOneOfTheFilesIsRefused)
{
    repository_.write("new", "x");
    const NothingChanges nothing(repository_);
    expectRefuses({"file"}, {"new", "file"});
    expectRefuses({"file"}, {"file", "new"});
    EXPECT_EQ(states(repository_, {"new"}), (States{{"new", "Unversioned"}}));
}

TEST_F(AddFiles, RefusesAFileInAnyStateButUnversioned)
{
    repository_.commitAll(writes("gone", "x"), "second");
    beginMerge({"conflicted"});
    repository_.write("file", "edited");
    repository_.write("added", "x");
    repository_.git({"add", "--force", "added"});
    repository_.write("intended", "x");
    repository_.git({"add", "--intent-to-add", "intended"});
    repository_.git({"rm", "--quiet", "--cached", "other"});
    repository_.remove("gone");
    repository_.remove("sub/inside");
    repository_.symlink("nowhere", "sub/inside");
    const std::vector<std::string> names{"added",    "conflicted", "file",      "gone",
                                         "intended", "other",      "sub/inside"};
    EXPECT_EQ(states(repository_, names), (States{{"added", "Added"},
                                                  {"conflicted", "InConflict"},
                                                  {"file", "Modified"},
                                                  {"gone", "Missing"},
                                                  {"intended", "Added"},
                                                  {"other", "Deleted"},
                                                  {"sub/inside", "Unknown"}}));
    const NothingChanges nothing(repository_);
    for (const auto &name : names)
        expectRefuses({name}, {name});
    expectRefuses(names, names);
}

TEST_F(AddFiles, ReportsTheRefusedOnesInTheOrderOfPaths)
{
    for (const auto *name : {"a-b", "a/x", "a.b", "B", "\xC3\xBC"})
        repository_.write(name, "x");
    repository_.commitAll("second");
    expectRefuses({"B", "a/x", "a-b", "a.b", "\xC3\xBC"},
                  {"\xC3\xBC", "a.b", "a-b", "B", "a/x", "B", "./a-b"});
}

TEST_F(AddFiles, ReportsTheRefusedOnesBelowTheRootAsItWasGiven)
{
    repository_.symlink("repository", "../link");
    const std::string root = folder() / "link";
    expectRefusal<AlreadyAdded>({root + "/file"},
                                [&] { makeAdapter(root)->addFiles({asPath(root + "/file")}); });
}

TEST_F(AddFiles, RefusesWithTheCataloguesText)
{
    try
    {
        add({"sub/inside", "file"});
        FAIL() << "no exception";
    }
    catch (const vclink::git::TagException<AlreadyAdded> &exception)
    {
        EXPECT_EQ(exception.GetBaseMsgIDObj().getKey(), "AlreadyAdded");
        EXPECT_EQ(asUtf8(exception.GetUnicodeMessageTxt()),
                  "Nothing was added, because these files are not new to Git:\n" +
                      (repository_ / "file").string() + "\n" +
                      (repository_ / "sub/inside").string());
    }
}

TEST_F(AddFiles, PassesOverIgnoredFilesAndNamesThatDoNotExist)
{
    repository_.write(".git/info/exclude", "*.o\n");
    repository_.write("a.o", "x");
    repository_.write("new", "x");
    {
        const NothingChanges nothing(repository_);
        add({"a.o"});
        add({"missing", "missing/below", "file/below"});
    }
    add({"a.o", "missing", "new"});
    EXPECT_THAT(status(), ElementsAre("A  new"));
}

TEST_F(AddFiles, TakesAFolderForAllBelowIt)
{
    repository_.write(".git/info/exclude", "*.o\n");
    for (const auto *name : {"dir/a", "dir/deep/b", "dir/a.o", "dir/#c", "directory"})
        repository_.write(name, "x");
    add({"dir"});
    EXPECT_THAT(status(), ElementsAre("A  dir/#c", "A  dir/a", "A  dir/deep/b", "?? directory"));
}

TEST_F(AddFiles, RefusesAFolderWithAFileThatGitKnows)
{
    repository_.write("sub/new", "x");
    const NothingChanges nothing(repository_);
    expectRefuses({"sub/inside"}, {"sub"});
}

TEST_F(AddFiles, TakesALinkForItsTarget)
{
    repository_.write("target", "x");
    repository_.symlink("target", "link");
    repository_.symlink("file", "known");
    add({"link"});
    EXPECT_THAT(status(), ElementsAre("A  target", "?? known", "?? link"));
    const NothingChanges nothing(repository_);
    expectRefuses({"file"}, {"known"});
}

/// The files in the folder are looked up by name again.
TEST_F(AddFiles, TakesALinkAmongTheFilesOfAFolderForItsTarget)
{
    repository_.write("target", "x");
    repository_.write("dir/new", "x");
    repository_.symlink("../target", "dir/link");
    add({"dir"});
    EXPECT_THAT(status(), ElementsAre("A  dir/new", "A  target", "?? dir/link"));
}

TEST_F(AddFiles, TakesTheFileOfAFolderThatWasAFile)
{
    repository_.remove("file");
    repository_.write("file/inside", "x");
    {
        const NothingChanges nothing(repository_);
        expectRefuses({"file"}, {"file"});
    }
    const RepositoryState expected = stateAfterGit({{"add", "file/inside"}});
    add({"file/inside"});
    EXPECT_EQ(stateOf(repository_), expected);
    EXPECT_EQ(indexOf(repository_).count("file"), 0U);
}

TEST_F(AddFiles, RefusesAFileThatWasAFolder)
{
    repository_.remove("sub");
    repository_.write("sub", "x");
    const NothingChanges nothing(repository_);
    expectRefuses({"sub/inside"}, {"sub"});
}

/// The pattern of such a name does not mean what was below it.
TEST_F(AddFiles, TakesFilesWhoseNamesNeedAnEscapeAndThatWereFolders)
{
    for (const std::string name : {"!a", "sub/line\nend", "what?", "z "})
    {
        repository_.commitAll(writes(name + "-beside", "x") + writes(name + "/deep/inside", "x") +
                                  writes(name + "/inside", "x"),
                              "a folder");
        repository_.remove(name);
        repository_.write(name, "x");
        const RepositoryState expected =
            stateAfterGit({{"--literal-pathspecs", "add", "--", name}});
        add({name});
        EXPECT_EQ(stateOf(repository_), expected) << name;
        repository_.commit("a file");
    }
}

TEST_F(AddFiles, RefusesASubmoduleThatGitKnows)
{
    addModule();
    repository_.write("module/new", "x");
    const NothingChanges nothing(repository_);
    expectRefuses({"module"}, {"module"});
    add({"module/new"});
}

TEST_F(AddFiles, LeavesAllOtherEntriesAsTheyAreAndSoDoesARemoval)
{
    beginMerge({"file", "left"});
    repository_.write("edited", "x");
    repository_.git({"add", "edited"});
    repository_.write("edited", "edited since");
    repository_.write("intended", "x");
    repository_.git({"add", "--intent-to-add", "intended"});
    repository_.git({"update-index", "--skip-worktree", "other"});
    repository_.git({"update-index", "--assume-unchanged", "sub/inside"});
    repository_.remove("other");
    repository_.write("new", "x");
    RepositoryState expected = stateAfterGit({{"add", "new"}});
    add({"new"});
    EXPECT_EQ(stateOf(repository_), expected);
    expected = stateAfterGit({{"rm", "--quiet", "--cached", "file"}});
    remove({"file"});
    EXPECT_EQ(stateOf(repository_), expected);
}

TEST_F(AddFiles, CountsALaterEditAsAChangeOfAnAddedFile)
{
    repository_.write("new", "x");
    add({"new"});
    repository_.write("new", "edited since");
    EXPECT_THAT(status(), ElementsAre("AM new"));
    EXPECT_EQ(repository_.git({"show", ":new"}), "x");
    const NothingChanges nothing(repository_);
    expectRefuses({"new"}, {"new"});
}

} // namespace

// SPDX-License-Identifier: MIT
#include <algorithm>
#include <map>
#include <set>

#include <gmock/gmock.h>

#include "ShellFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::ElementsAre;
using testing::IsEmpty;
using testing::UnorderedElementsAre;

class ShellStatus : public ShellFixture
{
};

/// The program's words for git's two letters.
std::string stateFor(const std::string &letters)
{
    static const std::map<std::string, std::string> states{
        {" M", "modified"}, {"M ", "modified"},    {"MM", "modified"}, {"MD", "modified"},
        {"A ", "added"},    {"AM", "added"},       {"AD", "added"},    {"D ", "deleted"},
        {" D", "missing"},  {"??", "unversioned"}, {"UU", "conflict"}, {"AA", "conflict"},
        {"DU", "conflict"}, {"UD", "conflict"}};
    return states.at(letters);
}

/// Every file's state, derived from git's own report. Renames are told as two changes.
std::map<std::string, std::string> gitStates(const GitRepository &repository)
{
    std::map<std::string, std::string> states;
    for (const auto &name : split(repository.git({"ls-files", "-z"}), '\0'))
        states[name] = "clean";
    const std::string report =
        repository.git({"status", "--porcelain", "-z", "-uall", "--no-renames"});
    for (const auto &line : split(report, '\0'))
        states[line.substr(3)] = stateFor(line.substr(0, 2));
    return states;
}

std::map<std::string, std::string> asMap(const Records &records)
{
    std::map<std::string, std::string> states;
    for (const auto &[state, name] : records)
        EXPECT_TRUE(states.emplace(name, state).second) << name << " stands there twice";
    return states;
}

/// Files of each kind that git can tell apart, on two branches in conflict.
GitRepository makeEveryState(const GitRepository &empty)
{
    GitRepository repository = empty;
    for (const std::string name :
         {"clean.txt", "edited.txt", "staged.txt", "staged and edited.txt", "staged and gone.txt",
          "deleted.txt", "missing.txt", "folder/deep/kept.txt", "folder/edited.txt", "both.txt",
          "theirs gone.txt", "ours gone.txt"})
        repository.write(name, "the text of " + name + "\n");
    repository.write(".gitignore", "*.ignored\n");
    repository.commitAll("begin");
    repository.git({"checkout", "--quiet", "-b", "other"});
    repository.write("both.txt", "theirs\n");
    repository.write("ours gone.txt", "theirs\n");
    repository.remove("theirs gone.txt");
    repository.commitAll("their work");
    repository.git({"checkout", "--quiet", "main"});
    repository.write("both.txt", "ours\n");
    repository.write("theirs gone.txt", "ours\n");
    repository.remove("ours gone.txt");
    repository.commitAll("our work");
    EXPECT_NE(
        repository.tryGit({"-c", "user.name=A", "-c", "user.email=a@example.org", "merge", "other"})
            .exitStatus,
        0);

    for (const std::string name : {"staged.txt", "staged and edited.txt", "staged and gone.txt",
                                   "added.txt", "added and edited.txt", "added and gone.txt"})
        repository.write(name, "changed text of " + name + "\n");
    repository.add({"staged.txt", "staged and edited.txt", "staged and gone.txt", "added.txt",
                    "added and edited.txt", "added and gone.txt"});
    for (const std::string name :
         {"edited.txt", "staged and edited.txt", "added and edited.txt", "folder/edited.txt"})
        repository.write(name, "edited\n");
    for (const std::string name : {"staged and gone.txt", "added and gone.txt", "missing.txt"})
        repository.remove(name);
    repository.git({"rm", "--quiet", "deleted.txt"});
    repository.write("unversioned.txt", "");
    repository.write("new folder/unversioned.txt", "");
    repository.write("build.ignored", "");
    return repository;
}

TEST_F(ShellStatus, TellsTheStateOfEveryFileAsGitReportsIt)
{
    const GitRepository repository = makeEveryState(makeRepository());
    const auto expected = gitStates(repository);
    std::set<std::string> kinds;
    for (const auto &[name, state] : expected)
        kinds.insert(state);
    ASSERT_THAT(kinds, UnorderedElementsAre("added", "clean", "conflict", "deleted", "missing",
                                            "modified", "unversioned"));
    EXPECT_EQ(asMap(statesIn(repository.path())), expected);
}

TEST_F(ShellStatus, TellsBothNamesOfARenamedFile)
{
    GitRepository repository = makeRepository();
    repository.write("old", "a text that is long enough to be found again\n");
    repository.commitAll("begin");
    repository.git({"mv", "old", "new"});
    EXPECT_EQ(repository.git({"status", "--porcelain"}), "R  old -> new\n");
    EXPECT_THAT(statesIn(repository.path()),
                ElementsAre(Record("added", "new"), Record("deleted", "old")));
}

TEST_F(ShellStatus, TellsBothNamesOfARenamedFileWithoutGitToo)
{
    GitRepository repository = makeRepository();
    repository.write("old", "a text that is long enough to be found again\n");
    repository.write(".gitignore", "*.o\n");
    repository.commitAll("begin");
    repository.write("ignored.o", "");
    std::filesystem::create_directory(repository / "folder");
    repository.git({"mv", "old", "folder/new"});
    const Command status =
        shell({"status"}).in(repository.path()).environment("PATH", folder().path().string());
    EXPECT_EQ(status.run().output, "added\tfolder/new\ndeleted\told\n");
}

TEST_F(ShellStatus, TellsBothNamesOfARenamedFileWhereANewOneHasTheOldName)
{
    GitRepository repository = makeRepository();
    repository.write("old", "a text that is long enough to be found again\n");
    repository.write("folder/kept", "");
    repository.commitAll("begin");
    repository.git({"mv", "old", "folder/new"});
    repository.write("old", "a text that is long enough to be found again, too\n");
    EXPECT_THAT(statesIn(repository.path()),
                ElementsAre(Record("clean", "folder/kept"), Record("added", "folder/new"),
                            Record("deleted", "old")));
    EXPECT_THAT(statesIn(repository.path(), {"folder"}),
                ElementsAre(Record("clean", "folder/kept"), Record("added", "folder/new")));
    EXPECT_THAT(statesIn(repository.path(), {"old"}), ElementsAre(Record("deleted", "old")));
}

TEST_F(ShellStatus, WritesOneLineAFileWithATabBetweenStateAndPath)
{
    GitRepository repository = makeRepository();
    repository.write("b", "");
    repository.write("a/a", "");
    repository.commitAll("begin");
    repository.write("c", "");
    const CommandResult result = runIn(repository.path(), {"status"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.output, "unversioned\tc\n");
    EXPECT_EQ(result.errors, "");
    for (const std::string option : {"--all", "-a"})
        EXPECT_EQ(runIn(repository.path(), {"status", option}).output,
                  "clean\ta/a\nclean\tb\nunversioned\tc\n");
}

TEST_F(ShellStatus, WritesNulInsteadOfTheLineFeedWhenAskedTo)
{
    const GitRepository repository = makeRepository();
    repository.write("a", "");
    repository.write("b", "");
    const std::string expected("unversioned\ta\0unversioned\tb\0", 28);
    EXPECT_EQ(runIn(repository.path(), {"status", "-z"}).output, expected);
}

TEST_F(ShellStatus, ListsInTheOrderOfTheElementsOfPaths)
{
    const GitRepository repository = makeRepository();
    for (const std::string name : {"a-b/x", "a/x", "a.txt", "a/b/c", "b"})
        repository.write(name, "");
    EXPECT_EQ(runIn(repository.path(), {"status"}).output,
              "unversioned\ta/b/c\nunversioned\ta/x\nunversioned\ta-b/x\nunversioned\ta.txt\n"
              "unversioned\tb\n");
}

TEST_F(ShellStatus, WritesNothingForAnEmptyWorkingCopy)
{
    const CommandResult result = runIn(makeRepository().path(), {"status"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.errors, "");
}

TEST_F(ShellStatus, ShowsTheWholeWorkingCopyFromAnyFolderInsideIt)
{
    const GitRepository repository = makeRepository();
    repository.write("top", "");
    repository.write("a/b/deep", "");
    EXPECT_THAT(statesIn(repository / "a/b"),
                ElementsAre(Record("unversioned", "deep"), Record("unversioned", "../../top")));
    EXPECT_THAT(
        statesIn(repository / ".git/refs"),
        ElementsAre(Record("unversioned", "../../a/b/deep"), Record("unversioned", "../../top")));
}

TEST_F(ShellStatus, ShowsOnlyWhatIsNamed)
{
    const GitRepository repository = makeRepository();
    for (const std::string name : {"a/b/deep", "a/near", "other/file", "top", "bottom"})
        repository.write(name, "");
    EXPECT_THAT(statesIn(repository.path(), {"top"}), ElementsAre(Record("unversioned", "top")));
    EXPECT_THAT(statesIn(repository.path(), {"top", "a"}),
                ElementsAre(Record("unversioned", "a/b/deep"), Record("unversioned", "a/near"),
                            Record("unversioned", "top")));
    EXPECT_THAT(statesIn(repository.path(), {"a/b/", "other", "bottom"}),
                ElementsAre(Record("unversioned", "a/b/deep"), Record("unversioned", "bottom"),
                            Record("unversioned", "other/file")));
    EXPECT_EQ(statesIn(repository.path(), {"."}).size(), 5U);
}

TEST_F(ShellStatus, TakesANameTwiceForOnce)
{
    const GitRepository repository = makeRepository();
    repository.write("a/file", "");
    EXPECT_THAT(statesIn(repository.path(), {"a", "a/file", "a/file", "."}),
                ElementsAre(Record("unversioned", "a/file")));
}

TEST_F(ShellStatus, TakesNamesFromWhereItIsToWork)
{
    const GitRepository repository = makeRepository();
    for (const std::string name : {"a/b/deep", "a/near", "top"})
        repository.write(name, "");
    EXPECT_THAT(statesIn(repository / "a/b", {"../near"}),
                ElementsAre(Record("unversioned", "../near")));
    EXPECT_THAT(statesIn(repository / "a", {(repository / "a/near").string()}),
                ElementsAre(Record("unversioned", "near")));
    for (const std::vector<std::string> &arguments :
         {std::vector<std::string>{"-C", "repository/a", "status", "near"},
          {"-C", (repository / "a").string(), "status", "near"},
          {"-C", "repository", "-C", "a", "-C", "", "status", "near"}})
    {
        const CommandResult result = shell(arguments).run();
        EXPECT_EQ(result.exitStatus, 0);
        EXPECT_EQ(result.output, "unversioned\tnear\n");
    }
}

TEST_F(ShellStatus, ShowsMissingFilesByNameAndBelowAMissingFolder)
{
    GitRepository repository = makeRepository();
    for (const std::string name : {"gone/a", "gone/b", "single", "here"})
        repository.write(name, "");
    repository.commitAll("begin");
    repository.remove("gone");
    repository.remove("single");
    EXPECT_THAT(statesIn(repository.path(), {"gone", "single"}),
                ElementsAre(Record("missing", "gone/a"), Record("missing", "gone/b"),
                            Record("missing", "single")));
    EXPECT_EQ(statesIn(repository.path(), {"gone/"}).size(), 2U);
    EXPECT_THAT(statesIn(repository.path(), {"gone/b"}), ElementsAre(Record("missing", "gone/b")));
}

TEST_F(ShellStatus, NamesCanBePastedIntoTheNextCommand)
{
    const GitRepository repository = makeRepository();
    for (const std::string name : {"a/b/deep", "a b/near", "top", "a/b2"})
        repository.write(name, "");
    for (const std::string place : {"a/b", "a", "a b"})
    {
        repository.git({"reset", "--quiet"});
        for (const auto &[state, name] : statesIn(repository / place))
            EXPECT_EQ(runIn(repository / place, {"add", name}).errors, "") << name;
        EXPECT_EQ(split(repository.git({"ls-files", "-z"}), '\0').size(), 4U) << place;
    }
}

/// More than ten are looked up in the states of the whole working copy.
TEST_F(ShellStatus, ShowsManyNamesAsEachByItself)
{
    GitRepository repository = makeRepository();
    std::vector<std::string> names{"new", "before", "gone", "unversioned"};
    for (int number = 0; number < 10; ++number)
    {
        names.push_back("file" + std::to_string(number));
        repository.write(names.back(), "");
    }
    repository.write("gone/a", "");
    repository.write("gone/b", "");
    repository.write("old", "a text that is long enough to be found again\n");
    repository.write("before", "another text, which is long enough as well\n");
    repository.commitAll("begin");
    repository.git({"mv", "old", "new"});
    repository.git({"mv", "before", "after"});
    repository.remove("gone");
    repository.write("file0", "changed");
    repository.remove("file1");
    repository.git({"rm", "--quiet", "file2"});
    repository.write("unversioned", "");
    Records each;
    for (const auto &name : names)
    {
        const auto one = statesIn(repository.path(), {name});
        each.insert(each.end(), one.begin(), one.end());
    }
    ASSERT_EQ(each.size(), names.size() + 1);
    EXPECT_THAT(statesIn(repository.path(), names), testing::UnorderedElementsAreArray(each));
    names.emplace_back("nothing");
    names.insert(names.begin(), "status");
    const CommandResult refused = runIn(repository.path(), names);
    EXPECT_EQ(refused.exitStatus, 1);
    EXPECT_EQ(refused.errors, "vclink-shell: Not every name is known:\n"
                              "  nothing: there is no such file\n");
}

TEST_F(ShellStatus, FailsForNamesThatNoFileHas)
{
    const GitRepository repository = makeRepository();
    repository.write("new", "");
    const CommandResult result =
        runIn(repository.path(), {"status", "new", "nothing", "/etc/passwd", "new/below"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.errors, "vclink-shell: Not every name is known:\n"
                             "  nothing: there is no such file\n"
                             "  /etc/passwd: it lies outside the working copy " +
                                 repository.path().string() +
                                 "\n"
                                 "  new/below: there is no such file\n");
}

TEST_F(ShellStatus, ShowsNothingForIgnoredFilesAndEmptyFolders)
{
    const GitRepository repository = makeRepository();
    repository.write(".gitignore", "ignored\n");
    repository.write("ignored", "");
    std::filesystem::create_directory(repository / "empty");
    EXPECT_THAT(statesIn(repository.path(), {"ignored", "empty"}), IsEmpty());
}

TEST_F(ShellStatus, ShowsASubmoduleAsOneEntry)
{
    GitRepository inner = makeRepository("inner");
    inner.write("file", "");
    inner.commitAll("begin");
    GitRepository repository = makeRepository();
    repository.git({"-c", "protocol.file.allow=always", "submodule", "--quiet", "add",
                    inner.path().string(), "sub"});
    EXPECT_THAT(statesIn(repository.path(), {"sub"}), ElementsAre(Record("added", "sub")));
    repository.commitAll("with a submodule");
    EXPECT_THAT(statesIn(repository.path()),
                ElementsAre(Record("clean", ".gitmodules"), Record("clean", "sub")));
}

TEST_F(ShellStatus, ServesALinkedWorkingTree)
{
    GitRepository repository = makeRepository();
    repository.write("file", "");
    repository.commitAll("begin");
    repository.git({"worktree", "add", "--quiet", "../linked"});
    EXPECT_THAT(statesIn(folder() / "linked"), ElementsAre(Record("clean", "file")));
}

TEST_F(ShellStatus, ShowsALinkItselfAndNotWhereItLeads)
{
    const GitRepository repository = makeRepository();
    repository.write("file", "");
    repository.write("folder/file", "");
    repository.write(".gitignore", "ignored\n");
    repository.symlink("file", "link");
    repository.symlink("folder", "way");
    repository.symlink("/etc", "away");
    repository.symlink("loop", "loop");
    repository.symlink("file", "ignored");
    EXPECT_THAT(statesIn(repository.path(), {"link", "way", "away", "loop", "ignored"}),
                UnorderedElementsAre(Record("unversioned", "link"), Record("unversioned", "way"),
                                     Record("unversioned", "away"), Record("unversioned", "loop")));
    const CommandResult result = runIn(repository.path(), {"status", "link", "way/file", "loop/x"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.errors,
              "vclink-shell: Not every name is known:\n  way/file: Git knows no file "
              "of this name\n  loop/x: Git knows no file of this name\n");
}

TEST_F(ShellStatus, ShowsThousandsOfFilesAsGitDoes)
{
    GitRepository repository = makeRepository();
    for (int number = 0; number < 3000; ++number)
        repository.write("folder" + std::to_string(number % 50) + "/file" + std::to_string(number),
                         "");
    repository.commitAll("begin");
    for (int number = 0; number < 3000; number += 100)
        repository.remove("folder" + std::to_string(number % 50) + "/file" +
                          std::to_string(number));
    EXPECT_EQ(asMap(statesIn(repository.path())), gitStates(repository));
}

} // namespace
} // namespace vclink::test

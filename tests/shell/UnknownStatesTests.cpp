// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"
#include "support/UnprivilegedUser.hpp"

namespace vclink::test
{
namespace
{

using testing::StartsWith;

/// libgit2 can't read the working copy. The back end answers with no states then, which looks like
/// a working copy in which nothing has changed.
class ShellUnknownStates : public ShellMergeFixture
{
  protected:
    static std::string reason()
    {
        return "The states of the files are not known: libgit2 can't read this working copy.";
    }
    void expectUnknown(const std::vector<std::string> &arguments) const
    {
        EXPECT_THAT(refuse(arguments), StartsWith(reason())) << arguments.front();
    }
    /// libgit2 looks a submodule up for each folder that the index has as one.
    void breakGitmodules() const
    {
        repository_.git({"update-index", "--add", "--cacheinfo", "160000," + head() + ",s"});
        repository_.makeFolder("s");
        repository_.write(".gitmodules", "[submodule\n");
    }
};

TEST_F(ShellUnknownStates, AreSaidToBeWhereGitmodulesHasAnError)
{
    repository_.write("a", "edited\n");
    repository_.write("b", "edited\n");
    breakGitmodules();
    expectUnknown({"status"});
    expectUnknown({"status", "."});
    expectUnknown({"revert", "."});
    expectUnknown({"add", "."});
    expectUnknown({"rm", "."});
    expectUnknown({"commit", "-m", "Work"});
}

TEST_F(ShellUnknownStates, HinderNothingThatIsAskedOfSingleFiles)
{
    repository_.write("a", "edited\n");
    repository_.write("b", "edited\n");
    breakGitmodules();
    EXPECT_EQ(run({"status", "a"}).output, "modified\ta\n");
    succeed({"revert", "a"});
    EXPECT_EQ(repository_.read("a"), "a\n");
    EXPECT_EQ(repository_.read("b"), "edited\n");
}

TEST_F(ShellUnknownStates, AreSaidToBeWhereASettingHasAnImpossibleValue)
{
    repository_.write("a", "edited\n");
    repository_.write("new", "");
    repository_.git({"config", "core.ignorecase", "bogus"});
    expectUnknown({"status"});
    expectUnknown({"status", "a"});
    expectUnknown({"status", "folder"});
    expectUnknown({"add", "new"});
    expectUnknown({"rm", "b"});
    expectUnknown({"revert", "a"});
    expectUnknown({"resolved", "a"});
    expectUnknown({"commit", "-m", "Work"});
}

TEST_F(ShellUnknownStates, AreSaidToBeWhereFoldersAreTooDeep)
{
    std::string deep = "deep";
    for (int level = 0; level < 110; ++level)
        deep += "/d";
    repository_.write(deep + "/file", "");
    expectUnknown({"status"});
    expectUnknown({"commit", "-m", "Work"});
}

/// The time of the file is another one than in the index, so libgit2 reads it.
TEST_F(ShellUnknownStates, AreSaidToBeWhereAFileMayNotBeRead)
{
    repository_.write("a", "A\n");
    repository_.setMode("a", 0);
    giveToUnprivilegedUser(repository_.path());
    const std::string errors = runAsUnprivilegedUser([&] { return run({"status"}).errors; });
    EXPECT_THAT(errors, StartsWith("vclink-shell: " + reason()));
    EXPECT_THAT(errors, testing::HasSubstr("a tracked file that you have no\npermission to read"));
}

/// libgit2 has the same answer for a repository without a commit, and reports each file as added.
TEST_F(ShellUnknownStates, AreSaidToBeWhereTheCommitOfHeadCannotBeRead)
{
    const auto check = [this](const std::string &revision)
    {
        const std::string id = repository_.line({"rev-parse", revision});
        const std::string object = ".git/objects/" + id.substr(0, 2) + '/' + id.substr(2);
        const std::string content = repository_.read(object);
        repository_.remove(object);
        EXPECT_NE(repository_.tryGit({"status"}).exitStatus, 0);
        for (const std::vector<std::string> &arguments : {std::vector<std::string>{"status"},
                                                          {"status", "a"},
                                                          {"add", "new"},
                                                          {"rm", "a"},
                                                          {"revert", "a"},
                                                          {"commit", "-m", "Work"}})
        {
            EXPECT_THAT(fail(arguments),
                        testing::HasSubstr("The states of the files are not known: the commit of "
                                           "HEAD, or its tree, can't be read."))
                << arguments.front();
        }
        repository_.write(object, content);
        EXPECT_EQ(run({"status"}).output, "modified\ta\nunversioned\tnew\n");
    };
    repository_.write("a", "edited\n");
    repository_.write("new", "");
    check("HEAD");
    check("HEAD^{tree}");
    repository_.git({"checkout", "--quiet", "--detach"});
    check("HEAD");
}

TEST_F(ShellUnknownStates, AreSaidToBeBeforeTheFirstCommitToo)
{
    const GitRepository young = makeRepository("young");
    young.git({"config", "core.ignorecase", "bogus"});
    const auto errorsOf = [&young, this](const std::vector<std::string> &arguments)
    {
        const CommandResult result = runIn(young.path(), arguments);
        EXPECT_EQ(result.exitStatus, 1) << arguments.front();
        EXPECT_EQ(result.output, "");
        return result.errors;
    };
    young.write("folder/new", "");
    EXPECT_EQ(errorsOf({"status"}),
              "vclink-shell: No file here has a state: either Git ignores all files, or libgit2 "
              "can't read this working copy,\nfor example because a setting has an invalid value. "
              "\"git status\" may say which.\n");
    EXPECT_THAT(errorsOf({"add", "folder/new"}),
                StartsWith("vclink-shell: No file here has a state: "));
    young.git({"config", "--unset", "core.ignorecase"});
    young.add({"folder/new"});
    young.remove("folder/new");
    young.git({"config", "core.ignorecase", "bogus"});
    EXPECT_THAT(errorsOf({"status"}), StartsWith("vclink-shell: " + reason()));
}

/// In an empty repository, and in one in which Git ignores every file.
TEST_F(ShellUnknownStates, AreNotThoseOfAWorkingCopyWithoutFilesForGit)
{
    const GitRepository young = makeRepository("young");
    young.git({"config", "user.name", "A"});
    young.git({"config", "user.email", "a@example.org"});
    const std::string nothing =
        "vclink-shell: Nothing was committed: no tracked file has changed.\n";
    const std::string ignored = ":\n  file: it is ignored by Git\n";
    const struct
    {
        std::vector<std::string> arguments;
        int exitStatus;
        std::string errors;
    } cases[] = {
        {{"status"}, 0, ""},
        {{"status", "--all", "."}, 0, ""},
        {{"add", "--all"}, 0, ""},
        {{"commit", "-m", "Work"}, 1, nothing},
        {{"status", "file"}, 0, ""},
        {{"rm", "file"}, 1, "vclink-shell: Nothing was removed" + ignored},
        {{"revert", "file"}, 1, "vclink-shell: Nothing was reverted" + ignored},
        {{"commit", "--allow-empty", "-m", "Begin"}, 0, ""},
    };
    for (std::size_t index = 0; index < 4; ++index)
        EXPECT_EQ(runIn(young.path(), cases[index].arguments).errors, cases[index].errors) << index;
    young.write(".gitignore", "*\n");
    young.write("file", "");
    for (const auto &[arguments, exitStatus, errors] : cases)
    {
        const CommandResult result = runIn(young.path(), arguments);
        EXPECT_EQ(result.exitStatus, exitStatus) << arguments.front();
        EXPECT_EQ(result.output + result.errors, errors) << arguments.front();
    }
}

TEST_F(ShellUnknownStates, AreNotGuessedWithoutGit)
{
    const GitRepository young = makeRepository("young");
    young.write(".gitignore", "*\n");
    const CommandResult result =
        shell({"status"}).in(young.path()).environment("PATH", "/nowhere").run();
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_THAT(result.errors, StartsWith("vclink-shell: No file here has a state: "));
}

/// A folder in a clone that is laid out as a repository.
class ShellBareFolder : public ShellMergeFixture
{
  protected:
    ShellBareFolder()
    {
        repository_.git({"clone", "--quiet", "--bare", ".", "bare"});
        repository_.makeFolder("folder/inside");
    }
    std::string refusal() const
    {
        return "vclink-shell: " + (repository_ / "bare").string() +
               " is a bare repository inside the working copy " + repository_.path().string() +
               ". If it came with a clone, so did\nits configuration, which can run commands. If "
               "you trust it, use --bare.\n";
    }
};

TEST_F(ShellBareFolder, IsRefusedInAWorkingCopy)
{
    for (const std::vector<std::string> &command :
         {std::vector<std::string>{"current"}, std::vector<std::string>{"merge", "main"},
          std::vector<std::string>{"fetch", "origin"}})
    {
        const CommandResult result = runIn(repository_ / "bare/refs", command);
        EXPECT_EQ(result.exitStatus, 1);
        EXPECT_EQ(result.errors, refusal());
    }
    EXPECT_EQ(run({"-C", "bare", "current"}).errors, refusal());
}

TEST_F(ShellBareFolder, IsTakenWhereThatIsAskedFor)
{
    EXPECT_EQ(run({"--bare", "-C", "bare", "current"}).output, "main\n");
}

TEST_F(ShellBareFolder, IsTakenElsewhere)
{
    std::filesystem::rename(repository_ / "bare", folder() / "bare");
    EXPECT_EQ(runIn(folder() / "bare", {"current"}).output, "main\n");
}

TEST_F(ShellBareFolder, HasNoFilesForCommands)
{
    std::filesystem::rename(repository_ / "bare", folder() / "bare");
    const std::vector<std::string> commands[] = {{"status"},         {"add", "x"},
                                                 {"rm", "x"},        {"resolved", "x"},
                                                 {"revert", "x"},    {"commit", "-m", "Work"},
                                                 {"switch", "main"}, {"merge", "main"}};
    for (const std::vector<std::string> &command : commands)
    {
        const CommandResult result = runIn(folder() / "bare", command);
        EXPECT_EQ(result.exitStatus, 1) << command.front();
        EXPECT_EQ(result.output + result.errors,
                  "vclink-shell: " + (folder() / "bare").string() +
                      " is a bare repository, which has no files. Work in a clone of it.\n");
    }
}

TEST_F(ShellBareFolder, DoesNotHinderWorkingCopies)
{
    EXPECT_EQ(run({"current"}).output, "main\n");
    GitRepository inner = makeRepository("repository/inner");
    inner.write("file", "");
    inner.commitAll("begin");
    EXPECT_EQ(runIn(inner.path(), {"current"}).output, "main\n");
    repository_.git({"worktree", "add", "--quiet", "-b", "second", "linked"});
    EXPECT_EQ(runIn(repository_ / "linked", {"current"}).output, "second\n");
}

} // namespace
} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"

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

TEST_F(ShellUnknownStates, AreNotThoseOfAnEmptyRepositoryOrABareOne)
{
    const GitRepository empty = makeRepository("empty");
    const GitRepository bare(folder() / "bare");
    repository_.git({"clone", "--quiet", "--bare", ".", bare.path()});
    for (const GitRepository &repository : {empty, bare})
    {
        const CommandResult result = runIn(repository.path(), {"status"});
        EXPECT_EQ(result.exitStatus, 0);
        EXPECT_EQ(result.output + result.errors, "");
    }
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

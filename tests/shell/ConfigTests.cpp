// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"
#include "runOnTerminal.hpp"

namespace vclink::test
{
namespace
{

using testing::EndsWith;
using testing::StartsWith;

/// It needs no working copy.
class ShellConfig : public ShellFixture
{
  protected:
    CommandResult run(const std::vector<std::string> &arguments) const
    {
        return runIn(folder().path(), arguments);
    }
    std::string ask(const std::string &key) const
    {
        const CommandResult result =
            Command({"git", "config", "--global", "--get", key}).in(folder().path()).run();
        return result.output;
    }
    void set(const std::string &key, const std::string &value) const
    {
        ASSERT_TRUE(Command({"git", "config", "--global", key, value})
                        .in(folder().path())
                        .run()
                        .succeeded());
    }
    static std::string launcher(const std::string &name)
    {
        const std::filesystem::path bin = std::filesystem::path(VCLINK_SHELL).parent_path();
        return "\"" + (bin / "lnxhost" / name).string() + "\" ";
    }
    std::string show() const
    {
        const TerminalResult result = runOnTerminal(
            {"env", "TERM=xterm", "sh", "-c", "\"$0\" config >/dev/null", VCLINK_SHELL});
        EXPECT_EQ(result.exitStatus, 0);
        return result.text;
    }
};

TEST_F(ShellConfig, ShowsNothingOfWhatIsNotSet)
{
    const CommandResult nothing = run({"config"});
    EXPECT_EQ(nothing.exitStatus, 0);
    EXPECT_EQ(nothing.output, "");
    EXPECT_EQ(nothing.errors, "");
    set("mergetool.vkMerge.cmd", "my tool");
    EXPECT_EQ(run({"config"}).output, "mergetool.vkMerge.cmd\tmy tool\n");
}

TEST_F(ShellConfig, InstallsTheToolsThatComeAlong)
{
    const CommandResult written = run({"config", "--write"});
    EXPECT_EQ(written.exitStatus, 0) << written.errors;
    EXPECT_EQ(written.output, "");
    EXPECT_EQ(written.errors, "");
    const std::string driver = launcher("vkAutoMerge.sh") + "%O %A %B %A\n";
    const std::string merge =
        launcher("vkMerge") + "$PWD/$BASE $PWD/$LOCAL $PWD/$REMOTE $PWD/$MERGED\n";
    const std::string diff = launcher("vkDiff") + "$LOCAL $PWD/$REMOTE\n";
    EXPECT_EQ(ask("merge.vkAutoMerge.driver"), driver);
    EXPECT_EQ(ask("mergetool.vkMerge.cmd"), merge);
    EXPECT_EQ(ask("difftool.vkDiff.cmd"), diff);
    EXPECT_EQ(run({"config"}).output, "merge.vkAutoMerge.driver\t" + driver +
                                          "mergetool.vkMerge.cmd\t" + merge +
                                          "difftool.vkDiff.cmd\t" + diff);
}

TEST_F(ShellConfig, InstallsThemOverWhatStandsThereAndLeavesTheRest)
{
    set("merge.vkAutoMerge.driver", "old");
    set("merge.vkAutoMerge.name", "The tool");
    set("core.editor", "mine");
    EXPECT_EQ(run({"config", "--write"}).exitStatus, 0);
    EXPECT_EQ(ask("merge.vkAutoMerge.driver"), launcher("vkAutoMerge.sh") + "%O %A %B %A\n");
    EXPECT_EQ(ask("merge.vkAutoMerge.name"), "The tool\n");
    EXPECT_EQ(ask("core.editor"), "mine\n");
    const std::string file = GitRepository(environment().home()).read(".gitconfig");
    EXPECT_EQ(run({"config", "--write"}).exitStatus, 0);
    EXPECT_EQ(GitRepository(environment().home()).read(".gitconfig"), file);
}

TEST_F(ShellConfig, ShowsWhatCouldDoSomethingToTheTerminalEscaped)
{
    set("difftool.vkDiff.cmd", "tool\33[2J\tone\ntwo \xFF \"ub\xC3\xBC\"");
    EXPECT_EQ(run({"config"}).output,
              "difftool.vkDiff.cmd\ttool\\033[2J\\tone\\ntwo \\377 \"ub\xC3\xBC\"\n");
}

TEST_F(ShellConfig, NamesTheFileForAPerson)
{
    EXPECT_EQ(show(), "There is no .gitconfig in the home folder.\n");
    set("core.editor", "mine");
    EXPECT_EQ(show(), "Git's configuration of this user: " +
                          (environment().home() / ".gitconfig").string() + "\n");
}

/// libgit2 writes to the first file, git prefers the values in the second one.
TEST_F(ShellConfig, FailsIfGitGoesOnUsingAnotherValue)
{
    const std::string home = environment().home();
    const std::string written = home + "/.config/git/config";
    GitRepository(home).write(".config/git/config", "");
    const CommandResult first = run({"config", "--write"});
    EXPECT_EQ(first.exitStatus, 0) << first.errors;
    EXPECT_EQ(first.errors, "");
    EXPECT_THAT(runOnTerminal({"env", "TERM=xterm", VCLINK_SHELL, "config", "--write"}).text,
                EndsWith("Git's configuration of this user: " + written + "\n"));
    // git config writes to this file if it exists.
    GitRepository(home).write(".gitconfig", "[mergetool \"vkMerge\"]\n\tcmd = old\n");
    const CommandResult result = run({"config", "--write"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.errors, "vclink-shell: mergetool.vkMerge.cmd was written to " + written +
                                 ", but git uses the value in\n" + home +
                                 "/.gitconfig. Remove that one: git config --file " + home +
                                 "/.gitconfig --unset-all mergetool.vkMerge.cmd\n");
    EXPECT_EQ(ask("mergetool.vkMerge.cmd"), "old\n");
    ASSERT_TRUE(Command({"git", "config", "--file", home + "/.gitconfig", "--unset-all",
                         "mergetool.vkMerge.cmd"})
                    .run()
                    .succeeded());
    EXPECT_EQ(run({"config", "--write"}).exitStatus, 0);
}

/// A working copy's own value is intentional.
TEST_F(ShellConfig, InstallsThemWhateverTheWorkingCopyHas)
{
    const GitRepository repository = makeRepository();
    repository.git({"config", "mergetool.vkMerge.cmd", "own"});
    EXPECT_EQ(runIn(repository.path(), {"config", "--write"}).errors, "");
}

TEST_F(ShellConfig, FailsWhereTheFileCannotBeReadOrWritten)
{
    GitRepository(environment().home()).write(".gitconfig", "[core\n");
    for (const std::vector<std::string> &arguments :
         {std::vector<std::string>{"config"}, std::vector<std::string>{"config", "--write"}})
    {
        const CommandResult result = run(arguments);
        EXPECT_EQ(result.exitStatus, 1);
        EXPECT_EQ(result.output, "");
        EXPECT_THAT(result.errors, StartsWith("vclink-shell: Git could not complete"));
    }
    EXPECT_EQ(GitRepository(environment().home()).read(".gitconfig"), "[core\n");
    GitRepository(environment().home()).write(".gitconfig", "");
    GitRepository(environment().home()).write(".gitconfig.lock", "");
    const CommandResult locked = run({"--lang", "de", "config", "--write"});
    EXPECT_EQ(locked.exitStatus, 1);
    EXPECT_THAT(locked.errors,
                StartsWith("vclink-shell: Git konnte den Vorgang nicht abschließen: "));
}

} // namespace
} // namespace vclink::test

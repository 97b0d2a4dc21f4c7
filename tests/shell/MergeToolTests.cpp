// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

const std::string begin = "1\n2\n3\n4\n5\n6\n7\n8\n9\n";
const std::string ours = "ours\n2\n3\n4\n5\n6\n7\n8\n9\n";
const std::string theirs = "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n";
const std::string both = "ours\n2\n3\n4\n5\n6\n7\n8\ntheirs\n";

/// The merge tool that comes along, installed by the program.
class ShellMergeTool : public ShellMergeFixture
{
  protected:
    ShellMergeTool()
    {
        commitFiles({{"text", begin}, {".gitattributes", "text merge=vkAutoMerge\n"}});
        succeed({"config", "--write"});
    }
    void change(const std::string &oursNow, const std::string &theirsNow)
    {
        makeBranch("other", {{"text", theirsNow}});
        commitFiles({{"text", oursNow}});
    }
    CommandResult merge() const
    {
        return run({"--log", "diagnostic", "merge", "other"});
    }
    static std::string tool()
    {
        const std::filesystem::path bin = std::filesystem::path(VCLINK_SHELL).parent_path();
        return (bin / "lnxhost/vkAutoMerge.sh").string();
    }
};

TEST_F(ShellMergeTool, MergesTheFilesThatAreGivenToIt)
{
    change(ours, theirs);
    const GitRepository twin = makeTwin();
    twin.git({"merge", "--quiet", "--no-edit", "other"});
    const CommandResult result = merge();
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_THAT(result.output, StartsWith("Merge commit "));
    EXPECT_THAT(result.errors, HasSubstr("Command: \"" + tool() + "\" "));
    EXPECT_EQ(repository_.read("text"), both);
    EXPECT_EQ(describe(repository_), describe(twin));
}

TEST_F(ShellMergeTool, HasNoPartInFilesThatAreNotGivenToIt)
{
    commitFiles({{".gitattributes", "other merge=vkAutoMerge\n"}});
    change(ours, theirs);
    const CommandResult result = merge();
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_THAT(result.errors, Not(HasSubstr("Command: ")));
    EXPECT_EQ(repository_.read("text"), both);
}

TEST_F(ShellMergeTool, LeavesAConflictThatItCannotMerge)
{
    change("ours\n", "theirs\n");
    const CommandResult result = merge();
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_THAT(result.errors, HasSubstr("Command: \"" + tool() + "\" "));
    EXPECT_THAT(result.errors, HasSubstr("vclink-shell: These files are in conflict:\n  text\n"));
    EXPECT_THAT(repository_.read("text"), HasSubstr("<<<<<<<"));
    EXPECT_EQ(letters().at("text"), "UU");
    repository_.write("text", "both\n");
    succeed({"resolved", "text"});
    succeed({"commit", "-m", "Merge"});
    EXPECT_EQ(repository_.git({"show", "HEAD:text"}), "both\n");
}

TEST_F(ShellMergeTool, FailsTheMergeWhenItCannotBeStarted)
{
    change(ours, theirs);
    repository_.git({"config", "merge.vkAutoMerge.driver", "/nowhere/tool %O %A %B"});
    const std::string before = head();
    const std::string errors = fail({"merge", "other"});
    EXPECT_THAT(errors, StartsWith("vclink-shell: \"other\" could not be merged into the current "
                                   "branch.\n"));
    EXPECT_THAT(errors, Not(HasSubstr("in conflict")));
    EXPECT_THAT(errors, HasSubstr("\nvclink-shell: The merge command can't be started: "
                                  "'/nowhere/tool' is no program. Correct the setting "
                                  "merge.vkAutoMerge.driver: /nowhere/tool %O %A %B\n"
                                  "vclink-shell: It merges these files:\n  text\n"));
    EXPECT_EQ(head(), before);
    EXPECT_EQ(state(), "Normal\n");
    EXPECT_TRUE(std::filesystem::is_empty(environment().temporary()));
}

TEST_F(ShellMergeTool, ServesGitsMergeToolAndDiffTool)
{
    commitFiles({{".gitattributes", "text merge=binary\n"}});
    change(ours, theirs);
    fail({"merge", "other"});
    repository_.git({"mergetool", "--no-prompt", "--tool=vkMerge", "text"});
    EXPECT_EQ(repository_.read("text"), both);
    EXPECT_THAT(
        repository_.git({"difftool", "--no-prompt", "--tool=vkDiff", "main~1", "--", "text"}),
        HasSubstr("\n-1\n+ours\n"));
}

/// The tools as git calls them, for files whose names have blanks.
class ShellGitTools : public ShellMergeTool
{
  protected:
    ShellGitTools()
    {
        commitFiles({{name, begin}, {".gitattributes", "*.txt merge=binary\n"}});
    }
    /// What git difftool shows of a line that was "1".
    std::string difference(std::vector<std::string> arguments) const
    {
        const std::vector<std::string> command{"difftool", "--no-prompt", "--trust-exit-code",
                                               "--tool=vkDiff"};
        arguments.insert(arguments.begin(), command.begin(), command.end());
        return repository_.git(arguments);
    }

    const std::string name = "a folder/with a file.txt";
};

TEST_F(ShellGitTools, CompareTwoCommits)
{
    commitFiles({{name, ours}, {"a new one", "new\n"}});
    repository_.remove("b");
    repository_.commitAll("b is gone");
    EXPECT_THAT(difference({"HEAD~2", "HEAD"}),
                testing::AllOf(HasSubstr("\n-1\n+ours\n"), HasSubstr("--- /dev/null\n"),
                               HasSubstr("\n+new\n"), HasSubstr("+++ /dev/null\n")));
}

TEST_F(ShellGitTools, CompareACommitWithTheWorkingCopy)
{
    repository_.write(name, ours);
    EXPECT_THAT(difference({}), HasSubstr("\n-1\n+ours\n"));
    EXPECT_THAT(difference({"HEAD", "--", name}), HasSubstr("\n-1\n+ours\n"));
}

TEST_F(ShellGitTools, CompareFolders)
{
    commitFiles({{name, ours}, {"a new one", "new\n"}});
    const std::string two = difference({"--dir-diff", "HEAD~1", "HEAD"});
    EXPECT_THAT(two, testing::AllOf(HasSubstr("\n-1\n+ours\n"), HasSubstr("\n+new\n")));
    repository_.write(name, theirs);
    EXPECT_THAT(difference({"--dir-diff"}), HasSubstr("\n+theirs\n"));
}

TEST_F(ShellGitTools, Merge)
{
    for (const std::string setting : {"false", "true"})
    {
        repository_.git({"config", "mergetool.writeToTemp", setting});
        makeBranch("other", {{name, theirs}});
        commitFiles({{name, ours}});
        fail({"merge", "other"});
        repository_.git({"mergetool", "--no-prompt", "--tool=vkMerge", name});
        EXPECT_EQ(repository_.read(name), both);
        repository_.git({"reset", "--quiet", "--hard", "HEAD~1"});
        repository_.git({"branch", "--quiet", "-D", "other"});
    }
}

} // namespace
} // namespace vclink::test

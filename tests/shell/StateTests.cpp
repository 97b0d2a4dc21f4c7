// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;
using testing::StartsWith;

class ShellState : public ShellMergeFixture
{
};

TEST_F(ShellState, NamesTheCurrentBranch)
{
    EXPECT_EQ(run({"current"}).output, "main\n");
    repository_.git({"checkout", "--quiet", "-b", "group/quo\"te"});
    EXPECT_EQ(run({"current"}).output, "\"group/quo\\\"te\"\n");
}

TEST_F(ShellState, HasNoCurrentBranchBeforeTheFirstCommitOrOnACommit)
{
    const GitRepository empty = makeRepository("empty");
    const CommandResult unborn = runIn(empty.path(), {"current"});
    EXPECT_EQ(unborn.exitStatus, 1);
    EXPECT_EQ(unborn.output, "");
    EXPECT_EQ(unborn.errors,
              "vclink-shell: There is no current branch: nothing was committed yet.\n");
    EXPECT_EQ(runIn(empty.path(), {"branch", "new"}).errors,
              "vclink-shell: There is no commit yet that a branch could begin at.\n");
    EXPECT_EQ(runIn(empty.path(), {"revert", "."}).errors,
              "vclink-shell: Nothing was reverted:\n  .: it has no files\n");
    repository_.git({"checkout", "--quiet", "--detach"});
    EXPECT_EQ(refuse({"current"}),
              "There is no current branch: HEAD is at a commit, not at a branch.\n");
}

TEST_F(ShellState, ShowsTheIdThatGitGivesARevision)
{
    commitFiles({{"a", "edited\n"}});
    repository_.git({"tag", "-a", "-m", "tagged", "v1"});
    for (const std::string revision :
         {"HEAD", "main", "main~1", "HEAD^", "v1", "v1^{commit}", "HEAD:folder/c", "HEAD:folder",
          "main^{tree}", ":/begin", "@{0}", "refs/heads/main"})
    {
        const CommandResult result = run({"rev", revision});
        EXPECT_EQ(result.exitStatus, 0) << revision << result.errors;
        EXPECT_EQ(result.output, repository_.git({"rev-parse", revision})) << revision;
    }
    EXPECT_EQ(run({"rev", head().substr(0, 8)}).output, head() + '\n');
}

TEST_F(ShellState, ShowsNoIdOfWhatNamesNothing)
{
    EXPECT_EQ(refuse({"rev", "nothing"}), "There is no revision 'nothing'.\n");
    EXPECT_EQ(refuse({"rev", "mian"}), "There is no revision 'mian'. Did you mean 'main'?\n");
    EXPECT_EQ(refuse({"--lang", "de", "rev", "HEAD:nothing"}),
              "Es gibt keine Revision 'HEAD:nothing'.\n");
    for (const std::string revision : {"HEAD~7", "{}", "++"})
        EXPECT_EQ(refuse({"rev", revision}), "There is no revision '" + revision + "'.\n");
    EXPECT_THAT(refuse({"rev", "[a]"}), StartsWith("'[a]' is not a revision. "));
    EXPECT_EQ(refuse({"rev", "main..main"}),
              "'main..main' is not a revision. \"git help revisions\" describes how one is "
              "written; a range is none.\n");
    EXPECT_THAT(refuse({"rev", head().substr(0, 3)}), StartsWith("More than one object has an id"));
}

TEST_F(ShellState, TellsWhichOperationIsUnfinished)
{
    EXPECT_EQ(state(), "Normal\n");
    clash();
    EXPECT_EQ(repository_.tryGit({"merge", "other"}).exitStatus, 1);
    EXPECT_EQ(state(), "Conflicts\n");
    repository_.git({"merge", "--abort"});
    EXPECT_EQ(state(), "Normal\n");
    EXPECT_EQ(repository_.tryGit({"cherry-pick", "other"}).exitStatus, 1);
    EXPECT_EQ(state(), "Conflicts\n");
    repository_.git({"cherry-pick", "--abort"});
    EXPECT_NE(repository_.tryGit({"rebase", "other"}).exitStatus, 0);
    EXPECT_THAT(state(), StartsWith("Rebase"));
    repository_.git({"rebase", "--abort"});
    repository_.git({"bisect", "start"});
    EXPECT_EQ(state(), "Bisecting\n");
}

TEST_F(ShellState, CannotBeToldOutsideAWorkingCopy)
{
    std::filesystem::create_directory(folder() / "plain");
    for (const std::string command : {"state", "current", "branches"})
    {
        const CommandResult result = runIn(folder() / "plain", {command});
        EXPECT_EQ(result.exitStatus, 1) << command;
        EXPECT_THAT(result.errors, HasSubstr("nor any folder above it is a Git working copy"));
    }
}

} // namespace
} // namespace vclink::test

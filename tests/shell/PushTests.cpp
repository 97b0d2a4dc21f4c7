// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellRemoteTest.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;
using testing::StartsWith;

class ShellPush : public ShellRemoteTest
{
  protected:
    ShellPush()
    {
        repository_.write("a", "ours\n");
        commit_ = repository_.commitAll("our work");
    }

    std::string served(const std::string &name) const
    {
        const References all = references(served_);
        const auto found = all.find(name);
        return found == all.end() ? "" : found->second;
    }

    /// A hook of the served repository, a script.
    void makeHook(const std::string &name, const std::string &script) const
    {
        served_.write("hooks/" + name, "#!/bin/sh\n" + script);
        served_.setMode("hooks/" + name, 0755);
    }

    /// A commit on the served branch that is not here.
    void overtake() const
    {
        GitRepository colleague = GitRepository::clone(url_, folder() / "colleague");
        colleague.write("a", "theirs\n");
        colleague.commitAll("their work");
        colleague.git({"push", "--quiet", "origin", "main"});
    }

    std::string commit_;
};

TEST_F(ShellPush, MovesABranchAndRemembersWhereItIs)
{
    succeed({"push", "origin", "refs/heads/main"});
    EXPECT_EQ(served("refs/heads/main"), commit_);
    EXPECT_EQ(references(repository_).at("refs/remotes/origin/main"), commit_);
    EXPECT_EQ(served_.git({"fsck", "--no-progress"}), "");
    succeed({"push", "origin", "refs/heads/main"});
    EXPECT_EQ(served("refs/heads/main"), commit_);
}

TEST_F(ShellPush, MakesAndDeletesBranchesAndTags)
{
    repository_.git({"tag", "v1", "main~1"});
    succeed({"push", "origin", "refs/heads/main:refs/heads/new", "refs/tags/v1",
             "HEAD:refs/heads/ub\xC3\xBC"});
    EXPECT_EQ(served("refs/heads/new"), commit_);
    EXPECT_EQ(served("refs/tags/v1"), repository_.line({"rev-parse", "main~1"}));
    EXPECT_EQ(served("refs/heads/ub\xC3\xBC"), commit_);
    succeed({"push", "origin", ":refs/heads/new", ":refs/tags/v1"});
    EXPECT_EQ(served("refs/heads/new"), "");
    EXPECT_EQ(served("refs/tags/v1"), "");
}

TEST_F(ShellPush, LosesNoCommitsOfOthersUnlessToldTo)
{
    overtake();
    EXPECT_THAT(refuse({"push", "origin", "refs/heads/main"}),
                HasSubstr("contains commits that are not present locally"));
    succeed({"push", "origin", "+refs/heads/main"});
    EXPECT_EQ(served("refs/heads/main"), commit_);
}

TEST_F(ShellPush, NamesWhatTheServerRejectsAndPushesTheRest)
{
    makeHook("update", "case $1 in */main) echo closed; exit 1 ;; esac\n");
    const std::string before = served("refs/heads/main");
    const CommandResult result =
        run({"push", "origin", "refs/heads/main", "refs/heads/main:refs/heads/new"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.errors, "vclink-shell: origin rejected:\n  refs/heads/main: hook declined\n");
    EXPECT_EQ(served("refs/heads/main"), before);
    EXPECT_EQ(served("refs/heads/new"), commit_);
}

TEST_F(ShellPush, NamesAllThatTheServerRejects)
{
    makeHook("pre-receive", "exit 1\n");
    EXPECT_EQ(refuse({"push", "origin", "refs/heads/main", "refs/heads/main:refs/heads/new"}),
              "origin rejected:\n  refs/heads/main: pre-receive hook declined\n"
              "  refs/heads/new: pre-receive hook declined\n");
}

TEST_F(ShellPush, TellsTheServersWordsInTheLogOnly)
{
    makeHook("pre-receive", "echo Not on a Friday; exit 1\n");
    EXPECT_THAT(refuse({"push", "origin", "refs/heads/main"}),
                testing::Not(HasSubstr("Not on a Friday")));
    const std::string log = run({"--log", "parameter", "push", "origin", "refs/heads/main"}).errors;
    EXPECT_THAT(log, HasSubstr("msgStr=Not on a Friday"));
    EXPECT_THAT(log, HasSubstr("[parameter]  refnameStr=refs/heads/main "
                               "statusStr=pre-receive hook declined\n"));
}

TEST_F(ShellPush, TakesWhatIsConfiguredWhereNothingIsNamed)
{
    EXPECT_EQ(refuse({"push", "origin"}),
              "Nothing was pushed: no REFSPEC was given, and remote.origin.push is not set.\n");
    repository_.git({"config", "remote.origin.push", "refs/heads/main:refs/heads/mine"});
    succeed({"push", "origin"});
    EXPECT_EQ(served("refs/heads/mine"), commit_);
}

TEST_F(ShellPush, RefusesWhatIsNoFullNameOrNoCommit)
{
    EXPECT_THAT(refuse({"push", "origin", "main"}), HasSubstr("not a valid reference 'main'"));
    EXPECT_THAT(refuse({"push", "origin", "missing:refs/heads/new"}),
                HasSubstr("src refspec 'missing' does not match any existing object"));
    EXPECT_THAT(refuse({"push", "origin", "main:refs/heads/new"}),
                HasSubstr("no such reference 'main'"));
    EXPECT_THAT(refuse({"push", "nobody", "refs/heads/main"}),
                HasSubstr("remote 'nobody' does not exist"));
}

TEST_F(ShellPush, GoesToAnotherFolderIfThatHasNoFilesOnTheDisk)
{
    const GitRepository bare(folder() / "bare");
    repository_.git({"clone", "--quiet", "--bare", ".", bare.path()});
    repository_.git({"remote", "add", "near", "../bare"});
    EXPECT_EQ(
        runIn(repository_ / "folder", {"push", "near", "refs/heads/main:refs/heads/new"}).errors,
        "");
    EXPECT_EQ(references(bare).at("refs/heads/new"), commit_);

    GitRepository::clone(url_, folder() / "colleague");
    repository_.git({"remote", "add", "colleague", "../colleague"});
    EXPECT_THAT(refuse({"push", "colleague", "refs/heads/main"}), HasSubstr("non-bare"));
}

TEST_F(ShellPush, TellsAPersonThatItIsDone)
{
    EXPECT_EQ(show({"push", "origin", "refs/heads/main"}), "Pushed to origin.\n");
}

TEST_F(ShellPush, TellsItsFailureInTheLanguageThatWasAskedFor)
{
    EXPECT_THAT(refuse({"--lang", "de", "push", "origin", "main"}),
                StartsWith("Git konnte den Vorgang nicht "));
}

} // namespace
} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;
using testing::StartsWith;

/// Commits in the midst of what git does step by step. "other" has three commits, of which the
/// first clashes with the current branch in "a".
class ShellUnfinished : public ShellMergeFixture
{
  protected:
    ShellUnfinished()
    {
        // The author of all commits.
        repository_.git({"config", "user.name", "Test Author"});
        repository_.git({"config", "user.email", "author@example.com"});
        makeBranch("other", {{"a", "theirs\n"}});
        repository_.git({"checkout", "--quiet", "other"});
        commitFiles({{"b", "theirs\n"}});
        commitFiles({{"new", "theirs\n"}});
        repository_.git({"checkout", "--quiet", "main"});
        commitFiles({{"a", "ours\n"}});
    }

    /// Has git begin what stops at a conflict in "a".
    void begin(const std::vector<std::string> &arguments) const
    {
        const CommandResult result = repository_.tryGit(arguments);
        ASSERT_NE(result.exitStatus, 0) << result.errors;
        ASSERT_EQ(letters().count("a"), 1u) << result.output << result.errors;
    }
    /// Expects both kinds of refusal: of the conflict, and once that is resolved.
    void expectRefusedAs(const std::string &name) const
    {
        const std::string reason = "Nothing was committed. " + name + " is under way. Continue ";
        EXPECT_THAT(refuse({"commit", "-m", "Work"}), StartsWith(reason));
        repository_.write("a", "solution\n");
        succeed({"resolved", "a"});
        EXPECT_THAT(refuse({"commit", "-m", "Work"}), StartsWith(reason));
    }
    /// The contents of "a" and "b" at HEAD.
    std::string content() const
    {
        return repository_.git({"show", "HEAD:a"}) + repository_.git({"show", "HEAD:b"});
    }
};

TEST_F(ShellUnfinished, RebasesAreNotCutShort)
{
    repository_.git({"checkout", "--quiet", "other"});
    begin({"rebase", "main"});
    EXPECT_EQ(refuse({"commit", "-m", "Work"}),
              "Nothing was committed. A rebase is under way. Continue it with \"git rebase "
              "--continue\", or undo it with \"git rebase --abort\".\nA commit would end it, and "
              "lose its other steps. To commit nevertheless, use --as-is.\n");
    expectRefusedAs("A rebase");
    repository_.git({"-c", "core.editor=true", "rebase", "--continue"});
    EXPECT_EQ(content(), "solution\ntheirs\n");
    EXPECT_EQ(state(), "Normal\n");
}

TEST_F(ShellUnfinished, RebasesOfEachKindAreKnown)
{
    repository_.git({"checkout", "--quiet", "other"});
    for (const std::vector<std::string> &rebase :
         {std::vector<std::string>{"rebase", "--apply", "main"},
          std::vector<std::string>{"-c", "sequence.editor=true", "rebase", "-i", "main"},
          std::vector<std::string>{"rebase", "--merge", "main"}})
    {
        begin(rebase);
        expectRefusedAs("A rebase");
        repository_.git({"rebase", "--abort"});
    }
}

TEST_F(ShellUnfinished, MailboxesAreNotCutShort)
{
    const std::string mailbox = folder() / "mailbox";
    repository_.git({"format-patch", "--output=" + mailbox, "main..other"});
    EXPECT_NE(repository_.tryGit({"am", "--quiet", mailbox}).exitStatus, 0);
    EXPECT_THAT(refuse({"commit", "-m", "Work"}),
                StartsWith("Nothing was committed. Patches are being applied. "));
}

TEST_F(ShellUnfinished, BisectionsAreNotEnded)
{
    repository_.git({"bisect", "start"});
    repository_.write("b", "edited\n");
    EXPECT_THAT(refuse({"commit", "-m", "Work"}), HasSubstr(". A bisection is under way. "));
}

TEST_F(ShellUnfinished, SeriesOfPicksAreNotCutShort)
{
    begin({"cherry-pick", "main..other"});
    expectRefusedAs("A series of picked or reverted commits");
    repository_.git({"-c", "core.editor=true", "cherry-pick", "--continue"});
    EXPECT_EQ(content(), "solution\ntheirs\n");
}

TEST_F(ShellUnfinished, SeriesOfRevertsAreNotCutShort)
{
    commitFiles({{"a", "edited\n"}});
    begin({"revert", "--no-edit", "HEAD~1", "HEAD~2"});
    expectRefusedAs("A series of picked or reverted commits");
}

/// git takes the state of the one commit away, the back end says "Normal".
TEST_F(ShellUnfinished, CommitsBetweenTwoPicksKeepTheOthers)
{
    begin({"cherry-pick", "main..other"});
    repository_.write("a", "solution\n");
    repository_.git({"commit", "--quiet", "--all", "--message=picked"});
    ASSERT_EQ(state(), "Normal\n");
    EXPECT_THAT(refuse({"switch", "other"}), HasSubstr("A series of picked"));
    repository_.write("a", "edited\n");
    succeed({"commit", "-m", "Work"});
    repository_.git({"cherry-pick", "--continue"});
    EXPECT_EQ(content(), "edited\ntheirs\n");
    EXPECT_EQ(repository_.git({"show", "HEAD:new"}), "theirs\n");
}

TEST_F(ShellUnfinished, SeriesAreKnownInALinkedWorkingCopy)
{
    const GitRepository linked(folder() / "linked");
    repository_.git({"worktree", "add", "--quiet", "-b", "second", linked.path()});
    EXPECT_NE(linked.tryGit({"cherry-pick", "main..other"}).exitStatus, 0);
    const CommandResult result = runIn(linked.path(), {"commit", "-m", "Work"});
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_THAT(result.errors, HasSubstr("A series of picked"));
    EXPECT_EQ(linked.line({"log", "-1", "--format=%s"}), "work");
    repository_.write("b", "edited\n");
    succeed({"commit", "-m", "Not of the other's concern"});
}

TEST_F(ShellUnfinished, OneCommitThatIsPickedCanBeCommitted)
{
    begin({"cherry-pick", "other~2"});
    repository_.write("a", "solution\n");
    succeed({"resolved", "a"});
    succeed({"commit", "-m", "Picked"});
    EXPECT_EQ(repository_.line({"log", "-1", "--format=%s"}), "Picked");
    EXPECT_EQ(state(), "Normal\n");
}

/// git keeps the author of a commit that is picked, the back end does not.
TEST_F(ShellUnfinished, ACommitOfAnotherAuthorIsNotCommittedAsOnesOwn)
{
    repository_.git({"checkout", "--quiet", "other~2"});
    repository_.git({"commit", "--quiet", "--amend", "--no-edit", "--author=Else <else@x.org>"});
    repository_.git({"branch", "elses"});
    repository_.git({"checkout", "--quiet", "main"});
    begin({"cherry-pick", "elses"});
    repository_.write("a", "solution\n");
    succeed({"resolved", "a"});
    const std::string advice =
        "A commit of another author is being picked. Conclude it with \"git commit\", which keeps "
        "the author, or\nundo it with \"git cherry-pick --abort\".";
    EXPECT_EQ(refuse({"commit", "-m", "Picked"}),
              "Nothing was committed. " + advice +
                  "\nTo commit it under your own name, use --as-is.\n");
    EXPECT_EQ(refuse({"switch", "other"}), "Nothing was switched. " + advice + '\n');
    const GitRepository twin = makeTwin();
    twin.git({"commit", "--quiet", "--no-edit"});
    EXPECT_EQ(twin.line({"log", "-1", "--format=%an"}), "Else");
    succeed({"commit", "--as-is", "-m", "Picked"});
    EXPECT_NE(repository_.line({"log", "-1", "--format=%an"}), "Else");
}

/// git leaves out signs at the ends of a name when it writes a commit.
TEST_F(ShellUnfinished, ACommitOfOnesOwnWithAnOddNameCanBeCommitted)
{
    repository_.git({"config", "user.name", " J. Jr., "});
    repository_.git({"config", "author.name", "Ignored here"});
    repository_.git({"checkout", "--quiet", "other~2"});
    repository_.git(
        {"-c", "author.name=", "commit", "--quiet", "--amend", "--no-edit", "--reset-author"});
    repository_.git({"branch", "own"});
    repository_.git({"checkout", "--quiet", "main"});
    begin({"cherry-pick", "own"});
    repository_.write("a", "solution\n");
    succeed({"resolved", "a"});
    succeed({"commit", "-m", "Picked"});
}

TEST_F(ShellUnfinished, TheLastOfASeriesCanBeCommitted)
{
    begin({"cherry-pick", "other~1", "other~2"});
    repository_.write("a", "solution\n");
    succeed({"resolved", "a"});
    succeed({"commit", "-m", "Picked"});
    EXPECT_EQ(content(), "solution\ntheirs\n");
    EXPECT_NE(
        repository_.tryGit({"-c", "core.editor=true", "cherry-pick", "--continue"}).exitStatus, 0);
}

TEST_F(ShellUnfinished, WhatIsUnderWayEndsWhereThatIsAskedFor)
{
    begin({"cherry-pick", "main..other"});
    succeed({"commit", "--as-is", "-m", "As it is"});
    EXPECT_EQ(repository_.line({"log", "-1", "--format=%s"}), "As it is");
    EXPECT_THAT(repository_.git({"show", "HEAD:a"}), HasSubstr("<<<<<<<"));
    EXPECT_NE(
        repository_.tryGit({"-c", "core.editor=true", "cherry-pick", "--continue"}).exitStatus, 0);
    repository_.git({"checkout", "--quiet", "other"});
    begin({"rebase", "main"});
    succeed({"commit", "--as-is", "-m", "Of a rebase"});
    EXPECT_EQ(state(), "Normal\n");
}

} // namespace
} // namespace vclink::test

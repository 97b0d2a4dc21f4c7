// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"
#include "runOnTerminal.hpp"

namespace vclink::test
{
namespace
{

using testing::EndsWith;
using testing::HasSubstr;
using testing::StartsWith;

class ShellSwitch : public ShellMergeFixture
{
  protected:
    ShellSwitch()
    {
        makeBranch("other", {{"a", "theirs\n"}, {"new", "theirs\n"}});
    }
    std::string current() const
    {
        return repository_.line({"symbolic-ref", "HEAD"});
    }
};

TEST_F(ShellSwitch, PutsTheFilesOfABranchOnTheDiskAndMakesItTheCurrentOne)
{
    const GitRepository twin = makeTwin();
    succeed({"switch", "other"});
    twin.git({"checkout", "--quiet", "other"});
    EXPECT_EQ(current(), "refs/heads/other");
    EXPECT_EQ(describe(repository_), describe(twin));
    succeed({"switch", "main"});
    EXPECT_EQ(current(), "refs/heads/main");
    EXPECT_FALSE(std::filesystem::exists(repository_ / "new"));
}

TEST_F(ShellSwitch, KeepsChangesOfFilesThatTheBranchDoesNotTouch)
{
    repository_.write("b", "edited\n");
    repository_.remove("folder/c");
    succeed({"switch", "other"});
    EXPECT_EQ(current(), "refs/heads/other");
    EXPECT_EQ(repository_.read("b"), "edited\n");
    EXPECT_EQ(letters().at("folder/c"), " D");
}

TEST_F(ShellSwitch, ChangesNothingWhereAChangeIsInTheWay)
{
    repository_.write("a", "edited\n");
    repository_.write("folder/mine", "");
    EXPECT_EQ(refuse({"switch", "other"}),
              "These files have uncommitted changes, and differ on that branch:\n  a\nNothing was "
              "switched. Commit the changes or revert them, move untracked files out of the way, "
              "and\nswitch again.\n");
    EXPECT_THAT(refuse({"--lang", "de", "switch", "other"}),
                StartsWith("Diese Dateien haben \xC3\x84nderungen ohne Commit und unterscheiden "));
    EXPECT_EQ(current(), "refs/heads/main");
}

TEST_F(ShellSwitch, GoesToLocalBranchesOnly)
{
    repository_.git({"tag", "v1"});
    for (const std::string name : {"nothing", "v1", "HEAD", "refs/heads/other", "other~0"})
        EXPECT_THAT(refuse({"switch", name}), StartsWith("There is no branch '" + name + "'."));
    EXPECT_EQ(refuse({"switch", "v1"}),
              "There is no branch 'v1'. Use \"git switch --detach v1\".\n");
    EXPECT_EQ(refuse({"switch", "othre"}), "There is no branch 'othre'. Did you mean 'other'?\n");
    repository_.git({"update-ref", "refs/remotes/origin/topic", "main"});
    EXPECT_EQ(refuse({"switch", "topic"}),
              "There is no branch 'topic'. Make it from origin/topic with \"vclink-shell branch "
              "topic origin/topic\".\n");
}

TEST_F(ShellSwitch, NamesUntrackedFilesInItsWay)
{
    repository_.git({"checkout", "--quiet", "other"});
    repository_.write("fresh/file", "theirs\n");
    repository_.commitAll("new");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.write("fresh/file", "mine\n");
    EXPECT_THAT(refuse({"switch", "other"}),
                HasSubstr("and that branch has something in their place:\n  fresh/file\n"));
    repository_.remove("fresh");
    repository_.write("fresh", "mine\n");
    EXPECT_THAT(refuse({"switch", "other"}), HasSubstr("in their place:\n  fresh\n"));
}

TEST_F(ShellSwitch, NamesTheMergeThatIsInItsWay)
{
    repository_.write("a", "ours\n");
    repository_.commitAll("ours");
    repository_.tryGit({"merge", "--quiet", "other"});
    EXPECT_EQ(refuse({"switch", "other"}),
              "Nothing was switched. A merge is under way. Conclude it with \"vclink-shell "
              "commit\", or undo it with \"git merge --abort\".\n");
}

TEST_F(ShellSwitch, NamesTheWorkingCopyThatHasTheBranch)
{
    const std::string place = (folder() / "linked").string();
    repository_.git({"worktree", "add", "--quiet", place, "other"});
    EXPECT_EQ(refuse({"switch", "other"}),
              "Nothing was switched: 'other' is checked out in the working copy " + place +
                  ".\nWork there, or switch to another branch there first.\n");
    EXPECT_EQ(runIn(place, {"switch", "main"}).errors,
              "vclink-shell: Nothing was switched: 'main' is checked out in the working copy " +
                  repository_.path().string() +
                  ".\nWork there, or switch to another branch there first.\n");
    std::filesystem::rename(place, folder() / "away");
    EXPECT_EQ(refuse({"switch", "other"}),
              "The branch 'other' is checked out in the working copy " + place +
                  ", whose folder is missing.\nIf it is gone for good, use \"git worktree prune\" "
                  "first.\n");
    repository_.git({"worktree", "prune"});
    succeed({"switch", "other"});
}

TEST_F(ShellSwitch, TakesTheBranchOfABareRepository)
{
    const std::string bare = (folder() / "bare/.git").string();
    const std::string linked = (folder() / "linked").string();
    repository_.git({"clone", "--quiet", "--bare", ".", bare});
    repository_.git({"--git-dir", bare, "worktree", "add", "--quiet", "-b", "mine", linked});
    EXPECT_EQ(runIn(linked, {"switch", "main"}).exitStatus, 0);
}

TEST_F(ShellSwitch, GoesBackToThePreviousBranch)
{
    succeed({"switch", "other"});
    for (const std::string name : {"main", "other"})
    {
        succeed({"switch", "-"});
        EXPECT_EQ(current(), "refs/heads/" + name);
    }
    EXPECT_EQ(runIn(makeRepository("young").path(), {"switch", "-"}).errors,
              "vclink-shell: There was no other current branch before.\n");
}

TEST_F(ShellSwitch, GoesToABranchWhateverItsName)
{
    for (const std::string name : {"{}", "++", "a,b", "quo\"te", "ub\xC3\xBC", "#hash", "a'b$(c"})
    {
        repository_.git({"update-ref", "refs/heads/" + name, "refs/heads/other"});
        succeed({"switch", name});
        EXPECT_EQ(current(), "refs/heads/" + name);
        EXPECT_EQ(repository_.read("a"), "theirs\n");
        succeed({"switch", "main"});
    }
}

TEST_F(ShellSwitch, RefusesABranchWhoseFilesWouldBeThoseOfATag)
{
    repository_.git({"tag", "other", "main"});
    EXPECT_EQ(refuse({"switch", "other"}),
              "Nothing was switched: there is also a tag other, and its files would be written "
              "instead of the\nbranch's. Rename the tag or the branch first.\n");
    repository_.git({"tag", "--force", "-a", "-m", "same", "other", "refs/heads/other"});
    succeed({"switch", "other"});
    EXPECT_EQ(repository_.read("a"), "theirs\n");
}

TEST_F(ShellSwitch, RefusesABranchWhoseNameMeansSomethingElse)
{
    const std::string id = repository_.line({"rev-parse", "main"});
    repository_.git({"fetch", "--quiet", ".", "main"});
    repository_.write("a", "put aside\n");
    repository_.git({"stash"});
    for (const std::string &name :
         {std::string("HEAD"), id, std::string("FETCH_HEAD"), std::string("stash")})
    {
        repository_.git({"update-ref", "refs/heads/" + name, "refs/heads/other"});
        EXPECT_EQ(refuse({"switch", name}),
                  "Nothing was switched: '" + name +
                      "' also means something else here, and its files would be written instead of "
                      "the\nbranch's. Use \"git switch " +
                      name + "\", or rename the branch.\n");
        const GitRepository twin(folder() / ("twin " + name));
        std::filesystem::copy(repository_.path(), twin.path(),
                              std::filesystem::copy_options::recursive);
        twin.git({"switch", "--quiet", name});
        EXPECT_EQ(twin.line({"symbolic-ref", "HEAD"}), "refs/heads/" + name);
        EXPECT_EQ(twin.read("a"), "theirs\n");
        repository_.git({"update-ref", "-d", "refs/heads/" + name});
    }
}

TEST_F(ShellSwitch, ShowsItsProgress)
{
    const CommandResult result = run({"--progress", "always", "switch", "other"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_THAT(result.errors, HasSubstr("Checking out "));
    EXPECT_THAT(result.errors, EndsWith("\r\33[K"));
}

TEST_F(ShellSwitch, TellsAPersonWhichBranchIsTheCurrentOne)
{
    const TerminalResult result = runOnTerminal(
        {"env", "TERM=dumb", VCLINK_SHELL, "-C", repository_.path(), "switch", "other"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.text, "The current branch is other.\n");
}

/// A branch that changes many files, so that there is time for Ctrl-C.
class ShellInterruptOfBranches : public ShellMergeFixture
{
  protected:
    static constexpr int fileCount = 1000;

    ShellInterruptOfBranches()
    {
        write("begin\n");
        repository_.commitAll("many");
        repository_.git({"checkout", "--quiet", "-b", "other"});
        write("theirs\n");
        repository_.commitAll("all changed");
        repository_.git({"checkout", "--quiet", "main"});
    }

    void write(const std::string &text) const
    {
        // Long, so that what is written of each file soon fills the terminal.
        for (int number = 0; number < fileCount; ++number)
            repository_.write("many/" + std::string(150, 'x') + std::to_string(number), text);
    }

    /// A script that runs the program, as "$0", and is interrupted when this has appeared.
    TerminalResult interrupt(const std::string &script, const std::string &sign) const
    {
        const std::string leaks =
            "LSAN_OPTIONS=print_suppressions=0:suppressions=" VCLINK_LEAK_SUPPRESSIONS;
        TerminalProcess process({"env", "TERM=xterm", leaks, "sh", "-c", script, VCLINK_SHELL},
                                repository_.path());
        process.readUntil(sign);
        process.interrupt();
        return process.end();
    }
};

TEST_F(ShellInterruptOfBranches, CancelsASwitchThatHasChangedNothing)
{
    const std::string before = describe(repository_);
    const TerminalResult result =
        interrupt(R"(exec "$0" --log progress switch other)", "Checkout Notify");
    EXPECT_EQ(result.exitStatus, 130) << result.text;
    EXPECT_THAT(result.text, EndsWith("vclink-shell: The operation was cancelled.\n"));
    EXPECT_EQ(repository_.line({"symbolic-ref", "HEAD"}), "refs/heads/main");
    EXPECT_EQ(describe(repository_), before);
    EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/index.lock"));
    succeed({"switch", "other"});
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
}

TEST_F(ShellInterruptOfBranches, ComesTooLateOnceFilesAreWritten)
{
    const TerminalResult result =
        interrupt(R"(exec "$0" --log parameter switch other)", "completed_steps=3 ");
    EXPECT_EQ(result.exitStatus, 0) << result.text;
    EXPECT_THAT(result.text, HasSubstr("Too late to cancel: files are being written.\n"));
    EXPECT_EQ(repository_.line({"symbolic-ref", "HEAD"}), "refs/heads/other");
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
}

TEST_F(ShellInterruptOfBranches, CancelsAMergeThatHasChangedNothing)
{
    commitFiles({{"a", "ours\n"}});
    const std::string before = describe(repository_);
    const TerminalResult result =
        interrupt(R"(exec "$0" --log progress merge other)", "Checkout Notify");
    EXPECT_EQ(result.exitStatus, 130) << result.text;
    EXPECT_THAT(result.text,
                HasSubstr("\nvclink-shell: \"other\" could not be merged into the current "
                          "branch.\n"));
    EXPECT_THAT(result.text, testing::Not(HasSubstr("in conflict")));
    EXPECT_EQ(describe(repository_), before);
    EXPECT_EQ(state(), "Normal\n");
}

} // namespace
} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include <algorithm>

#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"
#include "runOnTerminal.hpp"

namespace vclink::test
{
namespace
{

using testing::ElementsAre;
using testing::StartsWith;

const std::vector<std::string> oddNames{"{}",     "++",         "a,b",       "quo\"te",
                                        "#hash",  "!call",      "group/one", "group/two",
                                        "a'b$(c", "ub\xC3\xBC", "\xFF\xFE",  "%s"};

class ShellBranches : public ShellMergeFixture
{
  protected:
    std::vector<std::string> refs(const std::string &folder) const
    {
        const std::string names =
            repository_.git({"for-each-ref", "--format=%(refname:lstrip=2)", "refs/" + folder});
        return split(names, '\n');
    }
    std::string idOf(const std::string &branch) const
    {
        return repository_.line({"rev-parse", "refs/heads/" + branch});
    }
    void makeOddBranches() const
    {
        for (const auto &name : oddNames)
            repository_.git({"update-ref", "refs/heads/" + name, "HEAD"});
    }
};

std::vector<std::string> sorted(std::vector<std::string> names)
{
    std::sort(names.begin(), names.end());
    return names;
}

TEST_F(ShellBranches, AreListedByTheirShortNames)
{
    repository_.git({"branch", "topic/one"});
    const CommandResult result = run({"branches"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.output, "main\ntopic/one\n");
    EXPECT_EQ(result.errors, "");
}

TEST_F(ShellBranches, AreListedAsGitListsThemWhateverTheirNames)
{
    makeOddBranches();
    const std::string output = run({"branches", "-z"}).output;
    EXPECT_EQ(sorted(split(output, '\0')), sorted(refs("heads")));
    const std::vector<std::string> lines = split(run({"branches"}).output, '\n');
    EXPECT_THAT(lines, testing::Contains("\"quo\\\"te\""));
    EXPECT_THAT(lines, testing::Contains("\"\\377\\376\""));
    EXPECT_THAT(lines, testing::Contains("ub\xC3\xBC"));
}

TEST_F(ShellBranches, OfRemoteRepositoriesAreListedApart)
{
    repository_.git({"branch", "topic"});
    const GitRepository clone = GitRepository::clone(repository_.path(), folder() / "clone");
    EXPECT_EQ(runIn(clone.path(), {"branches"}).output, "main\n");
    EXPECT_EQ(
        sorted(split(runIn(clone.path(), {"branches", "-r"}).output, '\n')),
        sorted(split(clone.git({"for-each-ref", "--format=%(refname:lstrip=2)", "refs/remotes"}),
                     '\n')));
    EXPECT_EQ(run({"branches", "-r"}).output, "");
}

TEST_F(ShellBranches, AreNoneBeforeTheFirstCommit)
{
    const GitRepository empty = makeRepository("empty");
    const CommandResult result = runIn(empty.path(), {"branches"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.output, "");
}

TEST_F(ShellBranches, AreCountedForAPerson)
{
    const auto show = [this]
    {
        return runOnTerminal(
                   {"env", "TERM=xterm", VCLINK_SHELL, "-C", repository_.path(), "branches"})
            .text;
    };
    EXPECT_EQ(show(), "main\n1 branch\n");
    repository_.git({"branch", "topic"});
    EXPECT_EQ(show(), "main\ntopic\n2 branches\n");
}

TEST_F(ShellBranches, AreMadeAtABranchATagOrHead)
{
    const std::string begin = head();
    repository_.git({"tag", "v1"});
    makeBranch("other", {{"a", "theirs\n"}});
    succeed({"branch", "one", "other"});
    succeed({"branch", "two", "v1"});
    succeed({"branch", "three", "HEAD"});
    EXPECT_EQ(idOf("one"), idOf("other"));
    EXPECT_EQ(idOf("two"), begin);
    EXPECT_EQ(idOf("three"), begin);
    succeed({"branch", "four"});
    EXPECT_EQ(idOf("four"), begin);
    EXPECT_EQ(repository_.line({"symbolic-ref", "HEAD"}), "refs/heads/main");
    EXPECT_EQ(repository_.read("a"), "a\n");
}

TEST_F(ShellBranches, AreMadeAndDeletedWhateverTheirNames)
{
    for (const auto &name : {"{}", "++", "a,b", "quo\"te", "a'b$(c", "ub\xC3\xBC", "%s"})
    {
        succeed({"branch", name, "main"});
        EXPECT_EQ(idOf(name), head()) << name;
        succeed({"branch", "-d", name});
    }
    EXPECT_THAT(refs("heads"), ElementsAre("main"));
}

TEST_F(ShellBranches, AreDeletedMergedOrNot)
{
    makeBranch("other", {{"a", "theirs\n"}});
    repository_.git({"branch", "same"});
    const std::string tip = idOf("other");
    const CommandResult result = run({"branch", "-d", "other"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.errors, "Deleted the branch other, which was at " + tip + ".\n");
    succeed({"branch", "same", "-d"});
    EXPECT_THAT(refs("heads"), ElementsAre("main"));
}

/// As in a clone that borrows objects from a repository that is away.
TEST_F(ShellBranches, AreNotDeletedWhereTheirCommitCannotBeRead)
{
    makeBranch("topic", {{"a", "theirs\n"}});
    const std::string tip = idOf("topic");
    repository_.remove(".git/objects/" + tip.substr(0, 2) + '/' + tip.substr(2));
    // libgit2 leaks the reference.
    EXPECT_THAT(fail({"branch", "-d", "topic"}),
                StartsWith("vclink-shell: Nothing was deleted: the commit of 'topic' can't be "
                           "read, so there would be no way back. To\ndelete the branch "
                           "nevertheless, use \"git branch -D topic\".\n"));
    EXPECT_NE(repository_.tryGit({"branch", "-d", "topic"}).exitStatus, 0);
    EXPECT_EQ(repository_.read(".git/refs/heads/topic"), tip + '\n');
    repository_.git({"branch", "-D", "topic"});
    EXPECT_THAT(refs("heads"), ElementsAre("main"));
}

TEST_F(ShellBranches, AreNotMadeAtACommitThatCannotBeRead)
{
    const std::string tip = head();
    repository_.remove(".git/objects/" + tip.substr(0, 2) + '/' + tip.substr(2));
    const std::string refusal = "No branch was made: the commit of '";
    EXPECT_THAT(fail({"branch", "new"}), testing::HasSubstr(refusal + "HEAD' can't be read.\n"));
    EXPECT_THAT(fail({"branch", "new", "main"}),
                testing::HasSubstr(refusal + "main' can't be read.\n"));
    EXPECT_THAT(refs("heads"), ElementsAre("main"));
}

TEST_F(ShellBranches, BeginAtNamesOnlyAndNameTheWayToOtherCommits)
{
    repository_.git({"tag", "-a", "-m", "1", "v1"});
    for (const std::string &start : {head(), std::string("main~0"), std::string("v1")})
    {
        const std::string word = start == "main~0" ? "'main~0'" : start;
        EXPECT_EQ(refuse({"branch", "new", start}),
                  "No branch was made: START must be the name of a branch, or of a tag that is not "
                  "annotated. For any\nother commit, use \"git branch new " +
                      word + "\".\n");
    }
}

TEST_F(ShellBranches, AreNotDeletedWhereAWorkingCopyNeedsThem)
{
    const std::string linked = (folder() / "linked").string();
    repository_.git({"branch", "topic"});
    commitFiles({{"a", "ours\n"}});
    repository_.git({"branch", "free"});
    repository_.git({"worktree", "add", "--quiet", linked, "topic"});
    GitRepository other(linked);
    const std::string inUse = "Nothing was deleted: 'topic' is checked out in the working copy " +
                              linked + ".\nSwitch to another branch there first.\n";
    EXPECT_EQ(refuse({"branch", "-d", "topic"}), inUse);
    other.write("a", "topic\n");
    other.commitAll("topic");
    ASSERT_NE(other.tryGit({"rebase", "main"}).exitStatus, 0);
    ASSERT_NE(other.tryGit({"symbolic-ref", "--quiet", "HEAD"}).exitStatus, 0);
    EXPECT_EQ(refuse({"branch", "-d", "topic"}), inUse);
    const CommandResult own = runIn(linked, {"branch", "-d", "topic"});
    EXPECT_EQ(own.errors,
              "vclink-shell: Nothing was deleted. A rebase is under way. Continue it with \"git "
              "rebase --continue\", or undo it with \"git rebase --abort\".\n");
    EXPECT_THAT(refs("heads"), ElementsAre("free", "main", "topic"));
    EXPECT_EQ(runIn(linked, {"branch", "-d", "free"}).exitStatus, 0);
    std::filesystem::rename(linked, folder() / "away");
    EXPECT_THAT(refuse({"branch", "-d", "topic"}), testing::HasSubstr("whose folder is missing"));
}

TEST_F(ShellBranches, AreRefusedWithTheReasonAndTheWayOut)
{
    repository_.git({"branch", "topic"});
    repository_.git({"branch", "group/one"});
    const std::string cannot = "' can't be the name of a branch. Blanks, control characters, ";
    const struct
    {
        std::vector<std::string> arguments;
        std::string reason;
    } cases[] = {
        {{"branch", "topic", "main"},
         "There is a branch 'topic' already. Choose another name, or use the branch that is "
         "there:\n\"vclink-shell switch topic\".\n"},
        {{"branch", "topic/below"},
         "Git can't have the branches 'topic/below' and 'topic' at a time, as one is like a folder "
         "of the other.\nChoose another name.\n"},
        {{"branch", "group"}, "Git can't have the branches 'group' and 'group/one' at a time"},
        {{"branch", "two words", "main"}, "'two words" + cannot},
        {{"branch", "HEAD"}, "'HEAD" + cannot},
        {{"branch", "--", "-x"}, "'-x" + cannot},
        {{"branch", "-d", "main"},
         "Nothing was deleted: 'main' is the current branch. Switch to another one first.\n"},
    };
    for (const auto &[arguments, reason] : cases)
        EXPECT_THAT(refuse(arguments), StartsWith(reason));
}

TEST_F(ShellBranches, AreNotThereUnderAnotherName)
{
    repository_.git({"tag", "v1"});
    repository_.git({"branch", "topic"});
    EXPECT_EQ(refuse({"branch", "-d", "topci"}),
              "There is no branch 'topci'. Did you mean 'topic'?\n");
    for (const std::string name : {"nothing", "v1", "refs/heads/topic", "-x"})
        EXPECT_EQ(refuse({"branch", "-d", "--", name}), "There is no branch '" + name + "'.\n");
    for (const std::string start : {"nothing", "HEAD^{tree}"})
        EXPECT_EQ(refuse({"branch", "new", start}),
                  "There is no branch and no commit '" + start + "'.\n");
}

TEST_F(ShellBranches, TellTheirFailuresInTheLanguageThatWasAskedFor)
{
    EXPECT_THAT(refuse({"--lang", "de", "branch", "-d", "main"}),
                StartsWith("Nichts wurde gelöscht: 'main' ist der aktuelle Branch. "));
}

} // namespace
} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include "util/repository/workingTrees.hpp"

#include <functional>
#include <optional>
#include <ostream>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/files/runScript.hpp"
#include "main/merge/MergeFixture.hpp"
#include "support/WithoutLeakChecks.hpp"

namespace
{

using namespace vclink::test;

/// What another working tree does with the branch "topic": a script that runs in the main one.
struct TreeCase
{
    const char *sentence;
    const char *script;
    /// whether git refuses a switch to the branch, and its deletion
    bool isSwitchRefused;
    bool isDeletionRefused;
    /// the working tree that asks
    const char *asking = ".";
    /// libgit2 loses memory if it cannot open a working tree
    bool losesMemory = false;
};

void PrintTo(const TreeCase &row, std::ostream *stream)
{
    *stream << row.script;
}

/// "main" and "topic" change the same line of "file".
class OtherWorkingTree : public MergeFixture, public testing::WithParamInterface<TreeCase>
{
  protected:
    OtherWorkingTree()
    {
        diverge(writes("file", "ours\n"), writes("file", "theirs\n"));
        repository_.git({"branch", "free"});
    }

    static bool isRefused(const std::function<void()> &action)
    {
        return failureIfAny(action).has_value();
    }
};

TEST_P(OtherWorkingTree, KeepsItsBranchAsWithGit)
{
    runScript(repository_, GetParam().script);
    const GitRepository asking(repository_ / GetParam().asking);
    const std::string id = asking.line({"rev-parse", "topic"});
    const std::string start = asking.line({"rev-parse", "--abbrev-ref", "HEAD"});
    EXPECT_NE(asking.tryGit({"switch", "topic"}).succeeded(), GetParam().isSwitchRefused);
    asking.git({"switch", "--quiet", start});
    EXPECT_NE(asking.tryGit({"branch", "-D", "topic"}).succeeded(), GetParam().isDeletionRefused);
    asking.git({"update-ref", "refs/heads/topic", id});

    const auto adapter = makeAdapter(std::filesystem::canonical(asking.path()));
    const auto manager = vclink::git::BranchManager::create(*adapter);
    std::optional<WithoutLeakChecks> without;
    if (GetParam().losesMemory)
        without.emplace();
    EXPECT_EQ(isRefused([&] { manager->switchBranch("topic"); }), GetParam().isSwitchRefused);
    manager->switchBranch(start);
    EXPECT_EQ(isRefused([&] { manager->deleteBranch("topic"); }), GetParam().isDeletionRefused);
    manager->deleteBranch("free");
}

const TreeCase treeCases[] = {
    {"ThatHasItCheckedOut", "git worktree add -q ../other topic", true, true},
    {"WhoseFolderIsGone", "git worktree add -q ../other topic; mv ../other ../away", true, true},
    {"ThatIsLockedAndAway",
     "git worktree add -q ../other topic; git worktree lock ../other; mv ../other ../away", true,
     true},
    {"ThatIsForgotten",
     "git worktree add -q ../other topic; mv ../other ../away; git worktree prune", false, false},
    {"WithoutItsPlace", "git worktree add -q ../other topic; : >.git/worktrees/other/gitdir", false,
     false},
    {"ThatHasAnotherBranch", "git worktree add -q -b another ../other topic; rm -r ../other", false,
     false},
    {"ThatRebasesIt", "git worktree add -q ../other topic; cd ../other; ! git rebase main", true,
     true},
    {"ThatRebasesItWithPatches",
     "git worktree add -q ../other topic; cd ../other; ! git rebase --apply main", true, true},
    {"ThatRebasesItAndIsAway",
     "git worktree add -q ../other topic; (cd ../other; ! git rebase main); mv ../other ../away",
     true, true},
    {"ThatBisectsIt",
     "git worktree add -q ../other topic; cd ../other; git bisect start; git bisect bad; "
     "git bisect good main~1; git checkout -q --detach",
     true, true},
    {"WhoseRebaseMovesIt",
     "git worktree add -q -b top ../other topic; cd ../other; "
     "git -c user.name=x -c user.email=x@y commit -q --allow-empty -m top; "
     "GIT_SEQUENCE_EDITOR='sed -i 1s/^pick/edit/' git rebase -q -i --update-refs HEAD~2",
     false, true},
    {"ThatHasItUnderAnotherName",
     "git symbolic-ref refs/heads/alias refs/heads/topic; git worktree add -q --detach ../other; "
     "git -C ../other symbolic-ref HEAD refs/heads/alias",
     true, true},
    {"ThatHasItThroughSeveralNames",
     "git symbolic-ref refs/heads/c refs/heads/topic; "
     "git -c core.preferSymlinkRefs=true symbolic-ref refs/heads/b refs/heads/c; "
     "git symbolic-ref refs/heads/a refs/heads/b; git worktree add -q --detach ../other; "
     "git -C ../other symbolic-ref HEAD refs/heads/a",
     true, true},
    {"ThatIsTheMainOneUnderAnotherName",
     "git symbolic-ref refs/heads/alias refs/heads/topic; "
     "git symbolic-ref HEAD refs/heads/alias; git reset -q --hard; "
     "git worktree add -q -b linked ../other main",
     true, true, "../other"},
    {"WhoseBranchHasTheNameOfAFolder",
     "git branch dir/inside; git worktree add -q --detach ../other; "
     "git -C ../other symbolic-ref HEAD refs/heads/dir",
     false, false},
    {"ThatIsTheMainOne", "git switch -q topic; git worktree add -q -b linked ../other main", true,
     true, "../other"},
    {"ThatIsTheMainOneAndAway",
     "git switch -q topic; git worktree add -q -b linked ../other main; "
     "git config core.worktree ../../away",
     true, true, "../other", true},
    {"ThatIsTheMainOneAndRebasesIt",
     "git switch -q topic; git worktree add -q -b linked ../other main; ! git rebase main", true,
     true, "../other"},
};

INSTANTIATE_TEST_SUITE_P(It, OtherWorkingTree, testing::ValuesIn(treeCases),
                         [](const auto &row) { return row.param.sentence; });

/// Its next commit would have no parents.
TEST_F(OtherWorkingTree, KeepsTheOtherNameOfItsBranchToo)
{
    runScript(repository_, "git symbolic-ref refs/heads/alias refs/heads/topic; "
                           "git worktree add -q --detach ../other; "
                           "git -C ../other symbolic-ref HEAD refs/heads/alias");
    EXPECT_TRUE(isRefused([this] { branches().deleteBranch("alias"); }));
    EXPECT_EQ(repository_.line({"symbolic-ref", "refs/heads/alias"}), "refs/heads/topic");
}

TEST_F(OtherWorkingTree, IsThisOneUnderAnotherName)
{
    runScript(repository_, "git symbolic-ref refs/heads/alias refs/heads/topic; "
                           "git symbolic-ref HEAD refs/heads/alias; git reset -q --hard");
    for (const std::string name : {"alias", "topic"})
        EXPECT_TRUE(isRefused([&] { branches().deleteBranch(name); })) << name;
    EXPECT_EQ(repository_.line({"rev-parse", "HEAD"}), repository_.line({"rev-parse", "topic"}));
}

/// As with git: a bare repository has a HEAD, and no files.
TEST_F(OtherWorkingTree, IsNoBareRepository)
{
    runScript(repository_, "git clone -q --bare . ../bare; cd ../bare; "
                           "git worktree add -q -b linked ../other");
    const auto adapter = makeAdapter(folder() / "other");
    vclink::git::BranchManager::create(*adapter)->switchBranch("main");
}

/// One that cannot be read may have the branch.
TEST_F(OtherWorkingTree, MustBeReadable)
{
    runScript(repository_, "git worktree add -q ../other topic; cd .git/worktrees/other; "
                           "rm HEAD; mkdir HEAD");
    const Failure failure = failureOf([this] { branches().deleteBranch("free"); });
    EXPECT_THAT(failure.text, testing::HasSubstr("worktrees/other/HEAD"));
}

TEST_F(OtherWorkingTree, OfThisOneIsARebaseThatMovesOtherBranches)
{
    runScript(repository_, "git switch -q -c top topic; "
                           "git -c user.name=x -c user.email=x@y commit -q --allow-empty -m top; "
                           "GIT_SEQUENCE_EDITOR='sed -i 1s/^pick/edit/' "
                           "git rebase -q -i --update-refs HEAD~2; ! git branch -D topic");
    EXPECT_THAT(failureOf([this] { branches().deleteBranch("topic"); }).text,
                testing::HasSubstr("which a rebase or bisection needs"));
}

} // namespace

// SPDX-License-Identifier: MIT
#include "util/repository/workingTrees.hpp"

#include <filesystem>
#include <functional>
#include <string>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "fl/i18n/convert.hpp"
#include "main/files/runScript.hpp"
#include "main/merge/MergeFixture.hpp"
#include "vclink/CMAdapter.hpp"

namespace
{

using namespace vclink::test;

/// A HEAD that is a symbolic link to "main", as git makes it for core.preferSymlinkRefs. "topic" is
/// another branch.
class LinkedHead : public MergeFixture
{
  protected:
    LinkedHead()
    {
        diverge(writes("file", "ours\n"), writes("new", "theirs\n"));
        link(repository_, "main");
    }

    static void link(const GitRepository &repository, const std::string &branch)
    {
        repository.git(
            {"-c", "core.preferSymlinkRefs=true", "symbolic-ref", "HEAD", "refs/heads/" + branch});
        const auto head = repository.line({"rev-parse", "--absolute-git-dir"}) + "/HEAD";
        ASSERT_TRUE(std::filesystem::is_symlink(head));
    }

    static Failure refusal(const std::string &action)
    {
        return {GIT_ERROR, GIT_ERROR_REFERENCE,
                "cannot " + action +
                    " while HEAD is a symbolic link to 'refs/heads/main' "
                    "(core.preferSymlinkRefs), which libgit2 would follow: make it a file with "
                    "'git -c core.preferSymlinkRefs=false symbolic-ref HEAD refs/heads/main'"};
    }
};

/// libgit2 would write the name of the other branch into the file of this one.
TEST_F(LinkedHead, RefusesASwitchAndNamesTheWayOut)
{
    const NothingChanges nothing(repository_);
    for (const auto *const branch : {"topic", "main"})
    {
        EXPECT_EQ(failureOf([&] { branches().switchBranch(branch); }), refusal("switch branches"));
    }
}

TEST_F(LinkedHead, AllowsASwitchAsGitAfterTheWayOut)
{
    const GitRepository twin = makeTwin();
    twin.git({"switch", "--quiet", "topic"});
    repository_.git(
        {"-c", "core.preferSymlinkRefs=false", "symbolic-ref", "HEAD", "refs/heads/main"});
    branches().switchBranch("topic");
    EXPECT_EQ(stateOf(repository_).references, stateOf(twin).references);
    EXPECT_EQ(stateOf(repository_).head, stateOf(twin).head);
    EXPECT_EQ(workingTreeOf(repository_), workingTreeOf(twin));
}

TEST_F(LinkedHead, KeepsItsBranchAsGit)
{
    EXPECT_FALSE(makeTwin().tryGit({"branch", "-D", "main"}).succeeded());
    const NothingChanges nothing(repository_);
    EXPECT_EQ(failureOf([this] { branches().deleteBranch("main"); }),
              refusal("delete 'refs/heads/main'"));
}

TEST_F(LinkedHead, AllowsTheDeletionOfOtherBranches)
{
    branches().deleteBranch("topic");
    EXPECT_FALSE(repository_.tryGit({"rev-parse", "--verify", "topic"}).succeeded());
    EXPECT_EQ(repository_.line({"symbolic-ref", "HEAD"}), "refs/heads/main");
}

/// libgit2 follows the link, and so moves the branch, as git does.
TEST_F(LinkedHead, IsKeptByAMerge)
{
    expectCleanAsGit();
    EXPECT_EQ(repository_.line({"symbolic-ref", "HEAD"}), "refs/heads/main");
    EXPECT_TRUE(std::filesystem::is_symlink(repository_ / ".git/HEAD"));
}

TEST_F(LinkedHead, IsKeptByAFastForwardAndACommit)
{
    repository_.git({"reset", "--quiet", "--hard", "main~"});
    merge("topic");
    EXPECT_EQ(idOf("main"), idOf("topic"));
    repository_.write("file", "edited\n");
    static_cast<vclink::CMAdapter &>(*adapter_).commit({}, fl::i18n::utf8_to_ustring("edited"));
    EXPECT_EQ(idOf("main~"), idOf("topic"));
    EXPECT_EQ(repository_.line({"symbolic-ref", "HEAD"}), "refs/heads/main");
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
}

/// One of several working trees has such a HEAD; another one asks for its branch.
class LinkedHeadElsewhere : public LinkedHead
{
  protected:
    /// @param asking the folder of the one that asks
    void expectKept(const std::string &branch, const std::filesystem::path &asking) const
    {
        const GitRepository other(asking);
        EXPECT_FALSE(other.tryGit({"switch", branch}).succeeded());
        EXPECT_FALSE(other.tryGit({"branch", "-D", branch}).succeeded());
        const auto adapter = makeAdapter(std::filesystem::canonical(asking));
        const auto manager = vclink::git::BranchManager::create(*adapter);
        const std::string used = "'refs/heads/" + branch + "', which another working tree has";
        const NothingChanges nothing(other);
        EXPECT_THAT(failureOf([&] { manager->switchBranch(branch); }).text,
                    testing::HasSubstr("cannot switch to " + used));
        EXPECT_THAT(failureOf([&] { manager->deleteBranch(branch); }).text,
                    testing::HasSubstr("cannot delete " + used));
    }
};

TEST_F(LinkedHeadElsewhere, KeepsTheBranchOfTheMainWorkingTree)
{
    repository_.git({"worktree", "add", "--quiet", "../other", "topic"});
    expectKept("main", folder() / "other");
}

/// libgit2 cannot open the main working tree then.
TEST_F(LinkedHeadElsewhere, KeepsAPackedBranchOfTheMainWorkingTree)
{
    repository_.git({"worktree", "add", "--quiet", "../other", "topic"});
    repository_.git({"pack-refs", "--all"});
    expectKept("main", folder() / "other");
}

TEST_F(LinkedHeadElsewhere, KeepsTheBranchOfALinkedWorkingTree)
{
    repository_.git(
        {"-c", "core.preferSymlinkRefs=false", "symbolic-ref", "HEAD", "refs/heads/main"});
    repository_.git({"worktree", "add", "--quiet", "../other", "topic"});
    link(GitRepository(folder() / "other"), "topic");
    expectKept("topic", repository_.path());
}

/// As with git: a bare repository has a HEAD, and no files.
TEST_F(LinkedHeadElsewhere, IsNoneInABareRepository)
{
    runScript(repository_,
              "git clone -q --bare . ../bare; cd ../bare; git worktree add -q -b linked ../other; "
              "git -c core.preferSymlinkRefs=true symbolic-ref HEAD refs/heads/main");
    const auto adapter = makeAdapter(folder() / "other");
    vclink::git::BranchManager::create(*adapter)->switchBranch("main");
}

} // namespace

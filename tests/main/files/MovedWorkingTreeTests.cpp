// SPDX-License-Identifier: MIT
// The folder of the adapter is the working tree, whatever the repository names.
#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CommitFixture.hpp"
#include "main/files/runScript.hpp"
#include "support/strings.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitException.hpp"

namespace
{

using namespace vclink::test;

/// "linked" is a working tree of the repository, on the branch "own".
class MovedWorkingTree : public CommitFixture
{
  protected:
    MovedWorkingTree()
    {
        runScript(repository_, "git worktree add -q -b own ../linked");
    }

    void revertIn(const GitRepository &tree, const std::string &name) const
    {
        makeAdapter(tree.path())->revertFiles({asPath(tree / name)});
    }
    static std::vector<std::string> statusOf(const GitRepository &tree)
    {
        return split(tree.git({"status", "--porcelain"}));
    }

    GitRepository linked_{folder() / "linked"};
};

TEST_F(MovedWorkingTree, OfACopyIsTheCopy)
{
    linked_.write("file", "work\n");
    runScript(repository_, "cp -a ../linked ../copy");
    GitRepository copy(folder() / "copy");
    copy.write("file", "draft\n");
    copy.write("other", "edited\n");
    revertIn(copy, "file");
    EXPECT_EQ(linked_.read("file"), "work\n");
    EXPECT_EQ(statusOf(copy), std::vector<std::string>{" M other"});
    commitIn(copy);
    EXPECT_EQ(copy.git({"show", "HEAD:other"}), "edited\n");
    EXPECT_EQ(statusOf(copy), std::vector<std::string>{});
    EXPECT_EQ(linked_.read("file"), "work\n");
    EXPECT_EQ(linked_.read("other"), "content of other\n");
}

TEST_F(MovedWorkingTree, IsNotWhatStandsInItsOldPlace)
{
    runScript(repository_, "mv ../linked ../moved; mkdir ../linked; echo theirs >../linked/file");
    GitRepository moved(folder() / "moved");
    moved.write("other", "edited\n");
    commitIn(moved);
    EXPECT_EQ(split(moved.git({"show", "--format=", "--name-status", "HEAD"})),
              std::vector<std::string>{"M\tother"});
    moved.write("file", "draft\n");
    revertIn(moved, "file");
    EXPECT_EQ(linked_.read("file"), "theirs\n");
    EXPECT_EQ(statusOf(moved), std::vector<std::string>{});
}

TEST_F(MovedWorkingTree, IsWrittenByACheckout)
{
    repository_.makeBranch("topic", writes("file", "of topic\n"));
    runScript(repository_, "mv ../linked ../moved; mkdir ../linked");
    const GitRepository moved(folder() / "moved");
    const auto adapter = makeAdapter(moved.path());
    vclink::git::BranchManager::create(*adapter)->switchBranch("topic");
    EXPECT_EQ(moved.read("file"), "of topic\n");
    EXPECT_EQ(statusOf(moved), std::vector<std::string>{});
    EXPECT_TRUE(std::filesystem::is_empty(linked_.path()));
}

/// git works there instead, from whatever folder.
TEST_F(MovedWorkingTree, IsRefusedIfTheSettingsNameAnotherFolder)
{
    runScript(repository_, "mkdir ../tree; mv file other sub ../tree; "
                           "git config core.worktree \"$PWD/../tree\"; echo edited >../tree/file");
    const auto expectRefused = [this](const std::function<void()> &action)
    {
        const Failure failure = failureOf(action);
        EXPECT_EQ(failure.code, GIT_ERROR);
        EXPECT_EQ(failure.errorClass, GIT_ERROR_REPOSITORY);
        EXPECT_THAT(failure.text, testing::HasSubstr("core.worktree"));
        EXPECT_EQ(statusOf(repository_), std::vector<std::string>{" M file"});
    };
    const auto adapter = makeAdapter(repository_.path());
    const auto branches = vclink::git::BranchManager::create(*adapter);
    expectRefused([this] { revert({"file"}); });
    expectRefused([this] { add({"file"}); });
    expectRefused([this] { markResolved("file"); });
    expectRefused([this] { commit(); });
    expectRefused([&] { branches->switchBranch("own"); });
    EXPECT_THROW(branches->merge("own"), vclink::git::GitException);
    EXPECT_EQ(statusOf(repository_), std::vector<std::string>{" M file"});
}

} // namespace

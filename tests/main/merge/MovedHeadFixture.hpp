// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <utility>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "LateCommit.hpp"
#include "main/branches/BranchCallsFixture.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "util/repository/Head.hpp"

namespace vclink::test
{

/// Another process moves HEAD while an operation runs. It needs no lock of the index for that:
/// `git commit` gives it up before its hooks and its editor.
class MovedHeadFixture : public BranchCallsFixture
{
  protected:
    /// "topic" is ahead, with changes of each kind, or diverged.
    void makeTopic(bool isDiverged)
    {
        makeBranch("topic", writes("file", "theirs\n") + removes("other") + writes("theirs", "x"));
        if (isDiverged)
        {
            repository_.commitAll(writes("ours", "x"), "on main");
        }
    }
    /// Has a new file staged that only the late commit has.
    void beginLateCommit()
    {
        repository_.write("late", "late\n");
        repository_.add({"late"});
        late_ = std::make_unique<LateCommit>(repository_);
    }
    /// To be done once, in the midst of an operation.
    void moveHead()
    {
        if (late_ != nullptr)
        {
            EXPECT_TRUE(std::exchange(late_, nullptr)->goOn());
            moved_ = idOf("HEAD");
        }
    }
    /// Has the late commit made just before this call of libgit2.
    template <auto Function> void moveHeadBefore()
    {
        beginLateCommit();
        calls_.emplace();
        calls_->on<Function>([this](auto...) { moveHead(); });
    }
    /// Everything is as git's commit has left it.
    void expectUntouched() const
    {
        EXPECT_EQ(idOf("main"), moved_);
        EXPECT_EQ(repository_.line({"log", "-1", "--format=%s", "main"}), "late");
        EXPECT_EQ(currentBranch(), "refs/heads/main");
        EXPECT_THAT(status(), testing::IsEmpty());
        EXPECT_EQ(branches().getRepositoryState(), "Normal");
        EXPECT_EQ(repository_.read("late"), "late\n");
        EXPECT_FALSE(exists(".git/vclink-merge"));
        EXPECT_FALSE(exists(".git/index.lock"));
    }
    /// Expects that the late commit is in the working copy, the index and the branch.
    void expectLateKept() const
    {
        EXPECT_EQ(repository_.read("late"), "late\n");
        EXPECT_EQ(repository_.line({"ls-files", "late"}), "late");
        EXPECT_EQ(repository_.git({"show", "main:late"}), "late\n");
    }
    bool exists(const std::string &name) const
    {
        return std::filesystem::exists(repository_ / name);
    }
    static std::string movedText()
    {
        return textOf(Failure{GIT_EMODIFIED, GIT_ERROR_REFERENCE, git::Head::movedText});
    }
    static std::string notCommittedText()
    {
        return textOf(Failure{GIT_EMODIFIED, GIT_ERROR_MERGE,
                              "the merge was not committed, because another process has "
                              "moved the current branch or ended the merge meanwhile: see "
                              "git status"});
    }
    /// Calls the hook after the merge's lock is given up and before its commit takes another.
    static void beforeTheCommit(LibGit2Recorder &calls, const std::function<void()> &hook)
    {
        calls.on<git_reference_dwim>(
            [hook](git_reference **, git_repository *, const char *name)
            {
                if (name == std::string("topic"))
                    hook();
            });
    }

    std::unique_ptr<LateCommit> late_;
    std::string moved_;

  private:
    std::optional<LibGit2Recorder> calls_;
};

} // namespace vclink::test

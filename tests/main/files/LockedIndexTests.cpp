// SPDX-License-Identifier: MIT
#include <filesystem>
#include <functional>
#include <string>
#include <utility>
#include <vector>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/logging/severity.hpp"
#include "main/merge/MergeFixture.hpp"
#include "support/LogCapture.hpp"
#include "support/text.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::HasSubstr;
using namespace vclink::test;

/// Operations beside those of other processes, and of the host's callbacks.
class LockedIndex : public MergeFixture
{
  protected:
    upath path(const std::string &name) const
    {
        return asPath(repository_ / name);
    }
    /// Has a merge meet what happens after it was decided how to merge.
    std::string mergeMeeting(const std::function<void()> &event) const
    {
        LogCapture log(vclink::git::SeverityDiagnostic);
        log.onRecord(
            [&event](const LogRecord &record)
            {
                if (record.message.rfind("Merge Preference", 0) == 0)
                    event();
            });
        return failureOfMerge("topic");
    }
};

/// The index's lock is not waited for, which is git's way as well.
TEST_F(LockedIndex, MakesEveryOperationFailBeforeItsFirstWrite)
{
    makeAhead();
    makeBranch("diverged", writes("file", "theirs\n"), "main");
    repository_.write("other", "edited\n");
    repository_.write("untracked", "x");
    repository_.write(".git/index.lock", "of another process");
    const NothingChanges nothing(repository_);
    const auto objects = repository_.git({"count-objects", "-v"});
    const std::vector<std::pair<std::string, std::function<void()>>> operations{
        {"addFiles", [&] { adapter_->addFiles({path("untracked")}); }},
        {"removeFiles", [&] { adapter_->removeFiles({path("other")}); }},
        {"markResolved", [&] { adapter_->markResolved(path("other")); }},
        {"revertFiles", [&] { adapter_->revertFiles({path("other")}); }},
        {"commit", [&] { adapter_->commit(upath(), u"message"); }},
        {"switchBranch", [&] { branches().switchBranch("topic"); }}};
    for (const auto &[name, operation] : operations)
    {
        SCOPED_TRACE(name);
        const auto failure = failureOf(operation);
        EXPECT_EQ(failure.code, GIT_ELOCKED);
        EXPECT_EQ(failure.errorClass, GIT_ERROR_INDEX);
        EXPECT_EQ(failure.text, "the index is locked by '" +
                                    (repository_ / ".git/index.lock").string() +
                                    "'; this might be due to a concurrent or crashed process");
    }
    EXPECT_NE(failureOfMerge("topic").find("index.lock"), std::string::npos);
    EXPECT_NE(failureOfMerge("diverged").find("index.lock"), std::string::npos);
    EXPECT_EQ(repository_.git({"count-objects", "-v"}), objects);
    EXPECT_FALSE(fs::exists(repository_ / ".git/vclink-merge"));
    EXPECT_EQ(repository_.read(".git/index.lock"), "of another process");
}

TEST_F(LockedIndex, KeepsACallbackFromChangingItMeanwhile)
{
    makeAhead();
    makeBranch("diverged", writes("theirs", "x"));
    repository_.write("untracked", "x");
    std::vector<int> codes;
    interactor_->progress.onCall = [&](std::size_t)
    {
        codes.push_back(
            failureOf([&] { makeAdapter(repository_.path())->addFiles({path("untracked")}); })
                .code);
        EXPECT_EQ(states(repository_, {"untracked"}).at("untracked"), "Unversioned");
    };
    const std::vector<std::pair<std::string, std::function<void()>>> operations{
        {"revert",
         [&]
         {
             repository_.write("other", "edited\n");
             adapter_->revertFiles({path("other")});
         }},
        {"fast-forward", [&] { merge("topic"); }},
        {"merge", [&] { merge("diverged"); }},
        {"switch", [&] { branches().switchBranch("topic"); }}};
    for (const auto &[name, operation] : operations)
    {
        SCOPED_TRACE(name);
        codes.clear();
        operation();
        EXPECT_THAT(codes, testing::Each(GIT_ELOCKED));
        EXPECT_THAT(codes, testing::Not(testing::IsEmpty()));
    }
    EXPECT_EQ(repository_.read("other"), "other\n");
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    EXPECT_EQ(idOf("main^1"), idOf("topic"));
    EXPECT_EQ(idOf("main^2"), idOf("diverged"));
    adapter_->addFiles({path("untracked")});
    EXPECT_THAT(status(), testing::ElementsAre("A  untracked"));
}

/// Its commit would no longer be on the branch.
TEST_F(LockedIndex, LeavesABranchThatHasMovedSinceItsFastForwardWasDecided)
{
    makeAhead();
    std::string moved;
    const std::string failure = mergeMeeting(
        [&]
        {
            repository_.write("other", "of another process\n");
            moved = repository_.commitAll("of another process");
        });
    EXPECT_THAT(failure, HasSubstr("the current branch has moved since the merge began"));
    EXPECT_EQ(idOf("main"), moved);
    EXPECT_EQ(repository_.read("other"), "of another process\n");
    EXPECT_FALSE(fs::exists(repository_ / "new"));
    merge("topic");
    EXPECT_EQ(parents().size(), 2U);
}

TEST_F(LockedIndex, LeavesAMergeThatHasBegunSinceItsOwnOrItsFastForwardWasDecided)
{
    makeAhead();
    makeBranch("third", writes("third", "x"), "main");
    for (const bool isDiverged : {false, true})
    {
        if (isDiverged)
        {
            repository_.git({"merge", "--abort"});
            repository_.commitAll(writes("ours", "x"), "on main");
        }
        const std::string ours = idOf("main");
        const std::string failure = mergeMeeting(
            [this] {
                repository_.git({"merge", "--quiet", "--no-ff", "--no-commit", "third"});
            });
        EXPECT_EQ(failure, textOf(shared_vclink::git::UnableToMergeBadRepositoryState()));
        EXPECT_EQ(idOf("main"), ours);
        EXPECT_EQ(repository_.line({"rev-parse", "MERGE_HEAD"}), idOf("third"));
        EXPECT_TRUE(fs::exists(repository_ / "third"));
        EXPECT_FALSE(fs::exists(repository_ / "new"));
    }
}

/// As after `git clone --no-checkout`: libgit2 then checks everything out.
TEST_F(LockedIndex, IsNotThereBeforeTheFirstCheckout)
{
    makeAhead();
    const auto target = folder() / "clone";
    repository_.git({"clone", "--quiet", "--no-checkout", ".", target.string()});
    const GitRepository clone(target);
    clone.git({"branch", "--quiet", "topic", "origin/topic"});
    ASSERT_FALSE(fs::exists(clone / ".git/index"));
    const auto adapter = makeAdapter(clone.path());
    vclink::git::BranchManager::create(*adapter)->switchBranch("topic");
    EXPECT_EQ(clone.git({"status", "--porcelain"}), "");
    EXPECT_TRUE(fs::exists(clone / "file"));
}

} // namespace

// SPDX-License-Identifier: MIT
// What becomes of operations when another process moves HEAD while they run. It needs no lock of
// the index for that: `git commit` gives it up before its hooks and its editor.
#include <filesystem>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "LateCommit.hpp"
#include "main/branches/BranchCallsFixture.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/text.hpp"
#include "util/repository/Head.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using namespace vclink::test;

class MovedHead : public BranchCallsFixture
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
        EXPECT_THAT(status(), IsEmpty());
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

TEST_F(MovedHead, RefusesASwitchBeforeItWrites)
{
    makeTopic(false);
    moveHeadBefore<git_checkout_tree>();
    EXPECT_EQ(failureOf([this] { branches().switchBranch("topic"); }),
              (Failure{GIT_EMODIFIED, GIT_ERROR_REFERENCE, git::Head::movedText}));
    expectUntouched();
    branches().switchBranch("topic");
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    EXPECT_FALSE(exists("late"));
}

/// A push or fetch of another process, for example.
class MovedTarget : public MovedHead
{
  protected:
    MovedTarget()
    {
        makeTopic(false);
        makeBranch("later", writes("file", "theirs, later\n"), "topic");
        repository_.git({"symbolic-ref", "refs/heads/alias", "refs/heads/topic"});
    }
    void moveTopic(const std::string &commit) const
    {
        repository_.git({"branch", "--force", "topic", commit});
    }
    Failure failureOfSwitch(const std::string &name) const
    {
        return failureOf([&] { branches().switchBranch(name); });
    }
    static Failure moved(const std::string &name, const std::string &state)
    {
        return {GIT_EMODIFIED, GIT_ERROR_REFERENCE,
                "another process has moved 'refs/heads/" + name + "' meanwhile; " + state};
    }
};

TEST_F(MovedTarget, RefusesASwitchBeforeItWrites)
{
    for (const std::string name : {"topic", "alias"})
    {
        const std::string before = idOf("topic");
        {
            LibGit2Recorder calls;
            calls.on<git_transaction_new>([this](auto...) { moveTopic("later"); });
            EXPECT_EQ(failureOfSwitch(name), moved(name, "nothing has been changed, try again"));
        }
        EXPECT_EQ(currentBranch(), "refs/heads/main");
        EXPECT_THAT(status(), IsEmpty());
        EXPECT_EQ(idOf("topic"), idOf("later"));
        branches().switchBranch(name);
        EXPECT_EQ(repository_.read("file"), "theirs, later\n");
        EXPECT_THAT(status(), IsEmpty());
        branches().switchBranch("main");
        moveTopic(before);
    }
}

TEST_F(MovedTarget, LeavesHeadIfASwitchHasWritten)
{
    for (const std::string name : {"topic", "alias"})
    {
        const std::string before = idOf("topic");
        {
            LibGit2Recorder calls;
            calls.on<git_checkout_tree>([this](auto...) { moveTopic("later"); });
            EXPECT_EQ(failureOfSwitch(name), moved(name, "its files have been written, but HEAD "
                                                         "has not moved: see 'git status'"));
        }
        EXPECT_EQ(currentBranch(), "refs/heads/main");
        EXPECT_THAT(status(), ElementsAre("M  file", "D  other", "A  theirs"));
        EXPECT_EQ(idOf("topic"), idOf("later"));
        EXPECT_FALSE(exists(".git/index.lock"));
        repository_.git({"reset", "--quiet", "--hard"});
        moveTopic(before);
    }
}

TEST_F(MovedTarget, IsNotMissedWhileASwitchAwaitsHead)
{
    repository_.git({"config", "core.filesRefLockTimeout", "20000"});
    LibGit2Recorder calls;
    calls.answer<git_repository_set_head>(
        [this, isFirst = true](const auto &setHead, auto... arguments) mutable
        {
            if (!std::exchange(isFirst, false))
                return setHead(arguments...);
            moveTopic("later");
            return int{GIT_ELOCKED};
        });
    EXPECT_EQ(failureOfSwitch("topic").code, GIT_EMODIFIED);
    EXPECT_EQ(currentBranch(), "refs/heads/main");
}

TEST_F(MovedTarget, MayBeDeletedOrPacked)
{
    LibGit2Recorder calls;
    calls.on<git_transaction_new>([this](auto...) { repository_.git({"pack-refs", "--all"}); });
    branches().switchBranch("later");
    EXPECT_EQ(currentBranch(), "refs/heads/later");
    calls.on<git_checkout_tree>([this](auto...) { repository_.git({"branch", "-D", "topic"}); });
    EXPECT_EQ(failureOfSwitch("topic").code, GIT_ENOTFOUND);
    EXPECT_EQ(currentBranch(), "refs/heads/later");
}

TEST_F(MovedHead, RefusesAFastForwardBeforeItWrites)
{
    makeTopic(false);
    moveHeadBefore<git_checkout_tree>();
    EXPECT_EQ(failureOfMerge("topic"), movedText());
    expectUntouched();
    merge("topic");
    expectLateKept();
    EXPECT_THAT(parents(), ElementsAre(moved_, idOf("topic")));
}

TEST_F(MovedHead, RefusesAFastForwardOfABranchThatIsNoLongerTheCurrentOne)
{
    makeTopic(false);
    moved_ = idOf("main");
    repository_.git({"branch", "same"});
    LibGit2Recorder calls;
    calls.on<git_checkout_tree>(
        [this](auto...) {
            repository_.git({"symbolic-ref", "HEAD", "refs/heads/same"});
        });
    EXPECT_EQ(failureOfMerge("topic"), movedText());
    EXPECT_EQ(idOf("main"), moved_);
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(MovedHead, RefusesAFastForwardThatHasLookedAtAnotherCommit)
{
    makeTopic(false);
    moveHeadBefore<git_object_lookup>();
    EXPECT_EQ(failureOfMerge("topic"), movedText());
    expectUntouched();
}

/// Deletions alone are told of by no notification.
TEST_F(MovedHead, KeepsWhatWasCommittedSinceTheLookBeforeAFastForward)
{
    makeBranch("topic", removes("other"));
    moveHeadBefore<git_checkout_tree>();
    EXPECT_NE(failureOfMerge("topic"), "");
    EXPECT_EQ(idOf("main"), moved_);
    expectLateKept();
}

TEST_F(MovedHead, KeepsWhatWasCommittedWhileAFastForwardWrote)
{
    makeTopic(false);
    moveHeadBefore<git_reference_set_target>();
    EXPECT_THAT(failureOfMerge("topic"), HasSubstr("old reference value does not match"));
    EXPECT_EQ(idOf("main"), moved_);
    expectLateKept();
}

TEST_F(MovedHead, RefusesAMergeBeforeItWrites)
{
    makeTopic(true);
    moveHeadBefore<git_merge>();
    EXPECT_EQ(failureOfMerge("topic"), movedText());
    expectUntouched();
    merge("topic");
    expectLateKept();
    EXPECT_THAT(parents(), ElementsAre(moved_, idOf("topic")));
}

/// libgit2 has read HEAD by then, to merge it, and reads it again to check and to write.
TEST_F(MovedHead, RefusesAMergeWhileItsCommandsRun)
{
    repository_.commitAll(
        writes(".gitattributes", "driven merge=slow\n") + writes("driven", "base\n"), "driven");
    diverge(writes("driven", "ours\n"), writes("driven", "theirs\n"));
    repository_.write("../slow",
                      "cd '" + repository_.path().string() +
                          "' && : >.git/hooks/commit-msg.go\nturn=0\n"
                          "while [ \"$(git log -1 --format=%s)\" != late ] && [ $turn -lt 300 ]\n"
                          "do sleep 0.05; turn=$((turn + 1)); done\n");
    repository_.git({"config", "merge.slow.driver", "sh " + (folder() / "slow").string() + " %A"});
    beginLateCommit();
    EXPECT_EQ(failureOfMerge("topic"), movedText());
    late_.reset();
    moved_ = idOf("HEAD");
    expectUntouched();
    merge("topic");
    expectLateKept();
}

TEST_F(MovedHead, LeavesAMergeToBeCommittedIfItMovesWhileThatIsWritten)
{
    makeTopic(true);
    late_ = std::make_unique<LateCommit>(repository_);
    LibGit2Recorder calls;
    calls.answer<git_merge>(
        [this](const auto &merge, auto... arguments)
        {
            const int code = merge(arguments...);
            moveHead();
            EXPECT_FALSE(exists(".git/MERGE_HEAD")) << "git has not ended the merge";
            return code;
        });
    EXPECT_EQ(failureOfMerge("topic"), notCommittedText());
    EXPECT_EQ(idOf("main"), moved_);
    EXPECT_EQ(branches().getRepositoryState(), "Conflicts");
    EXPECT_THAT(status(), ElementsAre("M  file", "D  other", "A  theirs"));
    adapter_->commit(upath(), u"concluded");
    EXPECT_THAT(parents(), ElementsAre(moved_, idOf("topic")));
    EXPECT_THAT(status(), IsEmpty());
}

/// The last that a late commit does.
TEST_F(MovedHead, IsNoneIfAnotherProcessOnlyRemovesTheMergeHead)
{
    makeTopic(true);
    const std::string ours = idOf("main");
    LibGit2Recorder calls;
    calls.answer<git_merge>(
        [this](const auto &merge, auto... arguments)
        {
            const int code = merge(arguments...);
            repository_.remove(".git/MERGE_HEAD");
            return code;
        });
    merge("topic");
    EXPECT_THAT(parents(), ElementsAre(ours, idOf("topic")));
}

TEST_F(MovedHead, LeavesAMergeThatAnotherProcessHasCommitted)
{
    makeTopic(true);
    const std::string ours = idOf("main");
    LibGit2Recorder calls;
    beforeTheCommit(calls,
                    [this] {
                        repository_.git({"commit", "--quiet", "--message", "of git"});
                    });
    EXPECT_EQ(failureOfMerge("topic"), notCommittedText());
    EXPECT_THAT(parents(), ElementsAre(ours, idOf("topic")));
    EXPECT_EQ(message(), "of git\n");
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
}

TEST_F(MovedHead, LeavesAMergeThatAnotherProcessHasTakenBack)
{
    makeTopic(true);
    const auto before = stateOf(repository_);
    LibGit2Recorder calls;
    beforeTheCommit(calls, [this] { repository_.git({"merge", "--abort"}); });
    EXPECT_EQ(failureOfMerge("topic"), notCommittedText());
    const auto after = stateOf(repository_);
    EXPECT_EQ(after.references, before.references);
    EXPECT_EQ(after.index, before.index);
    EXPECT_EQ(after.workingTree, before.workingTree);
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
}

TEST_F(MovedHead, LeavesAnotherMergeThatAnotherProcessHasBegun)
{
    makeTopic(true);
    makeBranch("third", writes("third", "x"), "main^");
    const std::string ours = idOf("main");
    LibGit2Recorder calls;
    beforeTheCommit(calls,
                    [this]
                    {
                        repository_.git({"merge", "--abort"});
                        repository_.git({"merge", "--quiet", "--no-commit", "third"});
                    });
    EXPECT_EQ(failureOfMerge("topic"), notCommittedText());
    EXPECT_EQ(idOf("main"), ours);
    EXPECT_EQ(idOf("MERGE_HEAD"), idOf("third"));
}

TEST_F(MovedHead, RefusesACommitThatWouldReplaceTheOther)
{
    repository_.write("file", "edited\n");
    moveHeadBefore<git_commit_create>();
    EXPECT_EQ(failureOf([this] { adapter_->commit(upath(), u"message"); }).code, GIT_EMODIFIED);
    EXPECT_EQ(idOf("main"), moved_);
    expectLateKept();
    EXPECT_EQ(repository_.read("file"), "edited\n");
}

/// An adapter of the host's own, which commits twice at the end of a merge.
class TwiceCommittingAdapter : public git::GitAdapter
{
  public:
    using GitAdapter::GitAdapter;
    void commit(const upath &path, const ustring &message) override
    {
        GitAdapter::commit(path, message);
        GitAdapter::commit(path, u"and once more");
    }
};

TEST_F(MovedHead, IsNoneIfTheAdaptersOwnCommitMovesIt)
{
    makeTopic(true);
    TwiceCommittingAdapter adapter(
        asPath(repository_.path()),
        std::static_pointer_cast<vclink::ApplicationInteractor>(interactor_));
    git::BranchManager::create(adapter)->merge("topic");
    EXPECT_EQ(split(repository_.git({"log", "--first-parent", "-3", "--format=%s"})),
              (std::vector<std::string>{"and once more", "Merge branch 'topic'", "on main"}));
}

} // namespace

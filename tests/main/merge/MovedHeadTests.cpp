// SPDX-License-Identifier: MIT
// What becomes of operations when another process moves HEAD while they run.
#include <memory>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MovedHeadFixture.hpp"
#include "support/text.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using namespace vclink::test;

using MovedHead = MovedHeadFixture;

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

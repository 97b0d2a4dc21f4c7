// SPDX-License-Identifier: MIT
#include <cstddef>
#include <cstdlib>
#include <ostream>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CommitCallsFixture.hpp"
#include "main/callNames.hpp"

namespace
{

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;
using namespace vclink::test;

class CommitCalls : public CommitCallsFixture
{
  protected:
    const CallNames ofTheBeginning_ =
        CallNames{"git_repository_open_ext"} + ofTheSettings +
        CallNames{"git_index_open",     "git_repository_set_index", "git_index_set_caps",
                  "git_index_free",     "git_reference_dwim",       "git_commit_lookup",
                  "git_reference_free", "git_repository_state"};
};

TEST_F(CommitCalls, ComeInTheirOrderAndReleaseInReverse)
{
    startNoting();
    commitOnce();
    const CallNames expected =
        ofTheBeginning_ +
        CallNames{"git_signature_default", "git_repository_index", "git_index_update_all",
                  "git_index_write",       "git_index_write_tree", "git_tree_lookup",
                  "git_commit_create",     "git_object_lookup",    "git_repository_state_cleanup",
                  "git_object_free",       "git_tree_free",        "git_index_free",
                  "git_signature_free",    "git_commit_free",      "git_repository_free"};
    EXPECT_EQ(calls_->steps(), expected);
    EXPECT_THAT(calls_->openHandles(), IsEmpty());
}

TEST_F(CommitCalls, OfAMergeLookUpItsHeadsBeforeAnythingIsTouched)
{
    beginMerge({"file"});
    startNoting();
    commitOnce();
    auto first = calls_->steps();
    const CallNames expected =
        ofTheBeginning_ +
        CallNames{"git_repository_mergehead_foreach", "git_commit_lookup", "git_signature_default"};
    ASSERT_GE(first.size(), expected.size());
    first.resize(expected.size());
    EXPECT_EQ(first, expected);
}

TEST_F(CommitCalls, MakeAnIdentityOnlyWhereNoneIsConfigured)
{
    startNoting();
    commitOnce();
    EXPECT_THAT(calls_->steps(), Not(Contains("git_signature_now")));
    repository_.git({"config", "--unset", "user.email"});
    ::setenv("USER", "builder", 1);
    startNoting();
    commitOnce();
    EXPECT_THAT(calls_->steps(), Contains("git_signature_now"));
}

TEST_F(CommitCalls, AskForTheCommitAtHeadAndRefreshTheWholeIndexWithoutACallback)
{
    int count = 0;
    std::vector<std::string> asked;
    startNoting();
    calls_->on<git_reference_dwim>([&](git_reference **, git_repository *, const char *name)
                                   { asked.emplace_back(name); });
    calls_->on<git_index_update_all>(
        [&](git_index *, const git_strarray *pathspec, git_index_matched_path_cb callback,
            void *payload)
        {
            ++count;
            EXPECT_EQ(pathspec, nullptr);
            EXPECT_EQ(callback, nullptr);
            EXPECT_EQ(payload, nullptr);
        });
    commitOnce();
    EXPECT_EQ(count, 1);
    EXPECT_THAT(asked, ElementsAre("HEAD"));
    repository_.git({"checkout", "--quiet", "--orphan", "second"});
    startNoting();
    commitOnce();
    EXPECT_THAT(calls_->steps(), Not(Contains("git_commit_lookup")));
}

TEST_F(CommitCalls, GiveOneSignatureTwiceAndTheEncodingAlways)
{
    int count = 0;
    startNoting();
    calls_->on<git_commit_create>(
        [&](git_oid *, git_repository *, const char *reference, const git_signature *author,
            const git_signature *committer, const char *encoding, const char *message,
            const git_tree *, std::size_t parents, const git_commit **)
        {
            ++count;
            EXPECT_STREQ(reference, "HEAD");
            EXPECT_EQ(author, committer);
            EXPECT_STREQ(encoding, "UTF-8");
            EXPECT_STREQ(message, "message");
            EXPECT_EQ(parents, 1U);
        });
    commitOnce();
    EXPECT_EQ(count, 1);
}

TEST_F(CommitCalls, ThatFailAfterTheIndexIsWrittenLeaveTheMergeUnderWay)
{
    beginMerge({"file"});
    repository_.write("sub/inside", "changed\n");
    repository_.remove("other");
    RepositoryState expected = stateOf(repository_);
    expected.index = stateAfterGit({{"add", "--update"}}).index;
    startNoting();
    for (const auto *name : {"git_index_write_tree", "git_tree_lookup", "git_commit_create"})
    {
        calls_->fail({{name, -42}});
        EXPECT_EQ(failureOf([this] { commitOnce(); }), (Failure{-42, GIT_ERROR_OS, "injected"}));
        EXPECT_EQ(stateOf(repository_), expected) << name;
    }
}

TEST_F(CommitCalls, ThatFailAfterTheCommitLeaveItAndEndTheMergeUnlessThisFails)
{
    for (const std::string name : {"git_repository_state_cleanup", "git_object_lookup"})
    {
        beginMerge({"file"});
        const std::string head = idOf("HEAD");
        const auto underWay = stateOf(repository_).underWay;
        startNoting();
        calls_->fail({{name, -42}});
        EXPECT_EQ(failureOf([this] { commitOnce(); }), (Failure{-42, GIT_ERROR_OS, "injected"}));
        EXPECT_THAT(parents(), ElementsAre(head, idOf("theirs")));
        const auto left = stateOf(repository_).underWay;
        EXPECT_EQ(left == underWay, name == "git_repository_state_cleanup");
        EXPECT_EQ(left.count("MERGE_HEAD") == 0, name == "git_object_lookup");
        repository_.git({"reset", "--quiet", "--hard"});
        repository_.git({"branch", "--quiet", "-D", "theirs"});
    }
}

TEST_F(CommitCalls, ThatFailForTheIdentityLeaveTheIndexUnopened)
{
    repository_.git({"config", "--remove-section", "user"});
    ::unsetenv("USER");
    ::unsetenv("LOGNAME");
    const NothingChanges nothing(repository_);
    startNoting();
    EXPECT_THROW(commitOnce(), vclink::git::TagException<shared_vclink::git::NoUserName>);
    EXPECT_THAT(calls_->steps(), Not(Contains("git_repository_index")));
    EXPECT_THAT(calls_->openHandles(), IsEmpty());
}

} // namespace

// SPDX-License-Identifier: MIT
#include <array>
#include <set>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "BranchFixture.hpp"
#include "main/BasicBranchManager.hpp"

namespace
{

using namespace vclink::test;

/// More than libgit2 keeps of one object when it is released.
const std::string nineKilobytes(9000, 'x');

class BranchRevisions : public BranchFixture
{
  protected:
    /// Expects both operations to name what git names.
    void expectAsGit(const std::string &revision) const
    {
        const std::string expected = idOf(revision);
        EXPECT_EQ(branches().getRevision(revision), expected) << revision;
        const git_oid id = branches().getRevisionId(revision);
        std::array<char, GIT_OID_HEXSZ + 1> digits{};
        git_oid_tostr(digits.data(), digits.size(), &id);
        EXPECT_EQ(std::string(digits.data()), expected) << revision;
    }
    void expectFailure(const std::string &revision, const Failure &failure) const
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOf([&] { branches().getRevision(revision); }), failure);
        EXPECT_EQ(failureOf([&] { branches().getRevisionId(revision); }), failure);
    }
};

TEST_F(BranchRevisions, AreWhatGitNames)
{
    repository_.commitAll(writes("folder/file", "one"), "first");
    repository_.commitAll(writes("folder/file", "two"), "second");
    repository_.git({"tag", "light"});
    repository_.git({"branch", "folder/topic", "HEAD~1"});
    repository_.git({"update-ref", "refs/remotes/origin/main", "HEAD~1"});
    for (const auto *revision :
         {"HEAD", "main", "refs/heads/main", "HEAD~1", "HEAD^", "light", "folder/topic",
          "origin/main", "HEAD:folder/file", "HEAD:folder", "HEAD^{tree}", "HEAD@{0}", ":/first"})
        expectAsGit(revision);
    expectAsGit(idOf("HEAD"));
    expectAsGit(idOf("HEAD").substr(0, 8));
    EXPECT_THAT(branches().getRevision("HEAD"), testing::MatchesRegex("[0-9a-f]{40}"));
}

TEST_F(BranchRevisions, OfLongObjectsAreRight)
{
    for (int i = 0; i < 300; ++i)
        repository_.write("folder/file" + std::to_string(i), "x");
    repository_.write("long", nineKilobytes);
    repository_.commitAll(nineKilobytes);
    repository_.git({"-c", "user.name=x", "-c", "user.email=x@y", "tag", "-a", "-m", nineKilobytes,
                     "annotated"});
    for (const auto *revision :
         {"HEAD", "main", "annotated", "annotated^{commit}", "HEAD:long", "HEAD:folder"})
        expectAsGit(revision);
    EXPECT_EQ(branches().getHeadRevision(), idOf("HEAD"));
    EXPECT_NE(branches().getRevision("annotated"), idOf("HEAD"));
}

TEST_F(BranchRevisions, TakenOneAfterTheOtherDoNotMix)
{
    repository_.write("long", nineKilobytes);
    repository_.commitAll(nineKilobytes);
    const git_oid file = branches().getRevisionId("HEAD:long");
    const git_oid commit = branches().getRevisionId("HEAD");
    EXPECT_FALSE(git_oid_equal(&file, &commit));
    EXPECT_EQ(std::string(git_oid_tostr_s(&file)), idOf("HEAD:long"));
    EXPECT_EQ(std::string(git_oid_tostr_s(&commit)), idOf("HEAD"));
}

TEST_F(BranchRevisions, OfTheHeadFollowIt)
{
    repository_.commitAll("first");
    EXPECT_EQ(branches().getHeadRevision(), idOf("HEAD"));
    repository_.commitAll("second");
    EXPECT_EQ(branches().getHeadRevision(), idOf("HEAD"));
    repository_.git({"checkout", "--quiet", "--detach", "HEAD~1"});
    EXPECT_EQ(branches().getHeadRevision(), idOf("main~1"));
}

TEST_F(BranchRevisions, OfTheHeadFailBeforeTheFirstCommit)
{
    const NothingChanges nothing(repository_);
    const Failure failure = failureOf([this] { branches().getHeadRevision(); });
    EXPECT_EQ(failure.code, GIT_ENOTFOUND);
    EXPECT_THAT(failure.text, testing::HasSubstr("HEAD"));
}

TEST_F(BranchRevisions, OfTheHeadAreAskedOfAnOverriddenGetRevision)
{
    class Manager : public vclink::git::BasicBranchManager
    {
      public:
        using BasicBranchManager::BasicBranchManager;
        std::string getRevision(const std::string &revision) const override
        {
            return "overridden " + revision;
        }
    };
    const Manager manager(*adapter_);
    EXPECT_EQ(manager.getHeadRevision(), "overridden HEAD");
}

TEST_F(BranchRevisions, ThatNameNothingOrAreNoneFail)
{
    repository_.commitAll("first");
    expectFailure("missing", {GIT_ENOTFOUND, GIT_ERROR_REFERENCE, "revspec 'missing' not found"});
    expectFailure("HEAD^{", {GIT_EINVALIDSPEC, GIT_ERROR_INVALID,
                             "failed to parse revision specifier - Invalid pattern 'HEAD^{'"});
}

TEST_F(BranchRevisions, ThatMeanSeveralObjectsFail)
{
    for (int i = 0; i < 1000; ++i)
        repository_.write("file" + std::to_string(i), "content " + std::to_string(i));
    repository_.add();
    const auto lines = split(repository_.git({"ls-files", "--format=%(objectname)"}));
    std::set<std::string> beginnings;
    std::string common;
    for (const auto &id : lines)
    {
        if (!beginnings.insert(id.substr(0, 4)).second)
            common = id.substr(0, 4);
    }
    ASSERT_FALSE(common.empty());
    EXPECT_EQ(failureOf([&] { branches().getRevision(common); }).code, GIT_EAMBIGUOUS);
}

} // namespace

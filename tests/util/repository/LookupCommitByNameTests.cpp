// SPDX-License-Identifier: MIT
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "support/Descriptors.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/text.hpp"
#include "util/repository/repository.hpp"

namespace
{

namespace git = vclink::git;
using namespace vclink::test;

class LookupCommitByName : public GitFixture
{
  protected:
    git::OwnedHandle<git_repository> open() const
    {
        return git::openRepository(asPath(repository_.path()));
    }
    std::string idOf(const char *name) const
    {
        const auto opened = open();
        const auto result = git::lookupCommitByName(name, opened.get());
        return result.has_value() ? git_oid_tostr_s(git_commit_id(result.value().get()))
                                  : asUtf8(result.error().getMessage());
    }
    int errorOf(const char *name) const
    {
        const auto opened = open();
        const auto result = git::lookupCommitByName(name, opened.get());
        return result.has_error() ? result.error().getCode() : 0;
    }

    LibGit2Session session_{environment()};
    GitRepository repository_ = makeRepository();
};

TEST_F(LookupCommitByName, KeepsTheFailureOfAnUnbornHead)
{
    const auto opened = open();
    const auto result = git::lookupCommitByName("HEAD", opened.get());
    ASSERT_TRUE(result.has_error());
    EXPECT_FALSE(result.has_value());
    EXPECT_EQ(result.error().getCode(), GIT_ENOTFOUND);
    EXPECT_EQ(result.error().getErrorClass(), GIT_ERROR_REFERENCE);
    EXPECT_NE(result.error().getMessage(), u"");
}

TEST_F(LookupCommitByName, FollowsHeadToItsBranch)
{
    const std::string id = repository_.commit("first");
    EXPECT_EQ(idOf("HEAD"), id);
}

TEST_F(LookupCommitByName, TakesADetachedHead)
{
    const std::string id = repository_.commit("first");
    repository_.commit("second");
    repository_.git({"checkout", "--quiet", "--detach", id});
    EXPECT_EQ(idOf("HEAD"), id);
}

TEST_F(LookupCommitByName, TakesBranchesTagsAndRemoteBranchesByShortAndFullNames)
{
    const std::string id = repository_.commit("first");
    repository_.git({"branch", "topic/x"});
    repository_.git({"tag", "light"});
    repository_.git({"update-ref", "refs/remotes/origin/main", id});
    repository_.git({"symbolic-ref", "refs/remotes/origin/HEAD", "refs/remotes/origin/main"});
    repository_.commit("second");
    for (const auto *name : {"topic/x", "refs/heads/topic/x", "light", "refs/tags/light",
                             "origin/main", "refs/remotes/origin/main", "origin"})
        EXPECT_EQ(idOf(name), id) << name;
}

TEST_F(LookupCommitByName, FollowsAChainOfSymbolicReferences)
{
    const std::string id = repository_.commit("first");
    repository_.git({"symbolic-ref", "refs/heads/one", "refs/heads/main"});
    repository_.git({"symbolic-ref", "refs/heads/two", "refs/heads/one"});
    EXPECT_EQ(idOf("two"), id);
}

TEST_F(LookupCommitByName, PrefersTheTagToTheBranchOfTheSameName)
{
    const std::string first = repository_.commit("first");
    repository_.git({"tag", "name"});
    repository_.commit("second");
    repository_.git({"branch", "name"});
    EXPECT_EQ(idOf("name"), first);
}

TEST_F(LookupCommitByName, KeepsTheFailureOfWhatIsNoReferenceToACommit)
{
    const std::string id = repository_.commit("first");
    repository_.git({"-c", "user.name=T", "-c", "user.email=t@example.com", "tag", "-a", "-m",
                     "text", "annotated"});
    repository_.write(".git/refs/heads/broken", std::string(40, '1') + "\n");
    for (const auto *name : {"missing", "refs/heads/missing", id.c_str(), "annotated", "broken"})
        EXPECT_EQ(errorOf(name), GIT_ENOTFOUND) << name;
    EXPECT_EQ(errorOf("not a name.."), GIT_EINVALIDSPEC);
    EXPECT_NE(errorOf("HEAD~0"), 0);
}

TEST_F(LookupCommitByName, LeavesNothingOpen)
{
    repository_.commit("first");
    idOf("HEAD");
    const NoDescriptorLeak noLeak;
    EXPECT_NE(idOf("HEAD"), "");
    EXPECT_EQ(errorOf("missing"), GIT_ENOTFOUND);
}

} // namespace

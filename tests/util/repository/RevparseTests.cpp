// SPDX-License-Identifier: MIT
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "support/Failure.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/text.hpp"
#include "util/repository/repository.hpp"

namespace
{

namespace git = vclink::git;
using namespace vclink::test;

/// Too large for libgit2's cache of objects, which frees what it refuses at once.
const std::string longText(9000, 'x');

class Revparse : public GitFixture
{
  protected:
    Revparse()
    {
        repository_.write("file", "content");
        repository_.write("sub/file", "other content");
        repository_.commitAll("first");
        repository_.write("file", "changed");
        repository_.commitAll(longText);
        for (const auto &message : {std::string("short"), longText})
        {
            repository_.git({"-c", "user.name=T", "-c", "user.email=t@example.com", "tag", "-a",
                             "-m", message, message.size() > 100 ? "big" : "small"});
        }
        opened_ = git::openRepository(asPath(repository_.path()));
    }

    std::string idOf(const std::string &spec) const
    {
        // By value: the pointer is good until the next call only.
        const git_oid id = *git::revparseId(spec, opened_.get());
        return git_oid_tostr_s(&id);
    }

    LibGit2Session session_{environment()};
    GitRepository repository_ = makeRepository();
    git::OwnedHandle<git_repository> opened_;
};

TEST_F(Revparse, GivesTheObjectThatATextNames)
{
    const auto result = git::revparseObject(opened_.get(), "HEAD");
    ASSERT_TRUE(result.has_value());
    EXPECT_EQ(git_object_type(result.value().get()), GIT_OBJECT_COMMIT);
    EXPECT_EQ(git_oid_tostr_s(git_object_id(result.value().get())),
              repository_.line({"rev-parse", "HEAD"}));
}

TEST_F(Revparse, KeepsAFailureOfTheObject)
{
    const auto result = git::revparseObject(opened_.get(), "no-such-branch");
    ASSERT_TRUE(result.has_error());
    EXPECT_EQ(result.error().getCode(), GIT_ENOTFOUND);
    EXPECT_EQ(result.error().getErrorClass(), GIT_ERROR_REFERENCE);
    EXPECT_NE(result.error().getMessage(), u"");
}

TEST_F(Revparse, KeepsAFailureOfATextThatIsNoRevision)
{
    const auto result = git::revparseObject(opened_.get(), "HEAD^{");
    ASSERT_TRUE(result.has_error());
    EXPECT_EQ(result.error().getCode(), GIT_EINVALIDSPEC);
}

TEST_F(Revparse, GivesTheIdThatGitGives)
{
    for (const auto *spec : {"HEAD", "main", "HEAD~1", "HEAD^{tree}", "refs/heads/main", "small",
                             "small^{}", "HEAD:sub", "HEAD:file", "HEAD:sub/file", "big", "big^{}"})
        EXPECT_EQ(idOf(spec), repository_.line({"rev-parse", spec})) << spec;
}

TEST_F(Revparse, GivesAnIdThatOutlivesTheRepository)
{
    const std::string expected = repository_.line({"rev-parse", "HEAD"});
    const git_oid *id = git::revparseId("HEAD", opened_.get());
    opened_.reset();
    EXPECT_EQ(git_oid_tostr_s(id), expected);
}

TEST_F(Revparse, RaisesWithoutChangingTheIdGivenBefore)
{
    const std::string expected = repository_.line({"rev-parse", "HEAD"});
    const git_oid *id = git::revparseId("HEAD", opened_.get());
    EXPECT_EQ(failureOf([&] { git::revparseId("no-such-branch", opened_.get()); }).code,
              GIT_ENOTFOUND);
    EXPECT_EQ(git_oid_tostr_s(id), expected);
}

} // namespace

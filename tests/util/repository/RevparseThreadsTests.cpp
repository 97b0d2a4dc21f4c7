// SPDX-License-Identifier: MIT
#include <future>
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/text.hpp"
#include "util/repository/repository.hpp"

namespace
{

namespace git = vclink::git;
using vclink::test::asPath;

class RevparseThreads : public vclink::test::GitFixture
{
  protected:
    vclink::test::LibGit2Session session_{environment()};
};

/// Asks for one revision over and over while another thread asks for another.
int countWrongIds(const upath &root, const std::string &spec, const std::string &expected)
{
    const auto repository = git::openRepository(root);
    int wrong = 0;
    for (int i = 0; i < 200; ++i)
    {
        const git_oid *id = git::revparseId(spec, repository.get());
        char text[GIT_OID_HEXSZ + 1];
        wrong += git_oid_tostr(text, sizeof(text), id) == expected ? 0 : 1;
    }
    return wrong;
}

TEST_F(RevparseThreads, GiveEachThreadAnIdOfItsOwn)
{
    auto repository = makeRepository();
    repository.write("file", "content");
    const std::string first = repository.commitAll(std::string(9000, 'x'));
    const std::string second = repository.commit(std::string(9000, 'y'));
    const upath root = asPath(repository.path());
    auto other =
        std::async(std::launch::async, [&] { return countWrongIds(root, "HEAD~1", first); });
    EXPECT_EQ(countWrongIds(root, "HEAD", second), 0);
    EXPECT_EQ(other.get(), 0);
}

TEST_F(RevparseThreads, KeepAnIdWhileAnotherThreadAsksForItsOwn)
{
    auto repository = makeRepository();
    const std::string first = repository.commit("first");
    repository.commit("second");
    const upath root = asPath(repository.path());
    const auto opened = git::openRepository(root);
    const git_oid *id = git::revparseId(first, opened.get());
    const auto ask = [&]
    {
        const auto its = git::openRepository(root);
        return static_cast<const void *>(git::revparseId("HEAD", its.get()));
    };
    EXPECT_NE(std::async(std::launch::async, ask).get(), id);
    EXPECT_EQ(git_oid_tostr_s(id), first);
}

} // namespace

// SPDX-License-Identifier: MIT
#include "main/checkout/CloneWatch.hpp"

#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CloneFixture.hpp"

namespace
{

using namespace vclink::test;

/// Clones of files that have attributes, on both sides of a `.gitattributes` in path order.
class CloneAttributes : public CloneFixture, public testing::WithParamInterface<Naming>
{
  protected:
    CloneAttributes() : CloneFixture(GetParam())
    {
    }
    /// Expects that a clone has the files that git's has.
    void expectClonedAsByGit() const
    {
        generate();
        const GitRepository twin = GitRepository::clone(server_.path(), folder() / "twin");
        EXPECT_EQ(workingTreeOf(clone_), workingTreeOf(twin));
        EXPECT_EQ(indexOf(clone_), indexOf(twin));
        EXPECT_EQ(clone_.git({"status", "--porcelain"}), "");
        clone_.git({"add", "--renormalize", "."});
        EXPECT_EQ(indexOf(clone_), indexOf(twin));
    }
    const Change addsFiles_ = writesEach({"+a", ".a", "a", "s/-a", "s/.a", "s/a"}, "one\ntwo\n");
};

TEST_P(CloneAttributes, ApplyToAllFiles)
{
    addsFiles_(author_);
    publish(".gitattributes", "* -text\n");
    repository_.git({"config", "--global", "core.autocrlf", "true"});
    expectClonedAsByGit();
}

TEST_P(CloneAttributes, ApplyInAFolder)
{
    addsFiles_(author_);
    publish("s/.gitattributes", "* text eol=crlf\n");
    expectClonedAsByGit();
}

TEST_P(CloneAttributes, ThatAreALinkApplyToNothing)
{
    author_.symlink("a", "s/.gitattributes");
    addsFiles_(author_);
    publish("other", "x");
    expectClonedAsByGit();
}

INSTANTIATE_TEST_SUITE_P(Each, CloneAttributes,
                         testing::Values(Naming::PlainPath, Naming::FileUrl));

} // namespace

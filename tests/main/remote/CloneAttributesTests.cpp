// SPDX-License-Identifier: MIT
#include "main/checkout/CloneWatch.hpp"

#include <filesystem>
#include <string>
#include <vector>

#include <git2/errors.h>
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

/// libgit2 would convert the binary file. git takes the value for unset.
TEST_P(CloneAttributes, AreNotIgnoredForASettingThatCannotBeRead)
{
    author_.write(".gitattributes", "*.bin binary\n");
    publish("p.bin", "a\nb\r\n");
    repository_.git({"config", "--global", "core.eol", "auto"});
    const Failure failure = failureOf([this] { generate(); });
    EXPECT_EQ(failure.code, GIT_ERROR);
    EXPECT_EQ(failure.errorClass, GIT_ERROR_CONFIG);
    EXPECT_THAT(failure.text, testing::HasSubstr("core.eol is 'auto'"));
    EXPECT_FALSE(std::filesystem::exists(clone_.path()));
    clone_.makeFolder("");
    failureOf([this] { generate(); });
    EXPECT_TRUE(std::filesystem::is_empty(clone_.path()));
    repository_.git({"config", "--global", "core.eol", "native"});
    expectClonedAsByGit();
}

INSTANTIATE_TEST_SUITE_P(Each, CloneAttributes,
                         testing::Values(Naming::PlainPath, Naming::FileUrl));

} // namespace

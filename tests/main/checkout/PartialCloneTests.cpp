// SPDX-License-Identifier: MIT
#include "main/checkout/PromisedContent.hpp"

#include <string>

#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"
#include "support/text.hpp"

namespace
{

using namespace vclink::test;

/// A clone that has all commits and folders, and only the contents of the checked-out files. git
/// fetches the others when it needs them, libgit2 does not.
class PartialClone : public ObstacleFixture
{
  protected:
    PartialClone()
    {
        makeBranch("topic",
                   writes("d/f", "theirs\n") + writes("file", "theirs\n") + removes("other"));
        const auto source = folder() / "source";
        std::filesystem::rename(repository_.path(), source);
        const GitRepository origin(source);
        origin.git({"config", "uploadpack.allowFilter", "true"});
        origin.git({"clone", "--quiet", "--filter=blob:none", "file://" + source.string(),
                    repository_.path().string()});
        repository_.git({"branch", "topic", "origin/topic"});
    }
    static Failure lacking(const std::string &name)
    {
        return refusal("the content of '" + name +
                       "' is not in this partial clone, and only git fetches it: use git for this");
    }
};

TEST_F(PartialClone, IsLeftByASwitchThatLacksAFile)
{
    expectSwitchRefused(lacking("d/f"));
    repository_.git({"switch", "--quiet", "topic"});
    repository_.git({"switch", "--quiet", "main"});
    branches().switchBranch("topic");
    EXPECT_TRUE(status().empty());
}

TEST_F(PartialClone, IsLeftByAFastForwardThatLacksAFile)
{
    expectMergeRefused(lacking("d/f"));
}

TEST_F(PartialClone, IsLeftByAMergeThatLacksAFile)
{
    repository_.commitAll(writes("new", "x"), "ours");
    expectMergeRefused(lacking("d/f"));
}

/// There is no notification of this conflict.
TEST_F(PartialClone, IsLeftByAMergeThatLacksAFileInConflict)
{
    repository_.commitAll(removes("d/f") + removes("file"), "ours");
    expectMergeRefused(lacking("d/f"));
}

TEST_F(PartialClone, IsLeftByARevertThatLacksAFile)
{
    repository_.git({"update-ref", "refs/heads/main", "topic"});
    repository_.git({"read-tree", "main"});
    expectNothingChanges(
        [this]
        {
            const auto revert = [this]
            { adapter_->revertFiles({asPath((repository_ / "d/f").string())}); };
            EXPECT_EQ(failureOf(revert), lacking("d/f"));
        });
    EXPECT_EQ(repository_.read("d/f"), "f\n");
}

} // namespace

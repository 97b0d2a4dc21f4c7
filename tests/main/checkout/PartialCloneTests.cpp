// SPDX-License-Identifier: MIT
#include "main/checkout/PromisedContent.hpp"

#include <filesystem>
#include <string>
#include <vector>

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
                   writes("d/f", "theirs\n") + writes("file", "theirs, too\n") + removes("other"));
        std::filesystem::rename(repository_.path(), source_);
        const GitRepository origin(source_);
        origin.git({"config", "uploadpack.allowFilter", "true"});
        origin.git({"config", "uploadpack.allowAnySHA1InWant", "true"});
        clone(repository_.path(), {"--filter=blob:none"});
        repository_.git({"branch", "topic", "origin/topic"});
    }
    void clone(const std::filesystem::path &target, const std::vector<std::string> &options) const
    {
        std::vector<std::string> arguments{"clone", "--quiet", "file://" + source_.string(),
                                           target.string()};
        arguments.insert(arguments.begin() + 2, options.begin(), options.end());
        GitRepository(source_).git(arguments);
    }
    /// Clones again, such that all packs are in another partial clone, which has one of two files.
    void borrow()
    {
        const std::string lender = (folder() / "lender").string();
        std::filesystem::rename(repository_.path(), lender);
        GitRepository(lender).git({"cat-file", "blob", "topic:d/f"});
        clone(repository_.path(), {"--filter=blob:none", "--reference", lender});
        repository_.git({"branch", "topic", "origin/topic"});
        EXPECT_TRUE(std::filesystem::is_empty(repository_ / ".git/objects/pack"));
    }
    static Failure lacking(const std::string &name)
    {
        return refusal("the content of '" + name +
                       "' is not in this partial clone, and only git fetches it: use git for this");
    }

    const std::filesystem::path source_ = folder() / "source";
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

TEST_F(PartialClone, IsLeftByASwitchIfItBorrowsAllItsPacks)
{
    borrow();
    expectSwitchRefused(lacking("file"));
    repository_.git({"switch", "--quiet", "topic"});
    repository_.git({"switch", "--quiet", "main"});
    branches().switchBranch("topic");
    EXPECT_TRUE(status().empty());
}

TEST_F(PartialClone, IsLeftByASwitchIfItBorrowsFromARepositoryThatBorrows)
{
    borrow();
    const auto between = folder() / "between";
    std::filesystem::rename(repository_.path(), between);
    GitRepository(between).write(".git/objects/info/alternates",
                                 "# a comment\n\n../../../between/.git/objects\n" +
                                     (folder() / "lender/.git/objects").string() + '\n');
    clone(repository_.path(), {"--filter=blob:none", "--reference", between.string()});
    repository_.git({"branch", "topic", "origin/topic"});
    repository_.write(".git/objects/info/alternates", "../../../between/.git/objects\n");
    expectSwitchRefused(lacking("file"));
}

/// For git and libgit2, that one borrows nothing then.
TEST_F(PartialClone, IsRecognisedIfItBorrowsFromAnotherUsersRepository)
{
    repository_.write(".git/objects/info/alternates", "../lender\n");
    repository_.write(".git/lender/info/alternates", "/nowhere\n");
    EXPECT_EQ(runUnprivileged(
                  ".git/lender/info", 0,
                  [this] { return failureOf([this] { branches().switchBranch("topic"); }).text; }),
              lacking("d/f").text);
}

/// git leaves the files out.
TEST_F(PartialClone, IsLeftByASwitchOfARepositoryThatBorrowsFromIt)
{
    const auto lender = folder() / "lender";
    std::filesystem::rename(repository_.path(), lender);
    GitRepository(source_).git(
        {"clone", "--quiet", "--shared", lender.string(), repository_.path().string()});
    repository_.git({"branch", "topic", "origin/topic"});
    expectSwitchRefused(lacking("d/f"));
}

} // namespace

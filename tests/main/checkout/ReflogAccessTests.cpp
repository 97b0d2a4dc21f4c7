// SPDX-License-Identifier: MIT
#include "util/repository/reflogAccess.hpp"

#include <string>

#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"

namespace
{

using namespace vclink::test;

/// A reflog that the user may not write to, since root has used git once. libgit2 finds that out
/// when the reference moves, after the files were written.
class ReflogAccess : public ObstacleFixture
{
  protected:
    std::string denied(const std::string &what, const std::string &name) const
    {
        return "could not " + what + " '" + (repository_ / name).string() + "': Permission denied";
    }
};

TEST_F(ReflogAccess, IsNeededForASwitch)
{
    makeBranch("topic", writes("file", "theirs\n"));
    EXPECT_EQ(runUnprivileged(
                  ".git/logs/HEAD", 0444,
                  [this] { return failureOf([this] { branches().switchBranch("topic"); }).text; }),
              denied("append to", ".git/logs/HEAD"));
}

TEST_F(ReflogAccess, IsNeededForFastForwardsAndMerges)
{
    makeBranch("ahead", writes("file", "theirs\n"));
    diverge(writes("ours", "x"), writes("theirs", "x"));
    repository_.git({"branch", "old", "main~"});
    repository_.git({"switch", "--quiet", "old"});
    const auto expectMergesRefused = [this](const std::string &name, const std::string &other)
    {
        EXPECT_EQ(runUnprivileged(name, 0444, [&] { return failureOfMerge(other); }),
                  textOf({GIT_ERROR, GIT_ERROR_OS, denied("append to", name)}));
    };
    expectMergesRefused(".git/logs/HEAD", "ahead");
    expectMergesRefused(".git/logs/refs/heads/old", "ahead");
    repository_.git({"switch", "--quiet", "main"});
    expectMergesRefused(".git/logs/HEAD", "topic");
    expectMergesRefused(".git/logs/refs/heads/main", "topic");
}

/// Otherwise the branch would stay, without its configuration.
TEST_F(ReflogAccess, IsNeededForTheDeletionOfABranch)
{
    repository_.git({"branch", "topic"});
    repository_.git({"config", "branch.topic.description", "kept"});
    EXPECT_EQ(runUnprivileged(
                  ".git/logs/refs/heads", 0555,
                  [this] { return failureOf([this] { branches().deleteBranch("topic"); }).text; }),
              denied("remove", ".git/logs/refs/heads/topic"));
    EXPECT_EQ(repository_.git({"config", "branch.topic.description"}), "kept\n");
}

} // namespace

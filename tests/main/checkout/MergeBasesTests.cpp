// SPDX-License-Identifier: MIT
#include <string>

#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"
#include "support/text.hpp"

namespace
{

/// Two histories with two merge bases, which both add "d/p" and "d/q". Ours has deleted them since;
/// theirs has "d/p" as one base and "d/q" as the other, so that no base alone shows both as
/// changed.
class MergeBases : public vclink::test::ObstacleFixture
{
  protected:
    MergeBases()
    {
        diverge([this] { writeBoth("of ours\n", "of ours\n"); },
                [this] { writeBoth("of theirs\n", "of theirs\n"); });
        repository_.git({"branch", "base", "main"});
        repository_.git({"merge", "--quiet", "--strategy=ours", "topic"});
        repository_.remove("d/p");
        repository_.remove("d/q");
        repository_.commitAll("without both");
        repository_.git({"checkout", "--quiet", "topic"});
        repository_.git({"merge", "--quiet", "--strategy=ours", "base"});
        writeBoth("of ours\n", "of theirs\n");
        repository_.commitAll("one of each");
        repository_.git({"checkout", "--quiet", "main"});
    }

  private:
    void writeBoth(const std::string &first, const std::string &second)
    {
        repository_.write("d/p", first);
        repository_.write("d/q", second);
    }
};

TEST_F(MergeBases, AreAllLookedAt)
{
    ASSERT_EQ(
        vclink::test::splitLines(repository_.git({"merge-base", "--all", "main", "topic"})).size(),
        2U);
    for (const std::string name : {"d/p", "d/q"})
    {
        repository_.write(name, "mine\n");
        expectMergeRefused(inTheWay("untracked file '" + name + "'"));
        EXPECT_EQ(repository_.read(name), "mine\n");
        repository_.remove(name);
    }
    expectConflicts("topic");
}

} // namespace

// SPDX-License-Identifier: MIT
#include <functional>
#include <string>

#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"
#include "support/text.hpp"

namespace
{

using namespace vclink::test;

/// Two histories with two merge bases, which both add "d/p" and "d/q". Ours has deleted them since;
/// theirs has "d/p" as one base and "d/q" as the other, so that no base alone shows both as
/// changed.
class MergeBases : public ObstacleFixture
{
  protected:
    MergeBases()
    {
        diverge(writesEach({"d/p", "d/q"}, "of ours\n"), writesEach({"d/p", "d/q"}, "of theirs\n"));
        repository_.git({"branch", "base", "main"});
        repository_.git({"merge", "--quiet", "--strategy=ours", "topic"});
        repository_.commitAll(removes("d/p") + removes("d/q"), "without both");
        repository_.git({"checkout", "--quiet", "topic"});
        repository_.git({"merge", "--quiet", "--strategy=ours", "base"});
        repository_.commitAll(writes("d/p", "of ours\n") + writes("d/q", "of theirs\n"),
                              "one of each");
        repository_.git({"checkout", "--quiet", "main"});
    }

    /// Has two branches, "one" and "two", change a name and merge each other, so that each keeps
    /// what the other had first. Then merges them.
    void expectBetweenSides(const std::string &name,
                            const std::function<Change(const std::string &)> &change,
                            const std::string &text)
    {
        repository_.commitAll(writes(name, "old\n") + writes("x.lock", "tracked\n"), "old");
        repository_.git({"branch", "one"});
        repository_.git({"branch", "two"});
        const auto commitOn = [&](const std::string &branch, const std::string &content)
        {
            repository_.git({"switch", "--quiet", branch});
            repository_.commitAll(change(content), content);
        };
        commitOn("one", "first\n");
        commitOn("two", "second\n");
        repository_.git({"branch", "second", "two"});
        repository_.git({"merge", "--quiet", "--strategy=ours", "--no-edit", "one"});
        commitOn("two", "first\n");
        repository_.git({"switch", "--quiet", "one"});
        repository_.git({"merge", "--quiet", "--strategy=ours", "--no-edit", "second"});
        commitOn("one", "second\n");
        repository_.git({"branch", "--force", "topic", "two"});
        expectMergeRefused(refusal(text));
    }
};

TEST_F(MergeBases, AreAllLookedAt)
{
    ASSERT_EQ(split(repository_.git({"merge-base", "--all", "main", "topic"})).size(), 2U);
    expectEachRefused({{writes("d/p", "mine\n"), inTheWay("untracked file 'd/p'")},
                       {writes("d/q", "mine\n"), inTheWay("untracked file 'd/q'")}});
    expectConflicts("topic");
}

/// Neither base shows a conflict of "x", but both together have one.
TEST_F(MergeBases, TogetherCanMakeAConflictBesideALock)
{
    expectBetweenSides(
        "x", [](const std::string &text) { return writes("x", text); },
        "the conflict in 'x' cannot be written beside 'x.lock': merge with 'git merge'");
}

TEST_F(MergeBases, TogetherCanMakeAConflictOfALinkAndAFolder)
{
    expectBetweenSides(
        "y",
        [](const std::string &text)
        { return removes("y") + (text == "first\n" ? links("file", "y") : writes("y/z", text)); },
        "'y' is a link of one side and a folder of the other, and there are several merge bases: "
        "merge with 'git merge'");
}

TEST_F(MergeBases, LetAFileBesideALockChangeOnOneSide)
{
    repository_.git({"checkout", "--quiet", "topic"});
    repository_.write("file.lock", "tracked\n");
    repository_.write("file", "theirs\n");
    repository_.commitAll("beside a lock");
    repository_.git({"checkout", "--quiet", "main"});
    expectConflicts("topic");
    EXPECT_EQ(repository_.read("file"), "theirs\n");
}

} // namespace

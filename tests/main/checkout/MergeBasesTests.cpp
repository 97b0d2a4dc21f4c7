// SPDX-License-Identifier: MIT
#include <functional>
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

    /// Has two branches, "one" and "two", change a name and merge each other, so that each keeps
    /// what the other had first. Then merges them.
    void expectBetweenSides(const std::string &name,
                            const std::function<void(const std::string &)> &change,
                            const std::string &text)
    {
        repository_.write(name, "old\n");
        repository_.write("x.lock", "tracked\n");
        repository_.commitAll("old");
        repository_.git({"branch", "one"});
        repository_.git({"branch", "two"});
        const auto commitOn = [&](const std::string &branch, const std::string &content)
        {
            repository_.git({"switch", "--quiet", branch});
            change(content);
            repository_.commitAll(content);
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

/// Neither base shows a conflict of "x", but both together have one.
TEST_F(MergeBases, TogetherCanMakeAConflictBesideALock)
{
    expectBetweenSides(
        "x", [this](const std::string &text) { repository_.write("x", text); },
        "the conflict in 'x' cannot be written beside 'x.lock': merge with 'git merge'");
}

TEST_F(MergeBases, TogetherCanMakeAConflictOfAFileAndAFolder)
{
    expectBetweenSides(
        "y",
        [this](const std::string &text)
        {
            repository_.remove("y");
            text == "first\n" ? repository_.symlink("file", "y") : repository_.write("y/z", text);
        },
        "'y' is a file of one side and a folder of the other, and there are several merge bases: "
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

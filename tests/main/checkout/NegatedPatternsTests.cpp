// SPDX-License-Identifier: MIT
#include "main/checkout/negatedPatterns.hpp"

#include <filesystem>
#include <fstream>
#include <string>

#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"
#include "support/Sentence.hpp"

namespace
{

using namespace vclink::test;

/// Patterns that except a file from being ignored, and that libgit2 leaves out.
struct Negation : Sentence
{
    std::string file;
    /// of .gitignore, of d/.gitignore, and of core.excludesFile
    std::string root;
    std::string inner = {};
    std::string global = {};
};

class NegatedPatterns : public ObstacleFixture, public testing::WithParamInterface<Negation>
{
  protected:
    NegatedPatterns()
    {
        std::ofstream(environment().home() / "ignore") << GetParam().global;
        repository_.git(
            {"config", "core.excludesFile", (environment().home() / "ignore").string()});
        repository_.write(".gitignore", GetParam().root);
        if (!GetParam().inner.empty())
        {
            repository_.write("d/.gitignore", GetParam().inner);
        }
        repository_.git({"add", "--force", "."});
        repository_.commitAll("patterns");
    }
    Change addsForced() const
    {
        return writes(GetParam().file, "theirs\n") +
               runsGit({"add", "--force", "--", GetParam().file});
    }
};

TEST_P(NegatedPatterns, KeepUntrackedFilesAsInGit)
{
    const std::string &file = GetParam().file;
    makeBranch("topic", addsForced());
    repository_.write(file, "mine\n");
    ASSERT_FALSE(repository_.tryGit({"check-ignore", "--quiet", file}).succeeded());
    const Failure failure = inTheWay("untracked file '" + file + "'");
    expectSwitchRefused(failure);
    expectMergeRefused(failure);
    repository_.remove(file);
    repository_.commitAll(writes("ours", "x"), "ours");
    repository_.write(file, "mine\n");
    expectMergeRefused(failure);
}

INSTANTIATE_TEST_SUITE_P(
    Of, NegatedPatterns,
    testing::Values(Negation{{"AFolderAndAName"}, "d/README", "d/*\n!README\n"},
                    Negation{{"AFolderAndAPattern"}, "d/x.log", "d/*.log\n!x.log\n"},
                    Negation{{"ANestedFile"}, "d/x.log", "*.log\n", "!x.log\n"},
                    Negation{{"ANestedFileFromItsFolder"}, "d/x.log", "*.log\n", "!/x.log\n"},
                    Negation{{"AnotherFile"}, "x.log", "!x.log\n", "", "*.log\n"},
                    Negation{{"AFolderAbove"}, "d/e/a", "d/*/a\n", "!e/a\n"},
                    Negation{{"AnEscapedBlank"}, "d/README ", "d/*\n", "!README\\ \n"},
                    Negation{{"ANameWithATab"}, "d/README\t", "d/*\n", "!README\t\n"},
                    Negation{{"ANameWithACarriageReturn"}, "d/x\r", "d/*\n", "!x\r\r\n"},
                    Negation{{"AClassAndATab"}, "d/xy\t", "d/*\n", "![!X]y\t\n"},
                    // No negations, but also other patterns for libgit2 than for git.
                    Negation{{"ATabAtTheEnd"}, "x.log", "*.log\t\n"},
                    Negation{{"ATabAndACarriageReturn"}, "x.log", "x.log \t \r\n"},
                    Negation{{"AFormFeed"}, "d/x.log", "d/*.log\f# logs\n"},
                    Negation{{"ABackslashAtTheEnd"}, "d/x.log", "d\\\r\n"},
                    Negation{{"ABackslashBeforeTheLastSlash"}, "d/x.log", "d\\/\n"},
                    Negation{{"AnEscapedBlankAndATab"}, "d/x ", "*\\ \t\n"},
                    Negation{{"ACarriageReturnInFront"}, "x.log", "x\n\rx.log\n"},
                    Negation{{"AClassThatCountsCase"}, "x.log", "[!X].log\t\n"},
                    Negation{{"AClassWithASlash"}, "x.log", "x[/.]log\t\n"}),
    testing::PrintToStringParamName());

/// git does not follow the link.
class LinkedPatterns : public ObstacleFixture, public testing::WithParamInterface<std::string>
{
};

TEST_P(LinkedPatterns, KeepUntrackedFilesAsInGit)
{
    repository_.write("patterns", "*.log\n");
    repository_.symlink((repository_ / "patterns").string(), GetParam());
    repository_.commitAll("patterns");
    makeBranch("topic", writes("d/x.log", "theirs\n") + runsGit({"add", "--force", "d/x.log"}));
    repository_.write("d/x.log", "mine\n");
    const Failure failure = inTheWay("untracked file 'd/x.log'");
    expectSwitchRefused(failure);
    repository_.remove("d/x.log");
    repository_.commitAll(writes("ours", "x"), "ours");
    repository_.write("d/x.log", "mine\n");
    expectMergeRefused(failure);
}

INSTANTIATE_TEST_SUITE_P(In, LinkedPatterns, testing::Values(".gitignore", "d/.gitignore"),
                         [](const auto &row) { return row.index == 0 ? "TheRoot" : "AFolder"; });

/// git reads the patterns that a sparse checkout leaves out from the index.
class LeftOutPatterns : public ObstacleFixture
{
};

TEST_F(LeftOutPatterns, KeepUntrackedFilesAsInGit)
{
    repository_.write(".gitignore", "d/*\n!d/.gitignore\n");
    repository_.write("d/.gitignore", "!README\n");
    repository_.commitAll("patterns");
    makeBranch("topic", writes("d/README", "theirs\n"));
    repository_.commitAll(writes("ours", "x"), "ours");
    repository_.git({"update-index", "--skip-worktree", "d/.gitignore"});
    repository_.remove("d/.gitignore");
    repository_.write("d/README", "mine\n");
    ASSERT_FALSE(repository_.tryGit({"check-ignore", "--quiet", "d/README"}).succeeded());
    ASSERT_FALSE(repository_.tryGit({"switch", "topic"}).succeeded());
    const Failure failure = inTheWay("untracked file 'd/README'");
    expectSwitchRefused(failure);
    expectMergeRefused(failure);
    // Its patterns count for nothing once git does not read them from the index.
    repository_.git({"update-index", "--no-skip-worktree", "d/.gitignore"});
    repository_.git({"rm", "--quiet", "--cached", "d/.gitignore"});
    repository_.commit("without");
    merge("topic");
    EXPECT_EQ(repository_.read("d/README"), "theirs\n");
}

/// Overwritten by a merge, as in git.
class IgnoredFiles : public ObstacleFixture
{
};

/// libgit2 follows the link, and takes it for a folder.
TEST_F(IgnoredFiles, AreNotLinksInThePlaceOfAnIgnoredFolder)
{
    ignore("build/");
    diverge(writes("ours", "x"),
            writes("build/x", "theirs\n") + runsGit({"add", "--force", "build"}));
    repository_.symlink(outside_.path().string(), "build");
    expectMergeRefused(inTheWay("symbolic link 'build'"));
    EXPECT_TRUE(std::filesystem::is_symlink(repository_ / "build"));
}

TEST_F(IgnoredFiles, AreNotKeptBecauseAnotherNameIsExcepted)
{
    repository_.commitAll(writes(".gitignore", "*.log\n!keep.log\n"), "patterns");
    makeBranch("topic", writes("x.log", "theirs\n") + runsGit({"add", "--force", "x.log"}));
    repository_.write("x.log", "mine\n");
    merge("topic");
    EXPECT_EQ(repository_.read("x.log"), "theirs\n");
}

} // namespace

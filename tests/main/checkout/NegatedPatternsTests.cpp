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
                    // No negations, but also other patterns for libgit2 than for git.
                    Negation{{"ATabAtTheEnd"}, "x.log", "*.log\t\n"},
                    Negation{{"ATabAndACarriageReturn"}, "x.log", "x.log \t \r\n"},
                    Negation{{"AFormFeed"}, "d/x.log", "d/*.log\f# logs\n"}),
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

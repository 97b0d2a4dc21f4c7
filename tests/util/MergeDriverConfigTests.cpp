// SPDX-License-Identifier: MIT
// Where a driver's command may be configured.
#include <filesystem>
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "MergeDriverTest.hpp"

namespace
{

namespace fs = std::filesystem;

class MergeDriverConfig : public vclink::test::MergeDriverTest
{
  protected:
    MergeDriverConfig()
    {
        makeConflict();
    }
    /// A command that merges to a text.
    std::string commandFor(const std::string &text)
    {
        return scripts_.shell("echo " + text + " >\"$1\"") + " %A";
    }
    void defineIn(const fs::path &file, const std::string &command) const
    {
        fs::create_directories(file.parent_path());
        repository_.git({"config", "--file", file.string(), "merge.tool.driver", command});
    }
    std::string merged() const
    {
        EXPECT_EQ(merge(), 0);
        const std::string text = repository_.read("file");
        repository_.git({"reset", "--quiet", "--hard"});
        return text;
    }
};

TEST_F(MergeDriverConfig, MayStandAtAnyLevelTheNearestCounts)
{
    defineIn(folder() / "etc/gitconfig", commandFor("system"));
    EXPECT_EQ(merged(), "system\n");
    defineIn(environment().home() / ".config/git/config", commandFor("xdg"));
    EXPECT_EQ(merged(), "xdg\n");
    defineIn(environment().home() / ".gitconfig", commandFor("global"));
    EXPECT_EQ(merged(), "global\n");
    define("tool", commandFor("repository"));
    EXPECT_EQ(merged(), "repository\n");
}

TEST_F(MergeDriverConfig, MayStandInAnIncludedFile)
{
    defineIn(folder() / "included", commandFor("included"));
    repository_.git({"config", "include.path", folder() / "included"});
    EXPECT_EQ(merged(), "included\n");
}

TEST_F(MergeDriverConfig, CountsWithItsLastValue)
{
    define("tool", commandFor("first"));
    repository_.git({"config", "--add", "merge.tool.driver", commandFor("second")});
    EXPECT_EQ(merged(), "second\n");
}

TEST_F(MergeDriverConfig, IsReadAgainForEveryMerge)
{
    define("tool", commandFor("first"));
    EXPECT_EQ(merged(), "first\n");
    define("tool", commandFor("second"));
    EXPECT_EQ(merged(), "second\n");
}

TEST_F(MergeDriverConfig, IsNotLookedForUnderAnotherSpellingOfTheName)
{
    define("Tool", commandFor("other"));
    EXPECT_NE(merged(), "other\n");
}

} // namespace

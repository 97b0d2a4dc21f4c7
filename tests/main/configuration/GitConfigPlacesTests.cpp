// SPDX-License-Identifier: MIT
#include <map>
#include <string>
#include <type_traits>

#include <git2.h>
#include <gtest/gtest.h>

#include "GitConfigFixture.hpp"
#include "support/Descriptors.hpp"
#include "support/Failure.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

using vclink::git::GitConfig;
using namespace vclink::test;

/// Where libgit2 looks when it starts.
class GitConfigPlaces : public GitConfigFixture
{
  protected:
    /// What the diff tool's value is, or the code of the constructor's failure.
    static std::string describe()
    {
        std::string found;
        const auto failure = failureIfAny(
            [&found]
            {
                const GitConfig config;
                found = shown(config.readDiffTool()) +
                        (config.globalFilePath() ? ", path" : ", no path");
            });
        return failure ? "raised " + std::to_string(failure->code) : found;
    }
};

TEST_F(GitConfigPlaces, OfWhichThereAreNoneMakeTheConstructorRaise)
{
    EXPECT_EQ(runIn({{"HOME", ""}, {"XDG_CONFIG_HOME", ""}}, describe),
              "raised " + std::to_string(GIT_ENOTFOUND));
}

TEST_F(GitConfigPlaces, WithTheXdgFolderAloneAreEnoughOnceItHasAFile)
{
    const std::map<std::string, std::string> environment{
        {"HOME", ""}, {"XDG_CONFIG_HOME", xdg().parent_path().parent_path()}};
    EXPECT_EQ(runIn(environment, describe), "raised " + std::to_string(GIT_ENOTFOUND));
    writeFile(xdg(), "[difftool \"vkDiff\"]\n\tcmd = of the folder\n");
    EXPECT_EQ(runIn(environment, describe), "of the folder, no path");
}

TEST_F(GitConfigPlaces, WithTheHomeFolderAreEnoughWithoutAnyFile)
{
    const std::string home = environment().home();
    EXPECT_EQ(runIn({{"HOME", home}, {"XDG_CONFIG_HOME", ""}}, describe), "no value, no path");
    writeFile(global(), "[difftool \"vkDiff\"]\n\tcmd = of the home\n");
    EXPECT_EQ(runIn({{"HOME", home}, {"XDG_CONFIG_HOME", ""}}, describe), "of the home, path");
}

TEST_F(GitConfigPlaces, HaveTheXdgFolderInTheHomeFolderByDefault)
{
    writeFile(xdg(), "[difftool \"vkDiff\"]\n\tcmd = of the folder\n");
    EXPECT_EQ(runIn({{"HOME", environment().home()}, {"XDG_CONFIG_HOME", ""}}, describe),
              "of the folder, no path");
}

/// GitConfig keeps libgit2 alive, and leaves nothing behind where it cannot be made.
TEST_F(GitConfigPlaces, AreReadByAnObjectThatStartsLibGit2)
{
    const int before = countLibGit2Starts();
    {
        const GitConfig config;
        EXPECT_EQ(countLibGit2Starts(), before + 1);
    }
    EXPECT_EQ(countLibGit2Starts(), before);
    writeFile(global(), "[broken\n");
    EXPECT_THROW(GitConfig(), vclink::git::LibGit2Exception);
    const NoDescriptorLeak noLeak;
    EXPECT_THROW(GitConfig(), vclink::git::LibGit2Exception);
    EXPECT_EQ(countLibGit2Starts(), before);
    EXPECT_FALSE(std::is_copy_constructible_v<GitConfig>);
    EXPECT_FALSE(std::is_copy_assignable_v<GitConfig>);
}

} // namespace

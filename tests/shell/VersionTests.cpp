// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellFixture.hpp"

namespace vclink::test
{
namespace
{

class ShellVersion : public ShellFixture
{
};

TEST_F(ShellVersion, TellsTheVersionsOfTheProgramAndOfLibGit2)
{
    const CommandResult result = shell({"version"}).run();
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_THAT(result.output, testing::MatchesRegex("vclink-shell [0-9]+\\.[0-9]+\\.[0-9]+\n"
                                                     "libgit2 [0-9]+\\.[0-9]+\\.[0-9]+\n"));
    EXPECT_THAT(result.output, testing::StartsWith("vclink-shell " VCLINK_SHELL_VERSION "\n"));
    EXPECT_EQ(result.errors, "");
}

} // namespace
} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellFixture.hpp"

namespace vclink::test
{
namespace
{

class ShellProbe : public ShellFixture
{
  protected:
    void expectAnswer(const std::string &name, const std::string &answer, int status) const
    {
        const CommandResult result = shell({"probe", name}).run();
        EXPECT_EQ(result.output, answer + "\n") << name;
        EXPECT_EQ(result.exitStatus, status) << name;
        EXPECT_EQ(result.errors, "") << name;
    }
};

TEST_F(ShellProbe, SaysYesForTheRootOfAWorkingCopyAndForABareRepository)
{
    makeRepository("copy");
    makeRepository("bare").git({"init", "--quiet", "--bare", "."});
    expectAnswer("copy", "yes", 0);
    expectAnswer("copy/", "yes", 0);
    expectAnswer((folder() / "copy").string(), "yes", 0);
    expectAnswer("bare", "yes", 0);
}

TEST_F(ShellProbe, SaysNoForAnyOtherFolder)
{
    makeRepository("copy").makeFolder("inside");
    std::filesystem::create_directory(folder() / "plain");
    expectAnswer("copy/inside", "no", 1);
    expectAnswer("plain", "no", 1);
    expectAnswer("missing", "no", 1);
}

TEST_F(ShellProbe, TakesAFolderAsSeenFromWhereItIsToWork)
{
    makeRepository("outer/copy");
    EXPECT_EQ(shell({"-C", "outer", "probe", "copy"}).run().output, "yes\n");
}

TEST_F(ShellProbe, TakesNamesThatAreNotUtf8)
{
    makeRepository("\xFF\xFE copy");
    expectAnswer("\xFF\xFE copy", "yes", 0);
}

TEST_F(ShellProbe, TellsWhyThereIsNoAnswer)
{
    const GitRepository copy = makeRepository("copy");
    copy.remove(".git");
    copy.write(".git", "no words of git's\n");
    const CommandResult result = shell({"probe", "copy"}).run();
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_THAT(result.errors, testing::StartsWith("vclink-shell: Git could not complete"));
}

} // namespace
} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ChangeFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;
using testing::Pair;
using testing::StartsWith;

/// What a revert makes of the index.
class ShellRevertIndex : public ChangeFixture
{
  protected:
    /// git's letter for the marks of each file, and its name.
    std::string marks() const
    {
        return repository_.git({"ls-files", "-v"});
    }
};

TEST_F(ShellRevertIndex, KeepsTheMarksOfFilesThatGitWasToldNotToLookAt)
{
    repository_.git({"update-index", "--assume-unchanged", "a", "folder/c"});
    repository_.git({"update-index", "--skip-worktree", "b", "folder/c"});
    const std::string before = marks();
    for (const std::vector<std::string> &arguments :
         {std::vector<std::string>{"revert", "."},
          std::vector<std::string>{"revert", "--forget", "a", "b", "folder/c"}})
    {
        for (const std::string name : {"a", "b", "folder/c"})
            repository_.write(name, "edited\n");
        succeed(arguments);
        EXPECT_EQ(repository_.read("a") + repository_.read("b"), "a\nb\n");
        EXPECT_EQ(marks(), before);
    }
}

TEST_F(ShellRevertIndex, StoresNothingAsStagedOfAFileThatIsOnlyIntendedToBeAdded)
{
    repository_.git({"rm", "--quiet", "--cached", "a"});
    repository_.write("a", "edited\n");
    repository_.write("new", "new\n");
    repository_.write("empty", "");
    repository_.git({"add", "--intent-to-add", "a", "new"});
    const CommandResult result = runIn(repository_.path(), {"revert", "."});
    EXPECT_THAT(result.errors, StartsWith("To restore what was discarded: "));
    EXPECT_THAT(result.errors, Not(HasSubstr("staged")));
    EXPECT_THAT(letters(), ElementsAre(Pair("empty", "??"), Pair("new", "??")));
    EXPECT_EQ(repository_.read("a"), "a\n");
    repository_.add({"empty"});
    EXPECT_THAT(runIn(repository_.path(), {"revert", "empty"}).errors, Not(HasSubstr("discarded")));
}

TEST_F(ShellRevertIndex, NamesAFileThatIsInThePlaceOfTheFolder)
{
    repository_.remove("folder");
    repository_.write("folder", "a file\n");
    EXPECT_EQ(refuse({"revert", "folder/c", "folder/deep/d"}),
              "Nothing was reverted:\n"
              "  folder/c: folder is a file now: move it out of the way, or revert it too\n"
              "  folder/deep/d: folder is a file now: move it out of the way, or revert it too\n");
    succeed({"revert", "folder", "folder/c"});
    EXPECT_EQ(repository_.read("folder/c"), "folder/c\n");
}

} // namespace
} // namespace vclink::test

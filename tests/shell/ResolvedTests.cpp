// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ChangeFixture.hpp"

namespace vclink::test
{
namespace
{

class ShellResolved : public ChangeFixture
{
};

TEST_F(ShellResolved, StagesAFileInConflictAsItStands)
{
    makeConflict();
    repository_.write("a", "solution\n");
    succeed({"resolved", "a"});
    EXPECT_EQ(letters().at("a"), "M ");
    EXPECT_EQ(repository_.git({"show", ":a"}), "solution\n");
}

TEST_F(ShellResolved, RemovesAFileThatIsGone)
{
    makeConflict();
    repository_.remove("a");
    succeed({"resolved", "a"});
    EXPECT_EQ(letters().at("a"), "D ");
}

TEST_F(ShellResolved, MarksOnlyTheFilesInConflictBelowAFolder)
{
    makeConflict();
    repository_.write("folder/c", "edited\n");
    repository_.write("new", "");
    succeed({"resolved", "."});
    EXPECT_EQ(letters().at("a"), "M ");
    EXPECT_EQ(letters().at("folder/c"), " M");
    EXPECT_EQ(letters().at("new"), "??");
}

TEST_F(ShellResolved, StagesAFileThatIsInNoConflictToo)
{
    repository_.write("b", "edited\n");
    repository_.write("new", "");
    succeed({"resolved", "b"});
    succeed({"resolved", "new"});
    EXPECT_EQ(letters().at("b"), "M ");
    EXPECT_EQ(letters().at("new"), "A ");
}

TEST_F(ShellResolved, RefusesWhatItCannotServe)
{
    const std::string refusal = "Nothing was marked as resolved:\n  ";
    EXPECT_EQ(refuse({"resolved", "nothing"}), refusal + "nothing: there is no such file\n");
    EXPECT_EQ(refuse({"resolved", "x.ignored"}), refusal + "x.ignored: it is ignored by Git\n");
    EXPECT_EQ(refuse({"resolved", "folder"}), refusal + "folder: no file in it is in conflict\n");
    EXPECT_EQ(refuse({"resolved", "../x"}), refusal + "../x: it lies outside the working copy " +
                                                repository_.path().string() + "\n");
}

TEST_F(ShellResolved, RefusesANameThatMeansFilesThatWereNotNamed)
{
    repository_.write("[ab]", "");
    repository_.write("b", "edited\n");
    EXPECT_EQ(refuse({"resolved", "[ab]"}),
              "Nothing was marked as resolved.\nA name with *, ? or [ is a pattern, and matches "
              "these files too:\n  b\nName them as well if you want them, or use git for the file "
              "with that name.\n");
}

} // namespace
} // namespace vclink::test

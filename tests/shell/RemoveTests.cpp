// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ChangeFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;

class ShellRemove : public ChangeFixture
{
};

const std::string noneToRemove = "There are no files to remove. Nothing was changed.\n";

TEST_F(ShellRemove, TakesFilesOutOfTheIndexAndLeavesThemOnTheDisk)
{
    repository_.write("folder/c", "edited\n");
    repository_.remove("b");
    succeed({"rm", "a", "b", "folder/c"});
    EXPECT_THAT(split(repository_.git({"ls-files", "-z"}), '\0'),
                ElementsAre(".gitignore", "folder/deep/d"));
    EXPECT_EQ(repository_.read("a"), "a\n");
    EXPECT_EQ(repository_.read("folder/c"), "edited\n");
}

TEST_F(ShellRemove, TakesTheTrackedFilesBelowAFolder)
{
    repository_.write("folder/new", "");
    succeed({"rm", "folder"});
    EXPECT_THAT(split(repository_.git({"ls-files", "-z"}), '\0'),
                ElementsAre(".gitignore", "a", "b"));
    EXPECT_EQ(repository_.read("folder/deep/d"), "folder/deep/d\n");
}

TEST_F(ShellRemove, TakesTheTrackedFilesBelowAFolderThatIsGone)
{
    repository_.remove("folder");
    succeed({"rm", "folder"});
    EXPECT_THAT(letters(), ElementsAre(Pair("folder/c", "D "), Pair("folder/deep/d", "D ")));
}

TEST_F(ShellRemove, TakesAllTrackedFilesForTheRoot)
{
    for (const std::string name : {"#odd/file", "!odd/file", "odd [1]/file", "#file", "end /file"})
        repository_.write(name, "");
    repository_.commitAll("odd");
    repository_.write("new", "");
    succeed({"rm", "."});
    EXPECT_EQ(repository_.git({"ls-files"}), "");
}

TEST_F(ShellRemove, PassesOverFilesThatAreRemovedAlready)
{
    succeed({"rm", "a"});
    succeed({"rm", "a", "b"});
    EXPECT_EQ(letters().size(), 2U);
    EXPECT_EQ(refuse({"rm", "a"}), noneToRemove);
}

TEST_F(ShellRemove, TakesRenamedFilesByBothTheirNamesAndBelowAFolder)
{
    repository_.git({"mv", "a", "renamed"});
    repository_.git({"mv", "folder/c", "folder/e"});
    succeed({"rm", "a", "renamed", "b", "folder"});
    EXPECT_EQ(repository_.git({"ls-files"}), ".gitignore\n");
    EXPECT_EQ(repository_.read("renamed") + repository_.read("folder/e"), "a\nfolder/c\n");
}

TEST_F(ShellRemove, SaysThatAllBelowAFolderIsRemovedAlready)
{
    succeed({"rm", "folder"});
    EXPECT_EQ(refuse({"rm", "folder"}), noneToRemove);
}

TEST_F(ShellRemove, RefusesEachNameThatNoTrackedFileHas)
{
    repository_.write("new", "");
    repository_.write("loose/new", "");
    EXPECT_EQ(refuse({"rm", "a", "new", "loose", "nothing", "x.ignored", ".."}),
              "Nothing was removed:\n"
              "  new: it is not tracked by Git\n"
              "  loose: Git tracks no file in it\n"
              "  nothing: there is no such file\n"
              "  x.ignored: it is ignored by Git\n"
              "  ..: it lies outside the working copy " +
                  repository_.path().string() + "\n");
}

TEST_F(ShellRemove, TakesATrackedFileThatIsIgnored)
{
    repository_.add({"x.ignored"});
    succeed({"rm", "x.ignored"});
    EXPECT_THAT(letters(), IsEmpty());
    EXPECT_EQ(repository_.read("x.ignored"), "");
}

TEST_F(ShellRemove, RefusesANameThatMeansFilesThatWereNotNamed)
{
    repository_.write("*", "");
    repository_.commitAll("pattern");
    EXPECT_EQ(refuse({"rm", "*"}),
              "Nothing was removed.\nA name with *, ? or [ is a pattern, and matches these files "
              "too:\n  .gitignore\n  a\n  b\n  folder/c\n  folder/deep/d\nName them as well if you "
              "want them, or use git for the file with that name.\n");
}

TEST_F(ShellRemove, TakesASubmoduleAsOneEntry)
{
    GitRepository inner = makeRepository("inner");
    inner.write("file", "");
    inner.commitAll("begin");
    repository_.git({"-c", "protocol.file.allow=always", "submodule", "--quiet", "add",
                     inner.path().string(), "sub"});
    repository_.commitAll("with a submodule");
    succeed({"rm", "sub"});
    EXPECT_EQ(letters().at("sub"), "D ");
}

} // namespace
} // namespace vclink::test

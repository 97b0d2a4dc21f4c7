// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/AdapterFixture.hpp"
#include "support/text.hpp"

namespace
{

using testing::ElementsAre;
using namespace vclink::test;

class FolderStates : public AdapterFixture
{
  protected:
    GitRepository repository_ = makeRepository();
};

TEST_F(FolderStates, OfTheRootAreThoseOfTheWholeTree)
{
    repository_.commitAll(writes("a", "x") + writes("sub/b", "x"), "first");
    repository_.write("sub/deep/c", "x");
    const States all{{"a", "Clean"}, {"sub/b", "Clean"}, {"sub/deep/c", "Unversioned"}};
    EXPECT_EQ(folderStates(repository_, ""), all);
    EXPECT_EQ(folderStates(repository_, "."), all);
    EXPECT_EQ(folderStates(repository_, "sub/.."), all);
}

TEST_F(FolderStates, OfASubfolderAreThoseBelowItAtAnyDepth)
{
    for (const auto *name : {"a", "sub/b", "sub/deep/c", "subway/d", "x/sub/e"})
        repository_.write(name, "x");
    EXPECT_EQ(folderStates(repository_, "sub"),
              (States{{"sub/b", "Unversioned"}, {"sub/deep/c", "Unversioned"}}));
    EXPECT_EQ(folderStates(repository_, "sub/deep"), (States{{"sub/deep/c", "Unversioned"}}));
    EXPECT_EQ(folderStates(repository_, "sub/"), folderStates(repository_, "sub"));
}

TEST_F(FolderStates, LeaveIgnoredFilesOut)
{
    repository_.write(".gitignore", "*.o\nbuild/\n");
    for (const auto *name : {"a.c", "a.o", "build/b.c", "sub/c.o"})
        repository_.write(name, "x");
    EXPECT_EQ(folderStates(repository_, ""),
              (States{{".gitignore", "Unversioned"}, {"a.c", "Unversioned"}}));
    EXPECT_EQ(folderStates(repository_, "build"), States());
}

TEST_F(FolderStates, OfAFolderThatIsGoneAreThoseOfItsTrackedFiles)
{
    repository_.commitAll(writes("sub/a", "x"), "first");
    repository_.remove("sub");
    EXPECT_EQ(folderStates(repository_, "sub"), (States{{"sub/a", "Missing"}}));
}

TEST_F(FolderStates, OfNoFolderBelowTheRootAreNone)
{
    EXPECT_EQ(folderStates(repository_, ""), States()) << "the repository is empty";
    repository_.write("a", "x");
    for (const auto *name : {"missing", "a", "..", "../home", ".git"})
        EXPECT_EQ(folderStates(repository_, name), States()) << name;
}

TEST_F(FolderStates, OfAFolderWithADangerousNameAreThoseBelowIt)
{
    for (const auto *name : {"#d/a", "!d/b", "d/c", "d /d"})
        repository_.write(name, "x");
    EXPECT_EQ(folderStates(repository_, "#d"), (States{{"#d/a", "Unversioned"}}));
    EXPECT_EQ(folderStates(repository_, "!d"), (States{{"!d/b", "Unversioned"}}));
    EXPECT_EQ(folderStates(repository_, "d "), (States{{"d /d", "Unversioned"}}));
}

TEST_F(FolderStates, OfAFolderWithWildcardCharactersAreThoseOfThePattern)
{
    for (const auto *name : {"d[1]/a", "d1/b", "d2/c"})
        repository_.write(name, "x");
    EXPECT_EQ(folderStates(repository_, "d[1]"), (States{{"d1/b", "Unversioned"}}));
}

TEST_F(FolderStates, OfManyFilesComeInTheOrderOfFileReports)
{
    for (const auto *name : {"a/x", "a-b/x", "a.b", "b/c/d", "b/c-d", "B"})
        repository_.write(name, "x");
    const auto adapter = makeAdapter(repository_.path());
    std::vector<std::string> names;
    for (const auto &entry : adapter->getFolderStates(asPath(repository_.path())))
        names.push_back(asBytes(entry.first).substr(repository_.path().string().size() + 1));
    EXPECT_THAT(names, ElementsAre("B", "a/x", "a-b/x", "a.b", "b/c/d", "b/c-d"));
}

TEST_F(FolderStates, OfALinkedWorktreeAreItsOwn)
{
    repository_.commitAll(writes("file", "x"), "first");
    repository_.git({"worktree", "add", "--quiet", (folder() / "linked").string()});
    repository_.write("file", "edited here");
    const GitRepository linked(folder() / "linked");
    linked.write("new", "x");
    EXPECT_EQ(allStates(linked), (States{{"file", "Clean"}, {"new", "Unversioned"}}));
    EXPECT_EQ(allStates(repository_), (States{{"file", "Modified"}}));
}

TEST_F(FolderStates, AreReadAfreshEachTime)
{
    const auto adapter = makeAdapter(repository_.path());
    const upath root = asPath(repository_.path());
    const auto now = [&]
    { return statesBelow(repository_.path(), adapter->getFolderStates(root)); };
    EXPECT_EQ(now(), States());
    repository_.write("a", "x");
    EXPECT_EQ(now(), (States{{"a", "Unversioned"}}));
    repository_.add({"a"});
    EXPECT_EQ(now(), (States{{"a", "Added"}}));
    repository_.commit("first");
    EXPECT_EQ(now(), (States{{"a", "Clean"}}));
    repository_.git({"checkout", "--quiet", "--orphan", "new"});
    EXPECT_EQ(now(), (States{{"a", "Added"}}));
}

} // namespace

// SPDX-License-Identifier: MIT
#include <cstdint>
#include <set>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include <boost/filesystem/exception.hpp>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "PathspecMatches.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/text.hpp"
#include "util/path/PathspecArray.hpp"

namespace
{

using testing::ElementsAre;
using vclink::git::getArray;
using vclink::git::getArrayPointer;
using vclink::git::makeFilePathspec;
using vclink::git::makeFolderPathspec;
using vclink::git::makeStringPathspec;
using vclink::git::PathspecArray;
using vclink::test::asPath;
using Names = std::set<std::string>;

static_assert(!std::is_copy_constructible_v<PathspecArray> &&
              !std::is_move_constructible_v<PathspecArray> &&
              !std::is_copy_assignable_v<PathspecArray> &&
              !std::is_move_assignable_v<PathspecArray>);

std::vector<std::string> texts(const PathspecArray &pathspec)
{
    const git_strarray array = getArray(pathspec);
    return {array.strings, array.strings + array.count};
}

void expectEmpty(const PathspecArray &pathspec)
{
    EXPECT_EQ(pathspec.array().strings, nullptr);
    EXPECT_EQ(pathspec.array().count, 0U);
}

TEST(PathspecArray, HoldsTheStringsInOrderAndIsNullAndZeroForAnEmptyList)
{
    expectEmpty(PathspecArray({}));
    expectEmpty(makeStringPathspec({}));
    const PathspecArray pathspec({"b", "a", "", "a", std::string(100, 'x')});
    EXPECT_THAT(texts(pathspec), ElementsAre("b", "a", "", "a", std::string(100, 'x')));
}

TEST(PathspecArray, TakesTheStringsOverWithoutCopying)
{
    std::vector<std::string> strings{std::string(100, 'x'), "short"};
    const std::vector<const char *> data{strings[0].data(), strings[1].data()};
    const PathspecArray pathspec(std::move(strings));
    EXPECT_EQ(pathspec.array().strings[0], data[0]);
    // The short one lies in the string object itself, which the vector's memory carries along.
    EXPECT_EQ(pathspec.array().strings[1], data[1]);
}

TEST(PathspecArray, PointsAtTheCharactersItOwnsAndGivesItsRecordByAddressAndByValue)
{
    const PathspecArray pathspec({"one", "two"});
    const auto begin = reinterpret_cast<std::uintptr_t>(&pathspec);
    const auto *record = &pathspec.array();
    EXPECT_EQ(reinterpret_cast<std::uintptr_t>(record) - begin, sizeof(pathspec) - sizeof(*record));
    EXPECT_EQ(getArrayPointer(pathspec), record);
    EXPECT_EQ(getArray(pathspec).strings, record->strings);
    record->strings[0][0] = 'O';
    EXPECT_THAT(texts(pathspec), ElementsAre("One", "two"));
}

TEST(StringPathspec, LeavesTheTextsUntouched)
{
    const PathspecArray pathspec =
        makeStringPathspec({u"+refs/heads/*:refs/remotes/o/*", u"#a", u"!a", u"a ", u"\\x", u".",
                            u"", u"../gr\u00FC"});
    EXPECT_THAT(texts(pathspec), ElementsAre("+refs/heads/*:refs/remotes/o/*", "#a", "!a", "a ",
                                             "\\x", ".", "", "../gr\xC3\xBC"));
}

class FilePathspec : public vclink::test::GitFixture
{
  protected:
    std::vector<std::string> patterns(const std::vector<std::string> &names) const
    {
        std::vector<upath> files;
        for (const auto &name : names)
            files.push_back(asPath(folder() / name));
        return texts(makeFilePathspec(files, asPath(folder().path())));
    }
};

TEST_F(FilePathspec, IsNullAndZeroForAnEmptyListEvenWhereTheRootCannotBeResolved)
{
    const vclink::test::GitRepository files(folder().path());
    files.symlink("loop", "loop");
    expectEmpty(makeFilePathspec({}, asPath(folder() / "loop")));
}

TEST_F(FilePathspec, HasOneEntryAFileInTheListsOrder)
{
    EXPECT_THAT(patterns({"z", "sub/a", "z", "m\xC3\xBC", "\xFF"}),
                ElementsAre("z", "sub/a", "z", "m\xC3\xBC", "\xFF"));
    // Wildcard characters as they are.
    EXPECT_THAT(patterns({"*.txt", "a?", "a[1]", "**", "x\\*"}),
                ElementsAre("*.txt", "a?", "a[1]", "**", "x/*"));
    // Leading dots for a file outside.
    EXPECT_THAT(patterns({"../x", "home/../../y/z"}), ElementsAre("../x", "../y/z"));
}

TEST_F(FilePathspec, KeepsOneEntryForEachPathThatMeansNothing)
{
    const upath root = asPath(folder().path());
    const PathspecArray pathspec =
        makeFilePathspec({root, upath(), asPath("missing/relative"), asPath(folder() / "a")}, root);
    EXPECT_THAT(texts(pathspec), ElementsAre("..", "..", "..", "a"));
}

class FolderPathspec : public vclink::test::GitFixture
{
  protected:
    std::string pattern(const std::string &name, const std::string &rootName = "repository") const
    {
        const auto pathspec =
            makeFolderPathspec(asPath(folder() / name), asPath(folder() / rootName));
        EXPECT_EQ(pathspec.array().count, 1U);
        return pathspec.array().strings[0];
    }

    vclink::test::LibGit2Session session_{environment()};
    vclink::test::GitRepository repository_ = makeRepository();
};

TEST_F(FolderPathspec, IsOneStarForTheRootAlsoReachedThroughALink)
{
    for (const auto *name : {"repository", "repository/", "repository/.", "repository/x/.."})
        EXPECT_EQ(pattern(name), "*") << name;
    const vclink::test::GitRepository files(folder().path());
    files.symlink("repository", "link");
    EXPECT_EQ(pattern("link"), "*");
    EXPECT_EQ(pattern("repository", "link"), "*");
    EXPECT_EQ(pattern("link/sub", "link"), "sub/*");
}

TEST_F(FolderPathspec, IsTheFolderWithAStarBehindItAndWildcardCharactersAsTheyAre)
{
    EXPECT_EQ(pattern("repository/sub/dir"), "sub/dir/*");
    repository_.makeFolder("sub/dir");
    EXPECT_EQ(pattern("repository/sub/dir"), "sub/dir/*");
    EXPECT_EQ(pattern("repository/sub/../sub/dir"), "sub/dir/*");
    EXPECT_EQ(pattern("repository/a*/b[1]"), "a*/b[1]/*");
}

TEST_F(FolderPathspec, IsRaisedOnALoopOfLinks)
{
    repository_.symlink("loop", "loop");
    EXPECT_THROW(pattern("repository/loop"), boost::filesystem::filesystem_error);
}

TEST_F(FolderPathspec, MeansAllBelowTheFolderAndNothingElse)
{
    const std::vector<std::string> folders{
        "d",  "#d", "!d", "d ", "d\n", "d\r",      "d\t",  " d", "d\nd", "#",   "!",   " ",
        "\n", "\r", ":d", "-d", "..d", "\xC3\xBC", "\xFF", "d#", "d!",   "#d ", "!d\n"};
    for (const auto &name : folders)
    {
        repository_.write(name + "/file", name);
        repository_.write(name + "/deep/down/file", name);
    }
    repository_.write("file", "decoy");
    repository_.commitAll("all");
    const vclink::test::PathspecMatches matches(repository_);
    for (const auto &name : folders)
    {
        const auto pathspec =
            makeFolderPathspec(asPath(repository_ / name), asPath(repository_.path()));
        const Names meant{name + "/file", name + "/deep/down/file"};
        for (const auto &answer : matches.inEveryCall(pathspec))
            EXPECT_EQ(answer.names, meant)
                << answer.call << " for " << testing::PrintToString(name);
    }
}

TEST_F(FolderPathspec, MeansEverythingForTheRoot)
{
    const Names all{"a", "#a", "!a", "sub/b", ".hidden", "sub/deep/c"};
    for (const auto &name : all)
        repository_.write(name, name);
    repository_.commitAll("all");
    const vclink::test::PathspecMatches matches(repository_);
    const auto pathspec =
        makeFolderPathspec(asPath(repository_.path()), asPath(repository_.path()));
    for (const auto &answer : matches.inEveryCall(pathspec))
        EXPECT_EQ(answer.names, all) << answer.call;
}

/// Paths for which libgit2 would otherwise read "everything".
class PathspecNothing : public vclink::test::GitFixture
{
  protected:
    PathspecNothing()
    {
        for (const auto *name : {"a", "sub/b", ".hidden", "...", "..x"})
            repository_.write(name, name);
        repository_.commitAll("all");
    }

    void expectMeans(const PathspecArray &pathspec, const Names &names) const
    {
        const vclink::test::PathspecMatches matches(repository_);
        for (const auto &answer : matches.inEveryCall(pathspec))
            EXPECT_EQ(answer.names, names) << answer.call;
    }
    upath root() const
    {
        return asPath(repository_.path());
    }

    vclink::test::LibGit2Session session_{environment()};
    vclink::test::GitRepository repository_ = makeRepository();
};

TEST_F(PathspecNothing, IsMeantByAFileThatIsEmptyTheRootMissingOrOutside)
{
    for (const upath &file :
         {upath(), root(), asPath(repository_ / "."), asPath("missing/relative"),
          asPath(repository_ / "missing"), asPath(folder() / "outside"), asPath("/")})
        expectMeans(makeFilePathspec({file}, root()), {});
}

TEST_F(PathspecNothing, IsMeantByAFolderOutsideOrWithoutARelationToTheRoot)
{
    for (const upath &outside :
         {upath(), asPath("missing/relative"), asPath(folder().path()), asPath(folder() / "home")})
        expectMeans(makeFolderPathspec(outside, root()), {});
}

/// Its path would be a single slash.
TEST_F(PathspecNothing, IsMeantByAFileNamedABackslash)
{
    expectMeans(makeFilePathspec({asPath(repository_ / "\\")}, root()), {});
    repository_.write("\\", "x");
    repository_.add();
    repository_.commit("with a backslash");
    expectMeans(makeFilePathspec({asPath(repository_ / "\\")}, root()), {});
    expectMeans(makeFolderPathspec(asPath(repository_ / "\\"), root()), {});
}

TEST_F(PathspecNothing, AddsNothingToAListThatMeansSomething)
{
    expectMeans(makeFilePathspec({upath(), asPath(repository_ / "a"), root()}, root()), {"a"});
    expectMeans(makeFilePathspec({asPath(repository_ / "sub/b"), upath()}, root()), {"sub/b"});
}

} // namespace

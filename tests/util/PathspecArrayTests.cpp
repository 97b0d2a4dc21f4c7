// SPDX-License-Identifier: MIT
#include <cstdint>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "support/GitTest.hpp"
#include "support/text.hpp"
#include "util/path/PathspecArray.hpp"

namespace
{

using testing::ElementsAre;
using vclink::git::getArray;
using vclink::git::getArrayPointer;
using vclink::git::makeFilePathspec;
using vclink::git::makeStringPathspec;
using vclink::git::PathspecArray;
using vclink::test::asPath;

std::vector<std::string> texts(const PathspecArray &pathspec)
{
    const git_strarray array = getArray(pathspec);
    return {array.strings, array.strings + array.count};
}

TEST(PathspecArray, IsNullAndZeroForAnEmptyList)
{
    const PathspecArray pathspec({});
    EXPECT_EQ(pathspec.array().strings, nullptr);
    EXPECT_EQ(pathspec.array().count, 0U);
}

TEST(PathspecArray, HoldsTheStringsInOrder)
{
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

TEST(PathspecArray, PointsAtTheCharactersItOwns)
{
    const PathspecArray pathspec({"one", "two"});
    const auto begin = reinterpret_cast<std::uintptr_t>(&pathspec);
    const auto *record = &pathspec.array();
    EXPECT_EQ(reinterpret_cast<std::uintptr_t>(record) - begin, sizeof(pathspec) - sizeof(*record));
    pathspec.array().strings[0][0] = 'O';
    EXPECT_THAT(texts(pathspec), ElementsAre("One", "two"));
}

TEST(PathspecArray, CanNeitherBeCopiedNorMoved)
{
    EXPECT_FALSE(std::is_copy_constructible_v<PathspecArray>);
    EXPECT_FALSE(std::is_move_constructible_v<PathspecArray>);
    EXPECT_FALSE(std::is_copy_assignable_v<PathspecArray>);
    EXPECT_FALSE(std::is_move_assignable_v<PathspecArray>);
}

TEST(PathspecArray, GivesItsRecordByAddressAndByValue)
{
    const PathspecArray pathspec({"one", "two"});
    EXPECT_EQ(getArrayPointer(pathspec), &pathspec.array());
    EXPECT_EQ(getArray(pathspec).strings, pathspec.array().strings);
    EXPECT_EQ(getArray(pathspec).count, 2U);
}

TEST(StringPathspec, LeavesTheTextsUntouched)
{
    const PathspecArray pathspec =
        makeStringPathspec({u"+refs/heads/*:refs/remotes/o/*", u"#a", u"!a", u"a ", u"\\x", u".",
                            u"", u"../gr\u00FC"});
    EXPECT_THAT(texts(pathspec), ElementsAre("+refs/heads/*:refs/remotes/o/*", "#a", "!a", "a ",
                                             "\\x", ".", "", "../gr\xC3\xBC"));
}

TEST(StringPathspec, IsNullAndZeroForAnEmptyList)
{
    const PathspecArray pathspec = makeStringPathspec({});
    EXPECT_EQ(pathspec.array().strings, nullptr);
    EXPECT_EQ(pathspec.array().count, 0U);
}

class FilePathspec : public vclink::test::GitTest
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

TEST_F(FilePathspec, HasOneEntryAFileInTheListsOrder)
{
    EXPECT_THAT(patterns({"z", "sub/a", "z", "m\xC3\xBC", "\xFF"}),
                ElementsAre("z", "sub/a", "z", "m\xC3\xBC", "\xFF"));
}

TEST_F(FilePathspec, IsNullAndZeroForAnEmptyListEvenWhereTheRootCannotBeResolved)
{
    const vclink::test::GitRepository files(folder().path());
    files.symlink("loop", "loop");
    const PathspecArray pathspec = makeFilePathspec({}, asPath(folder() / "loop"));
    EXPECT_EQ(pathspec.array().strings, nullptr);
    EXPECT_EQ(pathspec.array().count, 0U);
}

TEST_F(FilePathspec, LeavesWildcardCharactersAsTheyAre)
{
    EXPECT_THAT(patterns({"*.txt", "a?", "a[1]", "**", "x\\*"}),
                ElementsAre("*.txt", "a?", "a[1]", "**", "x/*"));
}

TEST_F(FilePathspec, GivesLeadingDotsForAFileOutside)
{
    EXPECT_THAT(patterns({"../x", "home/../../y/z"}), ElementsAre("../x", "../y/z"));
}

TEST_F(FilePathspec, KeepsOneEntryForEachPathThatMeansNothing)
{
    const upath root = asPath(folder().path());
    const PathspecArray pathspec =
        makeFilePathspec({root, upath(), asPath("missing/relative"), asPath(folder() / "a")}, root);
    EXPECT_THAT(texts(pathspec), ElementsAre("..", "..", "..", "a"));
}

} // namespace

// SPDX-License-Identifier: MIT
#include <set>
#include <string>
#include <vector>

#include <boost/filesystem/exception.hpp>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "PathspecMatches.hpp"
#include "support/GitTest.hpp"
#include "support/LibGit2Session.hpp"
#include "support/text.hpp"
#include "util/path/PathspecArray.hpp"

namespace
{

using vclink::git::makeFolderPathspec;
using vclink::test::asPath;
using Names = std::set<std::string>;

class FolderPathspec : public vclink::test::GitTest
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

TEST_F(FolderPathspec, IsOneStarForTheRoot)
{
    for (const auto *name : {"repository", "repository/", "repository/.", "repository/x/.."})
        EXPECT_EQ(pattern(name), "*") << name;
}

TEST_F(FolderPathspec, IsOneStarForTheRootReachedThroughALink)
{
    const vclink::test::GitRepository files(folder().path());
    files.symlink("repository", "link");
    EXPECT_EQ(pattern("link"), "*");
    EXPECT_EQ(pattern("repository", "link"), "*");
    EXPECT_EQ(pattern("link/sub", "link"), "sub/*");
}

TEST_F(FolderPathspec, IsTheFolderWithAStarBehindIt)
{
    EXPECT_EQ(pattern("repository/sub/dir"), "sub/dir/*");
    repository_.makeFolder("sub/dir");
    EXPECT_EQ(pattern("repository/sub/dir"), "sub/dir/*");
    EXPECT_EQ(pattern("repository/sub/../sub/dir"), "sub/dir/*");
}

TEST_F(FolderPathspec, IsRaisedOnALoopOfLinks)
{
    repository_.symlink("loop", "loop");
    EXPECT_THROW(pattern("repository/loop"), boost::filesystem::filesystem_error);
}

TEST_F(FolderPathspec, LeavesWildcardCharactersAsTheyAre)
{
    EXPECT_EQ(pattern("repository/a*/b[1]"), "a*/b[1]/*");
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

} // namespace

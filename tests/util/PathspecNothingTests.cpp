// SPDX-License-Identifier: MIT
#include <set>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "PathspecMatches.hpp"
#include "support/GitTest.hpp"
#include "support/LibGit2Session.hpp"
#include "support/text.hpp"
#include "util/path/PathspecArray.hpp"

namespace
{

using vclink::git::makeFilePathspec;
using vclink::git::makeFolderPathspec;
using vclink::git::PathspecArray;
using vclink::test::asPath;
using Names = std::set<std::string>;

/// Paths for which libgit2 would otherwise read "everything".
class PathspecNothing : public vclink::test::GitTest
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

TEST_F(PathspecNothing, IsMeantByAnEmptyPath)
{
    expectMeans(makeFilePathspec({upath()}, root()), {});
}

TEST_F(PathspecNothing, IsMeantByTheRootInAListOfFiles)
{
    expectMeans(makeFilePathspec({root()}, root()), {});
    expectMeans(makeFilePathspec({asPath(repository_ / ".")}, root()), {});
}

TEST_F(PathspecNothing, IsMeantByARelativePathOfWhichNothingExists)
{
    expectMeans(makeFilePathspec({asPath("missing/relative")}, root()), {});
}

TEST_F(PathspecNothing, IsMeantByAMissingFileAndByAFileOutside)
{
    expectMeans(makeFilePathspec({asPath(repository_ / "missing")}, root()), {});
    expectMeans(makeFilePathspec({asPath(folder() / "outside")}, root()), {});
    expectMeans(makeFilePathspec({asPath("/")}, root()), {});
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

TEST_F(PathspecNothing, IsMeantByAFolderThatCannotBeRelatedToTheRoot)
{
    expectMeans(makeFolderPathspec(upath(), root()), {});
    expectMeans(makeFolderPathspec(asPath("missing/relative"), root()), {});
}

TEST_F(PathspecNothing, IsMeantByAFolderOutside)
{
    expectMeans(makeFolderPathspec(asPath(folder().path()), root()), {});
    expectMeans(makeFolderPathspec(asPath(folder() / "home"), root()), {});
}

} // namespace

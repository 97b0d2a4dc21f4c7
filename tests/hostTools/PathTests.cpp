// SPDX-License-Identifier: MIT
#include "hostTools.hpp"

#include <algorithm>
#include <filesystem>
#include <string>
#include <unordered_set>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "support/GitFixture.hpp"
#include "support/adapterFor.hpp"

namespace
{

using namespace vclink::test;
using testing::ElementsAre;
using testing::IsEmpty;

class HostPaths : public GitFixture
{
  protected:
    upath pathOf(const std::string &name) const
    {
        return host_tools::toUpath(repository_ / name);
    }

    GitRepository repository_ = makeRepository();
};

TEST_F(HostPaths, KeepTheBytesOfEveryName)
{
    for (const std::string name :
         {"caf\xE9", "\xEF\xBB\xBFmark", "\xF0\x9F\xA6\x89", "a\nb", "\xC3("})
        EXPECT_EQ(host_tools::toStdPath(host_tools::toUpath(name)).string(), name);
}

TEST_F(HostPaths, AreRelativeToTheRootWithOrWithoutASlash)
{
    EXPECT_EQ(host_tools::relativeName(upath(u"/r/a/b"), upath(u"/r")), u"a/b");
    EXPECT_EQ(host_tools::relativeName(upath(u"/r/a/b"), upath(u"/r/")), u"a/b");
    EXPECT_EQ(host_tools::relativeName(upath(u"/r"), upath(u"/r")), u"");
}

TEST_F(HostPaths, AreSortedAsStatesAreAndFoundByTheirHash)
{
    std::vector<upath> paths{upath(u"/a-b"), upath(u"/a/c"), upath(u"/a")};
    std::sort(paths.begin(), paths.end(), host_tools::PathOrder());
    EXPECT_EQ(paths, (std::vector<upath>{upath(u"/a"), upath(u"/a/c"), upath(u"/a-b")}));
    const std::unordered_set<upath, host_tools::PathHash> set(paths.begin(), paths.end());
    EXPECT_EQ(set.count(upath(u"/a/c")), 1u);
    EXPECT_EQ(set.count(upath(u"/a/d")), 0u);
}

TEST_F(HostPaths, MeanOnlyThemselvesUnlessTheyArePatternsOrLinks)
{
    repository_.write("plain", "text\n");
    repository_.symlink("plain", "link");
    EXPECT_TRUE(host_tools::meansOnlyItself(pathOf("plain")));
    EXPECT_TRUE(host_tools::meansOnlyItself(pathOf("not there")));
    for (const auto *name : {"link", "a*", "a?", "[a]", "a\\b"})
        EXPECT_FALSE(host_tools::meansOnlyItself(pathOf(name))) << name;
}

TEST(HostStates, HaveANameEach)
{
    std::vector<std::string> names;
    for (int number = 0; number < 9; ++number)
        names.emplace_back(host_tools::nameOf(vclink::FileState(number)));
    EXPECT_THAT(names, ElementsAre("unversioned", "clean", "unknown", "conflict", "modified",
                                   "added", "deleted", "missing", "unknown"));
}

TEST_F(HostPaths, OfFilesInConflictAreListed)
{
    repository_.git({"config", "user.name", "Ada"});
    repository_.git({"config", "user.email", "ada@example.org"});
    for (const auto *name : {"a", "b", "c"})
        repository_.write(name, "first\n");
    repository_.commitAll("first");
    EXPECT_THAT(host_tools::filesInConflict(*adapterFor(repository_)), IsEmpty());
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    repository_.write("a", "theirs\n");
    repository_.write("b", "theirs\n");
    repository_.commitAll("theirs");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.write("a", "ours\n");
    repository_.write("b", "ours\n");
    repository_.write("c", "ours\n");
    repository_.commitAll("ours");
    repository_.tryGit({"merge", "topic"});
    EXPECT_EQ(host_tools::filesInConflict(*adapterFor(repository_)),
              (std::vector<upath>{pathOf("a"), pathOf("b")}));
}

} // namespace

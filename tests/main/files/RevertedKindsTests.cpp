// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::ElementsAre;
using namespace vclink::test;

/// Reverts if more than the content of a file was changed: its mode, its line ends, or its kind.
using RevertedKinds = StagingFixture;

TEST_F(RevertedKinds, TakesALinkForItsTarget)
{
    repository_.commitAll(links("file", "link"), "second");
    repository_.write("file", "edited\n");
    repository_.write("other", "edited\n");
    revert({"link"});
    EXPECT_THAT(status(), ElementsAre(" M other"));
    repository_.remove("link");
    repository_.symlink("other", "link");
    revert({"link"});
    EXPECT_THAT(status(), ElementsAre(" M link"));
}

/// libgit2 stumbles over a folder whose entries are the first of the index.
TEST_F(RevertedKinds, MakesALinkAgainOfAStagedFolder)
{
    for (const std::string name : {"a first", "link"})
    {
        for (const std::string target : {"file", "sub", "nowhere"})
        {
            repository_.symlink(target, name);
            repository_.commitAll("link to " + target);
            repository_.remove(name);
            repository_.write(name + "/a", "x");
            repository_.write(name + "/deep/b", "x");
            repository_.add({"."});
            repository_.write(name + "/untracked", "x");
            expectRevertsAsGit({name});
            EXPECT_THAT(status(), ElementsAre());
            EXPECT_EQ(fs::read_symlink(repository_ / name), target);
            repository_.remove(name);
        }
    }
}

TEST_F(RevertedKinds, MakesFilesAndLinksAgainOfStagedFolders)
{
    const std::vector<std::string> names{"a first", "file", "link", "other", "sub/inside"};
    repository_.commitAll(writes("a first", "x") + links("file", "link"), "second");
    for (const std::string &name : names)
    {
        repository_.remove(name);
        repository_.write(name + "/a", "x");
        repository_.write(name + "/b", "x");
    }
    repository_.add({"."});
    expectRevertsAsGit(names);
    EXPECT_THAT(status(), ElementsAre());
}

/// The pattern of such a name does not mean what is below.
TEST_F(RevertedKinds, MakesFilesAgainOfStagedFoldersWhoseNamesNeedAnEscape)
{
    for (const std::string name : {"!a", "sub/line\nend", "z "})
    {
        repository_.commitAll(writes(name, "x"), "a file");
        repository_.remove(name);
        repository_.write(name + "/a", "x");
        repository_.write(name + "/deep/b", "x");
        repository_.add({"."});
        expectRevertsAsGit({name});
        EXPECT_THAT(status(), ElementsAre()) << name;
    }
}

TEST_F(RevertedKinds, WritesNothingThroughALinkThatStandsForAFile)
{
    repository_.write("../outside", "precious");
    repository_.remove("sub/inside");
    repository_.symlink("../../outside", "sub/inside");
    expectRevertsAsGit({"sub"});
    EXPECT_EQ(repository_.read("../outside"), "precious");
    EXPECT_EQ(repository_.read("sub/inside"), "content of sub/inside\n");
}

TEST_F(RevertedKinds, WritesNothingThroughAStagedLinkThatStandsForAFile)
{
    repository_.remove("sub/inside");
    repository_.symlink("../other", "sub/inside");
    repository_.git({"rm", "--quiet", "--cached", "sub/inside"});
    expectRevertsAsGit({"sub"});
    repository_.remove("sub/inside");
    repository_.symlink("../other", "sub/inside");
    repository_.add({"sub/inside"});
    repository_.write("other", "precious");
    expectRevertsAsGit({"sub"});
    EXPECT_EQ(repository_.read("other"), "precious");
}

TEST_F(RevertedKinds, WritesNothingThroughALinkThatStandsForAFolder)
{
    repository_.commitAll(writes("dir/sub/a", "x") + writes("dir/sub/deep/b", "x"), "second");
    repository_.write("../outside/a", "precious");
    repository_.remove("dir/sub");
    repository_.symlink("../../outside", "dir/sub");
    expectRevertsAsGit({"dir"});
    EXPECT_EQ(repository_.read("../outside/a"), "precious");
    EXPECT_FALSE(fs::exists(folder() / "outside/deep"));
    EXPECT_EQ(repository_.read("dir/sub/deep/b"), "x");
}

TEST_F(RevertedKinds, LeavesALinkThatStandsNowhereInTheWay)
{
    repository_.symlink("file", "sub/new");
    repository_.symlink("nowhere", "sub/tracked");
    repository_.add({"sub/tracked"});
    repository_.commit("second");
    repository_.write("sub/inside", "edited\n");
    expectRevertsAsGit({"sub"});
    EXPECT_TRUE(fs::is_symlink(repository_ / "sub/new"));
    EXPECT_TRUE(fs::is_symlink(repository_ / "sub/tracked"));
}

TEST_F(RevertedKinds, PutsASubmodulesCommitBackIntoTheIndex)
{
    addModule();
    const RepositoryState before = stateOf(repository_);
    const GitRepository module(repository_ / "module");
    module.git({"checkout", "--quiet", "HEAD~1"});
    module.write("file", "edited");
    repository_.git({"add", "module"});
    revert({"module"});
    EXPECT_EQ(indexOf(repository_), before.index);
    EXPECT_EQ(module.read("file"), "edited");
}

TEST_F(RevertedKinds, MakesAFolderAgainOfASubmoduleThatIsGoneOrOfALinkInItsPlace)
{
    auto inner = makeRepository("inner");
    inner.write("file", "x");
    inner.commitAll("first");
    repository_.git({"submodule", "--quiet", "add", inner.path().string(), "sub/module"});
    repository_.commit("second");
    repository_.remove("sub/module");
    expectRevertsAsGit({"sub/module"});
    EXPECT_TRUE(fs::is_empty(repository_ / "sub/module"));
    repository_.write("../outside/file", "precious");
    repository_.remove("sub/module");
    repository_.symlink("../../outside", "sub/module");
    expectRevertsAsGit({"sub"});
    EXPECT_TRUE(fs::is_empty(repository_ / "sub/module"));
    EXPECT_EQ(repository_.read("../outside/file"), "precious");
}

TEST_F(RevertedKinds, TakesAnIntentToAddAndBothSidesOfARenamingBack)
{
    repository_.write("new", "x");
    repository_.git({"add", "--intent-to-add", "new"});
    repository_.git({"mv", "file", "renamed"});
    revert({"new", "file", "renamed"});
    EXPECT_THAT(status(), ElementsAre("?? new", "?? renamed"));
    EXPECT_EQ(repository_.read("file"), "content of file\n");
}

TEST_F(RevertedKinds, WorksBelowARootThatIsReachedThroughALink)
{
    repository_.symlink("repository", "../link");
    repository_.write("file", "edited\n");
    repository_.write("other", "edited\n");
    repository_.remove("sub/inside");
    repository_.symlink("../file", "sub/inside");
    const std::string root = folder() / "link/";
    makeAdapter(root)->revertFiles({asPath(root + "file"), asPath(root + "sub")});
    EXPECT_THAT(status(), ElementsAre(" M other"));
}

} // namespace

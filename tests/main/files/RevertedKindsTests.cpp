// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <boost/filesystem/exception.hpp>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::ElementsAre;
using vclink::test::asPath;
using vclink::test::GitRepository;
using vclink::test::indexOf;
using vclink::test::NothingChanges;
using vclink::test::RepositoryState;

/// Reverts where more than a file's content was changed: its mode, its line ends, or what stands
/// there at all.
class RevertedKinds : public vclink::test::StagingFixture
{
};

TEST_F(RevertedKinds, TakesTheExecutableBitBack)
{
    repository_.write("tool", "x");
    repository_.setMode("tool", 0755);
    repository_.commitAll("second");
    repository_.setMode("tool", 0644);
    repository_.setMode("file", 0755);
    expectRevertsAsGit({"tool", "file"});
    EXPECT_THAT(status(), ElementsAre());
}

TEST_F(RevertedKinds, TakesAStagedExecutableBitBack)
{
    repository_.setMode("file", 0755);
    repository_.add({"file"});
    expectRevertsAsGit({"file"});
}

TEST_F(RevertedKinds, WritesLineEndsAsTheAttributesSay)
{
    repository_.write(".gitattributes", "*.txt text eol=crlf\n*.bin -text\n");
    repository_.write("a.txt", "one\r\ntwo\r\n");
    repository_.write("a.bin", "one\r\ntwo\n");
    repository_.commitAll("second");
    repository_.write("a.txt", "edited\n");
    repository_.remove("a.bin");
    expectRevertsAsGit({"a.txt", "a.bin"});
    EXPECT_EQ(repository_.read("a.txt"), "one\r\ntwo\r\n");
    EXPECT_EQ(repository_.read("a.bin"), "one\r\ntwo\n");
}

TEST_F(RevertedKinds, TakesALinkForItsTarget)
{
    repository_.symlink("file", "link");
    repository_.commitAll("second");
    repository_.write("file", "edited\n");
    repository_.write("other", "edited\n");
    revert({"link"});
    EXPECT_THAT(status(), ElementsAre(" M other"));
    repository_.remove("link");
    repository_.symlink("other", "link");
    revert({"link"});
    EXPECT_THAT(status(), ElementsAre(" M link"));
}

TEST_F(RevertedKinds, BringsBackALinkThatIsGoneOrLeadsNowhere)
{
    repository_.symlink("file", "gone");
    repository_.symlink("nowhere", "dangling");
    repository_.commitAll("second");
    repository_.remove("gone");
    repository_.remove("dangling");
    repository_.symlink("elsewhere", "dangling");
    expectRevertsAsGit({"gone", "dangling"});
    EXPECT_EQ(fs::read_symlink(repository_ / "gone"), "file");
    EXPECT_EQ(fs::read_symlink(repository_ / "dangling"), "nowhere");
}

TEST_F(RevertedKinds, MakesAFileAgainOfALinkThatLeadsNowhere)
{
    repository_.remove("file");
    repository_.symlink("nowhere", "file");
    expectRevertsAsGit({"file"});
    EXPECT_EQ(repository_.read("file"), "content of file\n");
}

TEST_F(RevertedKinds, RaisesOnALoopOfLinks)
{
    repository_.symlink("loop", "loop");
    repository_.write("file", "edited");
    const NothingChanges nothing(repository_);
    EXPECT_THROW(revert({"file", "loop"}), boost::filesystem::filesystem_error);
}

TEST_F(RevertedKinds, MakesAFileAgainOfAFolder)
{
    repository_.remove("file");
    repository_.write("file/inside", "x");
    expectRevertsAsGit({"file"});
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
    repository_.write("a first", "x");
    repository_.symlink("file", "link");
    repository_.commitAll("second");
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
        repository_.write(name, "x");
        repository_.commitAll("a file");
        repository_.remove(name);
        repository_.write(name + "/a", "x");
        repository_.write(name + "/deep/b", "x");
        repository_.add({"."});
        expectRevertsAsGit({name});
        EXPECT_THAT(status(), ElementsAre()) << name;
    }
}

TEST_F(RevertedKinds, TakesAStagedChangeOfAFileToALinkBack)
{
    repository_.remove("file");
    repository_.symlink("nowhere", "file");
    repository_.write("other", "edited\n");
    repository_.add({"file", "other"});
    expectRevertsAsGit({"file", "other"});
    EXPECT_THAT(status(), ElementsAre());
}

TEST_F(RevertedKinds, TakesAStagedChangeOfALinkToAFileBack)
{
    repository_.symlink("nowhere", "link");
    repository_.commitAll("second");
    repository_.remove("link");
    repository_.write("link", "x");
    repository_.add({"link"});
    expectRevertsAsGit({"link"});
    EXPECT_THAT(status(), ElementsAre());
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
    repository_.write("dir/sub/a", "x");
    repository_.write("dir/sub/deep/b", "x");
    repository_.commitAll("second");
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
    auto inner = makeRepository("inner");
    inner.write("file", "x");
    inner.commitAll("first");
    inner.commit("second");
    repository_.git({"submodule", "--quiet", "add", inner.path().string(), "module"});
    repository_.commit("second");
    const RepositoryState before = stateOf(repository_);
    const GitRepository module(repository_ / "module");
    module.git({"checkout", "--quiet", "HEAD~1"});
    module.write("file", "edited");
    repository_.git({"add", "module"});
    revert({"module"});
    EXPECT_EQ(indexOf(repository_), before.index);
    EXPECT_EQ(module.read("file"), "edited");
}

TEST_F(RevertedKinds, BringsBackTheFolderOfASubmodule)
{
    auto inner = makeRepository("inner");
    inner.write("file", "x");
    inner.commitAll("first");
    repository_.git({"submodule", "--quiet", "add", inner.path().string(), "module"});
    repository_.commit("second");
    repository_.remove("module");
    expectRevertsAsGit({"module"});
    EXPECT_TRUE(fs::is_empty(repository_ / "module"));
}

TEST_F(RevertedKinds, MakesAFolderAgainOfALinkThatStandsForASubmodule)
{
    auto inner = makeRepository("inner");
    inner.write("file", "x");
    inner.commitAll("first");
    repository_.git({"submodule", "--quiet", "add", inner.path().string(), "sub/module"});
    repository_.commit("second");
    repository_.write("../outside/file", "precious");
    repository_.remove("sub/module");
    repository_.symlink("../../outside", "sub/module");
    expectRevertsAsGit({"sub"});
    EXPECT_TRUE(fs::is_empty(repository_ / "sub/module"));
    EXPECT_EQ(repository_.read("../outside/file"), "precious");
}

TEST_F(RevertedKinds, TakesAnIntentToAddOutOfTheIndex)
{
    repository_.write("new", "x");
    repository_.git({"add", "--intent-to-add", "new"});
    revert({"new"});
    EXPECT_THAT(status(), ElementsAre("?? new"));
}

TEST_F(RevertedKinds, LeavesTheFlagsOfOtherEntries)
{
    repository_.git({"update-index", "--skip-worktree", "other"});
    repository_.git({"update-index", "--assume-unchanged", "sub/inside"});
    repository_.remove("other");
    repository_.write("file", "edited\n");
    expectRevertsAsGit({"file"});
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

TEST_F(RevertedKinds, TakesTheDeletionOfARenamingBack)
{
    repository_.git({"mv", "file", "renamed"});
    expectRevertsAsGit({"file"});
    EXPECT_THAT(status(), ElementsAre("A  renamed"));
}

TEST_F(RevertedKinds, TakesBothSidesOfARenamingBack)
{
    repository_.git({"mv", "file", "renamed"});
    revert({"file", "renamed"});
    EXPECT_THAT(status(), ElementsAre("?? renamed"));
    EXPECT_EQ(repository_.read("file"), "content of file\n");
}

} // namespace

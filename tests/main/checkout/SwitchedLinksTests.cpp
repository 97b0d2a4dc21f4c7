// SPDX-License-Identifier: MIT
#include <filesystem>
#include <memory>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/branches/SwitchBranchFixture.hpp"
#include "support/text.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::HasSubstr;
using testing::IsEmpty;
using namespace vclink::test;

/// "main" with the folder "dir", of which the test makes a link to a folder outside that holds the
/// same names, and branches that change it.
class SwitchedLinks : public SwitchBranchFixture
{
  protected:
    SwitchedLinks()
    {
        for (const auto *name : {"dir/a", "dir/b", "dir/deep/c"})
        {
            repository_.write(name, "of main\n");
            repository_.write(std::string("../outside/") + name, "precious\n");
        }
        repository_.commitAll("second");
        makeBranch("adds", writes("dir/new", "x"));
        makeBranch("edits", writes("dir/b", "of the branch\n"));
        makeBranch("edits-the-first", writes("dir/a", "of the branch\n"));
        makeBranch("drops", removes("dir/b"));
        makeBranch("drops-all", removes("dir"));
        makeBranch("elsewhere", writes("new", "x"));
    }

    void linkFolder()
    {
        linksFolder_(repository_);
    }
    static Failure inTheWay(const std::string &name)
    {
        return {GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
                "the symbolic link '" + name + "' is in the way of the checkout"};
    }
    void expectNothingOutsideChanged() const
    {
        for (const auto *name : {"dir/a", "dir/b", "dir/deep/c"})
            EXPECT_EQ(repository_.read(std::string("../outside/") + name), "precious\n");
        EXPECT_FALSE(fs::exists(folder() / "outside/dir/new"));
    }

    const Change linksFolder_ = removes("dir") + links("../outside/dir", "dir");
};

TEST_F(SwitchedLinks, RefusesToGoThroughALinkThatStandsForAFolder)
{
    linkFolder();
    for (const auto *branch : {"adds", "edits", "edits-the-first", "drops", "drops-all"})
    {
        SCOPED_TRACE(branch);
        expectRefused(branch, inTheWay("dir"));
        expectNothingOutsideChanged();
    }
    EXPECT_FALSE(repository_.tryGit({"checkout", "adds"}).succeeded());
}

TEST_F(SwitchedLinks, RefusesALinkThatLeadsToAnotherFolderOfTheWorkingCopy)
{
    repository_.write("copy/b", "precious\n");
    repository_.remove("dir");
    repository_.symlink("copy", "dir");
    expectRefused("drops", inTheWay("dir"));
}

TEST_F(SwitchedLinks, RefusesALinkThatIsDeeperDown)
{
    makeBranch("deep", writes("dir/deep/new", "x"));
    repository_.remove("dir/deep");
    repository_.symlink("../../outside/dir/deep", "dir/deep");
    expectRefused("deep", inTheWay("dir/deep"));
    EXPECT_FALSE(fs::exists(folder() / "outside/dir/deep/new"));
}

TEST_F(SwitchedLinks, RefusesALinkFarAboveThatLeadsToNothingOfThatName)
{
    makeBranch("deep", writes("dir/deep/new", "x"));
    fs::create_directory(folder() / "empty");
    repository_.remove("dir");
    repository_.symlink("../empty", "dir");
    expectRefused("deep", inTheWay("dir"));
    EXPECT_TRUE(fs::is_empty(folder() / "empty"));
}

/// libgit2 is past the link with the first of these, and sees no conflict in the second.
TEST_F(SwitchedLinks, RefusesALinkThatLibGit2IsPast)
{
    repository_.commitAll(writes("dir-b", "x") + writes("new-b", "x"), "third");
    makeBranch("makes", writes("new/file", "x"));
    makeBranch("takes", removes("dir"));
    repository_.symlink("../outside", "new");
    expectRefused("makes", inTheWay("new"));
    EXPECT_FALSE(fs::exists(folder() / "outside/file"));
    linkFolder();
    expectRefused("takes", inTheWay("dir"));
    expectNothingOutsideChanged();
}

TEST_F(SwitchedLinks, RefusesALinkThatIsStaged)
{
    linkFolder();
    repository_.add({"dir"});
    expectRefused("adds", inTheWay("dir"));
    expectNothingOutsideChanged();
}

TEST_F(SwitchedLinks, RefusesALinkThatIsIgnored)
{
    repository_.write(".git/info/exclude", "dir\nnew\n");
    linkFolder();
    expectRefused("adds", inTheWay("dir"));
    expectNothingOutsideChanged();
    repository_.symlink("../outside/dir/a", "new");
    expectRefused("elsewhere", inTheWay("new"));
    expectNothingOutsideChanged();
}

TEST_F(SwitchedLinks, LetsAnIgnoredLinkGiveWayToALinkOfTheBranch)
{
    makeBranch("links", links("same", "new"));
    repository_.write(".git/info/exclude", "new\n");
    repository_.symlink("../outside/dir/a", "new");
    const auto expected = stateAfterGit("links");
    switchTo("links");
    expectSame(stateOf(repository_), expected);
    expectNothingOutsideChanged();
}

TEST_F(SwitchedLinks, RefusesAFastForwardToo)
{
    linkFolder();
    const NothingChanges nothing(repository_);
    EXPECT_THAT([this] { branches().merge("adds"); },
                testing::ThrowsMessage<std::exception>(HasSubstr("'dir' is in the way")));
    expectNothingOutsideChanged();
}

TEST_F(SwitchedLinks, IsNoObstacleAboveFilesThatStayAsTheyAre)
{
    linkFolder();
    repository_.symlink("outside", "../link");
    repository_.symlink("nowhere", "untracked");
    const auto expected = stateAfterGit("elsewhere");
    switchTo("elsewhere");
    expectSame(stateOf(repository_), expected);
    EXPECT_TRUE(fs::is_symlink(repository_ / "dir"));
    expectNothingOutsideChanged();
}

TEST_F(SwitchedLinks, IsNoObstacleWhereTheLinkItselfIsTracked)
{
    makeBranch("link", linksFolder_);
    makeBranch("file", removes("dir") + writes("dir", "x"));
    for (const auto *branch : {"link", "main", "link", "file", "link", "adds"})
    {
        SCOPED_TRACE(branch);
        const auto expected = stateAfterGit(branch);
        switchTo(branch);
        expectSame(stateOf(repository_), expected);
        EXPECT_THAT(status(), IsEmpty());
    }
    expectNothingOutsideChanged();
}

TEST_F(SwitchedLinks, LeavesConflictsThatLibGit2FindsToIt)
{
    repository_.symlink("../outside/dir/a", "new");
    expectRefused("elsewhere", {GIT_ECONFLICT, GIT_ERROR_CHECKOUT, "1 conflict prevents checkout"});
}

TEST_F(SwitchedLinks, HandsTheNotificationsOn)
{
    linkFolder();
    interactor_->cancel();
    expectCancelled([this] { switchTo("adds"); });
    expectRefused("adds", inTheWay("dir"));
    repository_.remove("dir");
    EXPECT_NO_THROW(switchTo("adds"));
}

} // namespace

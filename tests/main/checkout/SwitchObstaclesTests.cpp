// SPDX-License-Identifier: MIT
#include <filesystem>
#include <functional>
#include <memory>
#include <string>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "../TestOptionsFactory.hpp"
#include "ObstacleFixture.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/text.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::test::Failure;
using vclink::test::failureOf;
using vclink::test::GitRepository;
using vclink::test::makeFifo;
using vclink::test::makeSocket;
using vclink::test::RepositoryState;
using vclink::test::stateOf;
using vclink::util::exception::CancelledOperationException;

/// A switch and a fast-forward beside what the user has not committed.
class SwitchObstacles : public vclink::test::ObstacleFixture
{
  protected:
    /// "topic" is one commit ahead. What goes before it in path order changes as well, so that a
    /// refusal in the midst of the writing shows.
    void makeTopic(const std::function<void()> &change)
    {
        makeBranch("topic",
                   [&]
                   {
                       repository_.write("a first", "x");
                       change();
                   });
    }
    /// Expects that the switch and the fast-forward are refused.
    void expectRefused(const Failure &failure) const
    {
        expectSwitchRefused(failure);
        expectMergeRefused(failure);
    }
    void expectSwitches() const
    {
        branches().switchBranch("topic");
        EXPECT_EQ(currentBranch(), "refs/heads/topic");
    }
    /// Makes a folder of the file "other".
    std::function<void()> folderOfOther()
    {
        return [this]
        {
            repository_.remove("other");
            repository_.write("other/a", "x");
        };
    }
};

TEST_F(SwitchObstacles, AreFifosAndSockets)
{
    makeTopic(
        [this]
        {
            repository_.write("d/f", "theirs\n");
            repository_.remove("d/g");
            repository_.write("d/new", "x");
            repository_.write("n/a", "x");
        });
    for (const std::string name : {"d/f", "d/g", "d/new", "n"})
    {
        fs::remove(repository_ / name);
        makeFifo(repository_ / name);
        expectRefused(inTheWay("FIFO, socket or device '" + name + "'"));
        repository_.remove(name);
        repository_.git({"reset", "--quiet", "--hard"});
    }
    repository_.remove("d");
    makeSocket(repository_ / "d");
    expectRefused(inTheWay("FIFO, socket or device 'd'"));
    repository_.remove("d");
    repository_.git({"reset", "--quiet", "--hard"});
    expectSwitches();
}

TEST_F(SwitchObstacles, AreNotFifosThatTheBranchDoesNotTouch)
{
    makeTopic(writing("d/f", "theirs\n"));
    repository_.remove("other");
    makeFifo(repository_ / "other");
    makeFifo(repository_ / "d/pipe");
    expectSwitches();
    EXPECT_TRUE(fs::is_fifo(repository_ / "other"));
    EXPECT_TRUE(fs::is_fifo(repository_ / "d/pipe"));
}

TEST_F(SwitchObstacles, AreFoldersInThePlaceOfAFileThatIsDeleted)
{
    repository_.write("other-1", "x");
    repository_.commitAll("a name that sorts before the folder's");
    makeTopic([this] { repository_.remove("other"); });
    repository_.remove("other");
    repository_.write("other/mine", "mine\n");
    expectRefused(inTheWay("folder 'other'"));
    EXPECT_FALSE(makeTwin().tryGit({"switch", "topic"}).succeeded());
    repository_.remove("other");
    expectSwitches();
}

TEST_F(SwitchObstacles, AreFoldersInThePlaceOfAFileThatBecomesAFolder)
{
    makeTopic(folderOfOther());
    repository_.remove("other");
    repository_.write("other/mine", "mine\n");
    expectRefused(inTheWay("folder 'other'"));
    EXPECT_FALSE(makeTwin().tryGit({"switch", "topic"}).succeeded());
    repository_.remove("other");
    repository_.git({"reset", "--quiet", "--hard"});
    expectSwitches();
}

/// libgit2 fails in the midst of its writing. git does without the file.
TEST_F(SwitchObstacles, AreMissingFilesThatBecomeAFolder)
{
    makeTopic(folderOfOther());
    repository_.remove("other");
    expectRefused(
        refusal("the file 'other', which becomes a folder, is missing: bring it back with 'git "
                "restore --source=HEAD --staged --worktree' first"));
    repository_.git({"restore", "--source=HEAD", "--staged", "--worktree", "other"});
    expectSwitches();
}

/// libgit2 moves on without the file. git does without the folder.
/// libgit2 would pass them by, and the next commit would undo the branch's change.
TEST_F(SwitchObstacles, AreMissingFilesThatBecomeALinkAndMissingLinksThatBecomeAFile)
{
    repository_.symlink("file", "link");
    repository_.commitAll("a link");
    makeTopic(
        [this]
        {
            repository_.remove("other");
            repository_.symlink("file", "other");
            repository_.remove("link");
            repository_.write("link", "a file\n");
        });
    const std::string restore = ", is missing: bring it back with 'git restore "
                                "--ignore-skip-worktree-bits --source=HEAD --staged --worktree' "
                                "first";
    repository_.remove("link");
    expectRefused(refusal("the symbolic link 'link', which becomes a file" + restore));
    for (const std::string mark : {"--refresh", "--skip-worktree", "--assume-unchanged"})
    {
        SCOPED_TRACE(mark);
        repository_.git({"reset", "--quiet", "--hard"});
        repository_.git({"update-index", mark, "other"});
        repository_.remove("other");
        expectRefused(refusal("the file 'other', which becomes a symbolic link" + restore));
        repository_.git({"restore", "--ignore-skip-worktree-bits", "--source=HEAD", "--staged",
                         "--worktree", "other"});
    }
    expectSwitches();
}

TEST_F(SwitchObstacles, AreMissingFoldersThatBecomeAFile)
{
    makeTopic(
        [this]
        {
            repository_.remove("d");
            repository_.write("d", "x");
        });
    repository_.remove("d");
    expectRefused(refusal("the folder 'd', which becomes a file, is missing: bring it back with "
                          "'git restore --source=HEAD --staged --worktree' first"));
    repository_.git({"restore", "--source=HEAD", "--staged", "--worktree", "d"});
    expectSwitches();
    EXPECT_EQ(repository_.read("d"), "x");
}

TEST_F(SwitchObstacles, AreThingsInAFolderThatBecomesAFile)
{
    makeTopic(
        [this]
        {
            repository_.remove("d");
            repository_.write("d", "x");
        });
    repository_.write("d/n/mine", "mine\n");
    expectRefused(inChangedFolder("folder 'd/n'"));
    repository_.remove("d/n");
    repository_.write(".git/info/exclude", "*.o\n");
    repository_.write("d/mine.o", "mine\n");
    expectRefused(inChangedFolder("file 'd/mine.o'"));
    repository_.remove("d/mine.o");
    repository_.write("d/staged", "mine\n");
    repository_.add({"d/staged"});
    expectRefused(inChangedFolder("file 'd/staged'"));
    repository_.git({"rm", "--quiet", "--force", "d/staged"});
    makeFifo(repository_ / "d/pipe");
    expectRefused(inChangedFolder("FIFO, socket or device 'd/pipe'"));
    repository_.remove("d/pipe");
    expectSwitches();
}

/// libgit2's walk is past "n" when it comes to "n/new".
TEST_F(SwitchObstacles, AreFoldersThatMayNotBeWrittenTo)
{
    makeTopic(
        [this]
        {
            repository_.remove("d/f");
            repository_.write("d/new/a", "x");
        });
    fs::permissions(repository_ / "d", fs::perms(0555));
    const RepositoryState before = stateOf(repository_);
    vclink::test::giveToUnprivilegedUser(folder().path());
    const std::string text = vclink::test::runAsUnprivilegedUser(
        [&]
        {
            return failureOf([&] { branches().switchBranch("topic"); }).text + '\n' +
                   failureOfMerge("topic");
        });
    repository_.git({"config", "--global", "safe.directory", "*"});
    const Failure failure = refusal("the folder 'd/' cannot be written to");
    EXPECT_EQ(text, failure.text + '\n' + textOf(failure));
    EXPECT_EQ(stateOf(repository_), before);
}

TEST_F(SwitchObstacles, AreFilesThatLibGit2IsPast)
{
    repository_.write("n-b", "x");
    repository_.commitAll("neighbour");
    makeTopic(
        [this]
        {
            repository_.write("n-b", "theirs\n");
            repository_.write("n/new", "x");
        });
    repository_.write("n", "mine\n");
    expectRefused(inTheWay("untracked file 'n'"));
    repository_.remove("n");
    repository_.makeFolder("n");
    expectSwitches();
}

TEST_F(SwitchObstacles, AreFilesInThePlaceOfATrackedFolder)
{
    makeTopic(writing("d/new", "x"));
    repository_.remove("d");
    repository_.write("d", "mine\n");
    expectRefused(inTheWay("untracked file 'd'"));
    repository_.remove("d");
    repository_.git({"reset", "--quiet", "--hard"});
    expectSwitches();
}

TEST_F(SwitchObstacles, AreStagedChangesThatTheFileDoesNotShow)
{
    makeTopic(
        [this]
        {
            repository_.write("d/f", "theirs\n");
            repository_.remove("d/g");
            repository_.write("new", "theirs\n");
        });
    for (const std::string name : {"d/f", "d/g", "new"})
    {
        SCOPED_TRACE(name);
        repository_.write(name, "staged\n");
        repository_.add({name});
        repository_.remove(name);
        expectRefused(staged(name));
        repository_.write(name, name == "d/f" ? "f\n" : "g\n");
        expectRefused(staged(name));
        repository_.git({"reset", "--quiet", "--hard"});
        repository_.git({"clean", "--quiet", "--force"});
    }
    expectSwitches();
}

TEST_F(SwitchObstacles, AreStagedDeletionsOfFilesThatTheBranchHasOrThatAreStillThere)
{
    makeTopic(
        [this]
        {
            repository_.write("other", "theirs\n");
            repository_.remove("d/f");
        });
    for (const std::string name : {"other", "d/f"})
    {
        SCOPED_TRACE(name);
        repository_.git({"rm", "--quiet", "--cached", name});
        expectRefused(staged(name));
        EXPECT_FALSE(makeTwin().tryGit({"switch", "topic"}).succeeded());
        repository_.git({"reset", "--quiet"});
    }
    repository_.git({"rm", "--quiet", "other"});
    expectRefused(staged("other"));
    repository_.git({"reset", "--quiet", "--hard"});
    repository_.git({"rm", "--quiet", "d/f"});
    expectSwitches();
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(SwitchObstacles, AreNotStagedChangesThatTheBranchHasAsWell)
{
    makeTopic(writing("d/f", "theirs\n"));
    repository_.write("d/f", "theirs\n");
    repository_.add({"d/f"});
    repository_.write("d/f", "f\n");
    repository_.write("other", "staged\n");
    repository_.add({"other"});
    expectSwitches();
    EXPECT_THAT(status(), ElementsAre("M  other"));
}

/// Without an index everything is untracked.
TEST_F(SwitchObstacles, AreFilesOfAWorkingCopyThatWasNeverCheckedOut)
{
    makeTopic(writing("d/f", "theirs\n"));
    repository_.remove(".git/index");
    repository_.write("other", "mine\n");
    EXPECT_EQ(failureOf([this] { branches().switchBranch("topic"); }).code, GIT_ECONFLICT);
    EXPECT_EQ(repository_.read("other"), "mine\n");
    EXPECT_EQ(currentBranch(), "refs/heads/main");
}

TEST_F(SwitchObstacles, AreSubmodulesThatBecomeAFile)
{
    addModule();
    makeTopic(
        [this]
        {
            repository_.git({"rm", "--quiet", "--cached", "module"});
            repository_.remove("module");
            repository_.write("module", "theirs\n");
        });
    repository_.git({"submodule", "--quiet", "update", "--init"});
    repository_.write("module/mine", "mine\n");
    expectRefused(inTheWay("folder 'module'"));
}

TEST_F(SwitchObstacles, AreNotUntrackedFilesBesideThoseOfTheBranch)
{
    makeTopic(
        [this]
        {
            repository_.write("n/a", "x");
            repository_.remove("d/f");
        });
    repository_.write("n/mine", "mine\n");
    repository_.write("d/mine", "mine\n");
    expectSwitches();
    EXPECT_THAT(status(), ElementsAre("?? d/mine", "?? n/mine"));
}

TEST_F(SwitchObstacles, AreNotEmptyFolders)
{
    makeTopic(
        [this]
        {
            repository_.write("new", "x");
            repository_.write("n/a", "x");
        });
    repository_.makeFolder("new");
    repository_.makeFolder("n");
    expectSwitches();
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(SwitchObstacles, ComeAfterACancellation)
{
    makeTopic(writing("n/a", "x"));
    repository_.write("n", "mine\n");
    interactor_->cancel();
    expectNothingChanges(
        [this] { EXPECT_THROW(branches().switchBranch("topic"), CancelledOperationException); });
    expectRefused(inTheWay("untracked file 'n'"));
}

/// A host's options factory may ask for force, which is what staged changes give way to.
TEST_F(SwitchObstacles, OfAForcedSwitchAreNotStagedChanges)
{
    makeTopic(writing("d/f", "theirs\n"));
    repository_.write("d/f", "staged\n");
    repository_.add({"d/f"});
    repository_.write("d/f", "mine\n");
    const auto factory = std::make_shared<vclink::test::TestOptionsFactory>(interactor_);
    factory->checkoutOptions.checkoutStrategy = GIT_CHECKOUT_FORCE;
    git::GitAdapter adapter(vclink::test::asPath(repository_.path()), factory);
    git::BranchManager::create(adapter)->switchBranch("topic");
    EXPECT_EQ(repository_.read("d/f"), "theirs\n");
    EXPECT_THAT(status(), IsEmpty());
}

/// Whatever the host's factory gives.
TEST_F(SwitchObstacles, OfAFastForwardDoNotDependOnTheFactory)
{
    makeTopic(writing("n/a", "x"));
    repository_.write("untracked", "mine\n");
    const auto factory = std::make_shared<vclink::test::TestOptionsFactory>(interactor_);
    factory->checkoutOptions.checkoutStrategy = GIT_CHECKOUT_FORCE | GIT_CHECKOUT_REMOVE_UNTRACKED;
    git::GitAdapter adapter(vclink::test::asPath(repository_.path()), factory);
    git::BranchManager::create(adapter)->merge("topic");
    EXPECT_EQ(repository_.read("untracked"), "mine\n");
    EXPECT_EQ(repository_.read("n/a"), "x");
}

} // namespace

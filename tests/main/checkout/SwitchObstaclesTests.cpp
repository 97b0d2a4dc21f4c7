// SPDX-License-Identifier: MIT
#include <filesystem>
#include <memory>
#include <ostream>
#include <string>
#include <vector>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "../TestOptionsFactory.hpp"
#include "ObstacleFixture.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/text.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::util::exception::CancelledOperationException;
using namespace vclink::test;

/// A switch and a fast-forward beside what the user has not committed.
class SwitchObstacles : public ObstacleFixture
{
  protected:
    /// "topic" is one commit ahead. What goes before it in path order changes as well, so that a
    /// refusal in the midst of the writing shows.
    void makeTopic(const Change &change)
    {
        makeBranch("topic", writes("a first", "x") + change);
    }
    /// Expects that the switch and the fast-forward are refused.
    void expectRefused(const Failure &failure) const override
    {
        expectSwitchRefused(failure);
        expectMergeRefused(failure);
    }
};

/// What a switch and a fast-forward refuse.
struct SwitchRefusal
{
    std::string name;
    Change branch;
    std::vector<Obstacle> obstacles;
    /// a name that sorts before that of a folder, in both commits
    std::string sibling = "file-1";
};

std::ostream &operator<<(std::ostream &stream, const SwitchRefusal &refused)
{
    return stream << refused.name;
}

class RefusedSwitches : public SwitchObstacles, public testing::WithParamInterface<SwitchRefusal>
{
};

TEST_P(RefusedSwitches, ChangeNothingAndGoWellWithoutTheObstacle)
{
    repository_.commitAll(writes(GetParam().sibling, "x"), "sibling");
    makeTopic(GetParam().branch);
    expectEachRefused(GetParam().obstacles);
    expectSwitches();
    EXPECT_THAT(status(), IsEmpty());
}

Failure missing(const std::string &what)
{
    return refusal("the " + what +
                   ", is missing: bring it back with 'git restore --source=HEAD "
                   "--staged --worktree' first");
}

const std::vector<SwitchRefusal> refusedSwitches{
    {"AreOfFifosSocketsAndDevices",
     writesEach({"d/f", "d/new", "n/a"}, "theirs\n") + removes("d/g"),
     {{removes("d/f") + makesFifo("d/f"), inTheWay("FIFO, socket or device 'd/f'")},
      {removes("d/f") + makesDevice("d/f"), inTheWay("FIFO, socket or device 'd/f'")},
      {removes("d/g") + makesFifo("d/g"), inTheWay("FIFO, socket or device 'd/g'")},
      {makesFifo("d/new"), inTheWay("FIFO, socket or device 'd/new'")},
      {makesFifo("n"), inTheWay("FIFO, socket or device 'n'")},
      {removes("d") + makesSocket("d"), inTheWay("FIFO, socket or device 'd'")}}},
    {"AreOfFoldersInThePlaceOfAFileThatIsDeleted",
     removes("other"),
     {{removes("other") + writes("other/mine", "mine\n"), inTheWay("folder 'other'")}},
     "other-1"},
    // libgit2 fails in the midst of its writing where the file is missing. git does without it.
    {"AreOfFoldersAndNothingInThePlaceOfAFileThatBecomesAFolder",
     removes("other") + writes("other/a", "x"),
     {{removes("other") + writes("other/mine", "mine\n"), inTheWay("folder 'other'")},
      {removes("other"), missing("file 'other', which becomes a folder")}}},
    // libgit2 moves on without the file where the folder is missing. git does without the folder.
    {"AreOfAFolderThatBecomesAFileAndIsMissingOrHoldsMore",
     removes("d") + writes("d", "x"),
     {{removes("d"), missing("folder 'd', which becomes a file")},
      {writes("d/n/mine", "mine\n"), inChangedFolder("folder 'd/n'")},
      {ignores("*.o") + writes("d/mine.o", "mine\n"), inChangedFolder("file 'd/mine.o'")},
      {writes("d/staged", "mine\n") + runsGit({"add", "d/staged"}),
       inChangedFolder("file 'd/staged'")},
      {makesFifo("d/pipe"), inChangedFolder("FIFO, socket or device 'd/pipe'")}}},
    // libgit2's walk is past "n" when it comes to "n/new".
    {"AreOfFilesThatLibGit2IsPast",
     writes("n-b", "theirs\n") + writes("n/new", "x"),
     {{writes("n", "mine\n"), inTheWay("untracked file 'n'")}},
     "n-b"},
    {"AreOfFilesInThePlaceOfATrackedFolder",
     writes("d/new", "x"),
     {{removes("d") + writes("d", "mine\n"), inTheWay("untracked file 'd'")}}}};

INSTANTIATE_TEST_SUITE_P(Obstacles, RefusedSwitches, testing::ValuesIn(refusedSwitches),
                         testing::PrintToStringParamName());

TEST_F(SwitchObstacles, AreNotFifosThatTheBranchDoesNotTouch)
{
    makeTopic(writes("d/f", "theirs\n"));
    repository_.remove("other");
    makeFifo(repository_ / "other");
    makeFifo(repository_ / "d/pipe");
    expectSwitches();
    EXPECT_TRUE(fs::is_fifo(repository_ / "other"));
    EXPECT_TRUE(fs::is_fifo(repository_ / "d/pipe"));
}

/// libgit2 would pass them by, and the next commit would undo the branch's change.
TEST_F(SwitchObstacles, AreMissingFilesThatBecomeALinkAndMissingLinksThatBecomeAFile)
{
    repository_.commitAll(links("file", "link"), "a link");
    makeTopic(removes("other") + links("file", "other") + removes("link") +
              writes("link", "a file\n"));
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

TEST_F(SwitchObstacles, AreFoldersThatMayNotBeWrittenTo)
{
    makeTopic(removes("d/f") + writes("d/new/a", "x"));
    fs::permissions(repository_ / "d", fs::perms(0555));
    const RepositoryState before = stateOf(repository_);
    giveToUnprivilegedUser(folder().path());
    const std::string text = runAsUnprivilegedUser(
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

TEST_F(SwitchObstacles, AreStagedChangesThatTheFileDoesNotShow)
{
    makeTopic(writes("d/f", "theirs\n") + removes("d/g") + writes("new", "theirs\n"));
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
    makeTopic(writes("other", "theirs\n") + removes("d/f"));
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
    makeTopic(writes("d/f", "theirs\n"));
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
    makeTopic(writes("d/f", "theirs\n"));
    repository_.remove(".git/index");
    repository_.write("other", "mine\n");
    EXPECT_EQ(failureOf([this] { branches().switchBranch("topic"); }).code, GIT_ECONFLICT);
    EXPECT_EQ(repository_.read("other"), "mine\n");
    EXPECT_EQ(currentBranch(), "refs/heads/main");
}

TEST_F(SwitchObstacles, AreSubmodulesThatBecomeAFile)
{
    addModule();
    makeTopic(runsGit({"rm", "--quiet", "--cached", "module"}) + removes("module") +
              writes("module", "theirs\n"));
    repository_.git({"submodule", "--quiet", "update", "--init"});
    repository_.write("module/mine", "mine\n");
    expectRefused(inTheWay("folder 'module'"));
}

TEST_F(SwitchObstacles, AreNotUntrackedFilesBesideThoseOfTheBranch)
{
    makeTopic(writes("n/a", "x") + removes("d/f"));
    repository_.write("n/mine", "mine\n");
    repository_.write("d/mine", "mine\n");
    expectSwitches();
    EXPECT_THAT(status(), ElementsAre("?? d/mine", "?? n/mine"));
}

TEST_F(SwitchObstacles, AreNotEmptyFolders)
{
    repository_.commitAll(writes("n-b", "x"), "a name that sorts before the folder's");
    makeTopic(writesEach({"m/a", "n-b", "n/a", "new"}, "theirs\n"));
    for (const auto *name : {"m", "n", "new"})
        repository_.makeFolder(name);
    expectSwitches();
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(SwitchObstacles, ComeAfterACancellation)
{
    makeTopic(writes("n/a", "x"));
    repository_.write("n", "mine\n");
    interactor_->cancel();
    expectNothingChanges(
        [this] { EXPECT_THROW(branches().switchBranch("topic"), CancelledOperationException); });
    const LogCapture log(git::SeverityProgress);
    expectRefused(inTheWay("untracked file 'n'"));
    const std::string record = "Checkout Notify : 1 (n)";
    EXPECT_THAT(log.messages(), ElementsAre(record, record));
}

/// A host's options factory may ask for force, which is what staged changes give way to.
TEST_F(SwitchObstacles, OfAForcedSwitchAreNotStagedChanges)
{
    makeTopic(writes("d/f", "theirs\n"));
    repository_.write("d/f", "staged\n");
    repository_.add({"d/f"});
    repository_.write("d/f", "mine\n");
    const auto factory = std::make_shared<TestOptionsFactory>(interactor_);
    factory->checkoutOptions.checkoutStrategy = GIT_CHECKOUT_FORCE;
    git::GitAdapter adapter(asPath(repository_.path()), factory);
    git::BranchManager::create(adapter)->switchBranch("topic");
    EXPECT_EQ(repository_.read("d/f"), "theirs\n");
    EXPECT_THAT(status(), IsEmpty());
}

/// Whatever the host's factory gives.
TEST_F(SwitchObstacles, OfAFastForwardDoNotDependOnTheFactory)
{
    makeTopic(writes("n/a", "x"));
    repository_.write("untracked", "mine\n");
    const auto factory = std::make_shared<TestOptionsFactory>(interactor_);
    factory->checkoutOptions.checkoutStrategy = GIT_CHECKOUT_FORCE | GIT_CHECKOUT_REMOVE_UNTRACKED;
    git::GitAdapter adapter(asPath(repository_.path()), factory);
    git::BranchManager::create(adapter)->merge("topic");
    EXPECT_EQ(repository_.read("untracked"), "mine\n");
    EXPECT_EQ(repository_.read("n/a"), "x");
}

} // namespace

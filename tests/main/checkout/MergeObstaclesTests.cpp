// SPDX-License-Identifier: MIT
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include "../TestOptionsFactory.hpp"
#include "ObstacleFixture.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"
#include "support/text.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using testing::ElementsAre;
using vclink::util::exception::CancelledOperationException;
using namespace vclink::test;

/// A true merge beside what the user has not committed, or what git ignores.
using MergeObstacles = ObstacleFixture;

/// What a merge refuses, and the conflicts it comes to without.
struct MergeRefusal
{
    std::string name;
    Change ours;
    Change theirs;
    std::vector<Obstacle> obstacles;
    std::vector<std::string> conflicts{};
};

std::ostream &operator<<(std::ostream &stream, const MergeRefusal &merge)
{
    return stream << merge.name;
}

class RefusedMerges : public MergeObstacles, public testing::WithParamInterface<MergeRefusal>
{
};

TEST_P(RefusedMerges, ChangeNothingAndGoWellWithoutTheObstacle)
{
    diverge(GetParam().ours, GetParam().theirs);
    expectEachRefused(GetParam().obstacles);
    if (GetParam().conflicts.empty())
        expectCleanAsGit();
    else
        expectConflictsAsGit(GetParam().conflicts);
}

const Change oursElsewhere = writes("ours", "x");
const Change theirsElsewhere = writes("theirs", "x");

const std::vector<MergeRefusal> refusedMerges{
    {"AreOfUntrackedFilesBelowATrackedFolder",
     oursElsewhere,
     writes("d/new", "theirs\n"),
     {{writes("d/new", "mine\n"), inTheWay("untracked file 'd/new'")}}},
    {"AreOfUntrackedFilesBelowAnUntrackedFolder",
     oursElsewhere,
     writes("n/m/new", "theirs\n"),
     {{writes("n/m/new", "mine\n"), inTheWay("untracked file 'n/m/new'")}}},
    {"AreOfUntrackedLinksBelowAFolder",
     oursElsewhere,
     writes("d/new", "theirs\n"),
     {{links("../../outside/new", "d/new"), inTheWay("symbolic link 'd/new'")}}},
    {"AreOfUntrackedFilesAndLinksWhereAFolderComes",
     oursElsewhere,
     writesEach({"n/a", "n/new"}, "theirs\n"),
     {{writes("n", "mine\n"), inTheWay("untracked file 'n'")},
      {links("../outside", "n"), inTheWay("symbolic link 'n'")}}},
    {"AreOfUntrackedFoldersWhereAFileComes",
     oursElsewhere,
     writes("d/new", "theirs\n"),
     {{writes("d/new/inside", "mine\n"), inTheWay("folder 'd/new'")},
      {ignores("inside") + writes("d/new/inside", "mine\n"), inTheWay("folder 'd/new'")},
      {[](const GitRepository &copy) { GitRepository::init(copy / "d/new").commit("first"); },
       inTheWay("folder 'd/new'")}}},
    {"AreOfFifosSocketsAndDevices",
     oursElsewhere,
     writesEach({"d/new", "n/a"}, "theirs\n"),
     {{makesFifo("d/new"), inTheWay("FIFO, socket or device 'd/new'")},
      {makesFifo("n"), inTheWay("FIFO, socket or device 'n'")},
      {makesSocket("n"), inTheWay("FIFO, socket or device 'n'")},
      {removes("other") + makesFifo("other"), inTheWay("FIFO, socket or device 'other'")},
      {removes("other") + makesDevice("other"), inTheWay("FIFO, socket or device 'other'")},
      {removes("d") + makesSocket("d"), inTheWay("FIFO, socket or device 'd'")}}},
    {"AreOfThingsInAFolderThatBecomesAFile",
     oursElsewhere,
     removes("d") + writes("d", "theirs\n"),
     {{ignores("*.o") + writes("d/mine.o", "mine\n"), inChangedFolder("file 'd/mine.o'")},
      {makesFolder("d/empty"), inChangedFolder("folder 'd/empty'")}}},
    {"AreOfFoldersInThePlaceOfAFileThatTheyLeft",
     oursElsewhere,
     theirsElsewhere,
     {{removes("other") + writes("other/inside", "mine\n"), inTheWay("folder 'other'")}}},
    // libgit2 opens the name for writing, and reports it too late to be refused.
    {"AreOfAllFoldersWhereWeDeletedAFileThatTheyChanged",
     removes("file"),
     writes("file", "theirs\n"),
     {{ignores("ignored") + writes("file/mine", "mine\n"), inTheWay("folder 'file'")},
      {writes("file/ignored", "mine\n"), inTheWay("folder 'file'")},
      {makesFolder("file"), inTheWay("folder 'file'")},
      {ignores("file") + makesFolder("file"), inTheWay("folder 'file'")}},
     {"1 file", "3 file"}},
    // libgit2 writes what is in conflict without telling of it before.
    {"AreOfFilesAndIgnoredLinksWhereAConflictIsWritten",
     removes("d/f"),
     writes("d/f", "theirs\n"),
     {{writes("d/f", "mine\n"), inTheWay("untracked file 'd/f'")},
      {ignores("/d/f") + links("../../outside/new", "d/f"), inTheWay("symbolic link 'd/f'")}},
     {"1 d/f", "3 d/f"}},
    {"AreOfLinksAndIgnoredFilesAboveAConflict",
     removes("d"),
     writes("d/f", "theirs\n"),
     {{links("../outside", "d"), inTheWay("symbolic link 'd'")},
      {ignores("/d") + links("../outside", "d"), inTheWay("symbolic link 'd'")},
      {writes("d", "ignored\n"), inTheWay("untracked file 'd'")}},
     {"1 d/f", "3 d/f"}}};

INSTANTIATE_TEST_SUITE_P(Obstacles, RefusedMerges, testing::ValuesIn(refusedMerges),
                         testing::PrintToStringParamName());

/// libgit2's walk is past "n" when it comes to "n/new".
TEST_F(MergeObstacles, AreLinksAndFilesThatLibGit2IsPast)
{
    repository_.commitAll(writes("n-b", "x"), "neighbour");
    theyWrite({"n-b", "n/new"});
    expectEachRefused({{links("../outside", "n"), inTheWay("symbolic link 'n'")},
                       {writes("n", "mine\n"), inTheWay("untracked file 'n'")}});
    expectCleanAsGit();
}

/// A file that they have renamed, which none of their changes shows.
TEST_F(MergeObstacles, AreIgnoredLinksWhereTheyRenamedWhatWeDeleted)
{
    diverge(removes("file"), makesFolder("n") + moves("file", "n/f"));
    ignore("/n");
    expectEachRefused({{links("../outside", "n"), inTheWay("symbolic link 'n'")},
                       {writes("n", "ignored\n"), inTheWay("untracked file 'n'")},
                       {links("../../outside/f", "n/f"), inTheWay("symbolic link 'n/f'")}});
    expectConflicts("topic");
    EXPECT_THAT(conflicts(), ElementsAre("1 file", "3 n/f"));
}

TEST_F(MergeObstacles, AreNotEmptyFolders)
{
    theyWrite({"d/new", "n/a"});
    repository_.makeFolder("d/new/empty");
    repository_.makeFolder("n");
    expectCleanAsGit();
}

/// libgit2's walk is past the folder when it comes to the file.
TEST_F(MergeObstacles, AreNotEmptyFoldersThatLibGit2IsPast)
{
    repository_.commitAll(writes("n-b", "x"), "neighbour");
    theyWrite({"n", "n-b"});
    repository_.makeFolder("n");
    expectCleanAsGit();
}

TEST_F(MergeObstacles, AreNotUntrackedFilesBesideThoseOfANewFolder)
{
    theyWrite({"n/a"});
    repository_.write("n/mine", "mine\n");
    merge("topic");
    EXPECT_EQ(repository_.read("n/mine"), "mine\n");
    EXPECT_THAT(status(), ElementsAre("?? n/mine"));
}

TEST_F(MergeObstacles, AreNotFilesThatWeDroppedAndTheyDidNotTouch)
{
    theyWrite({"theirs"});
    repository_.git({"rm", "--quiet", "--cached", "d/f"});
    repository_.commit("drop");
    repository_.write("d/f", "mine\n");
    merge("topic");
    EXPECT_EQ(repository_.read("d/f"), "mine\n");
    EXPECT_THAT(status(), ElementsAre("?? d/f"));
}

TEST_F(MergeObstacles, AreIgnoredFilesThatAreStagedAsDeletedAndThatTheyDeletedOrRenamed)
{
    diverge(writes("ours", "x"), removes("file") + moves("d/f", "renamed"));
    repository_.git({"rm", "--quiet", "--cached", "file", "d/f"});
    ignore("file\nd/f");
    for (const std::string name : {"d/f", "file"})
    {
        repository_.write(name, "mine\n");
        expectMergeRefused(inTheWay("untracked file '" + name + "'"));
        EXPECT_FALSE(makeTwin().tryGit({"merge", "topic"}).succeeded());
        repository_.remove(name);
    }
    merge("topic");
    EXPECT_EQ(parents().size(), 2U);
}

TEST_F(MergeObstacles, AreNotIgnoredFilesWhichAreOverwrittenAsGitDoes)
{
    theyWrite({"ignored", "d/ignored", "ignored-folder", "n/ignored-file/a"});
    ignore("ignored*");
    writesEach({"ignored", "d/ignored", "ignored-folder/inside", "n/ignored-file"},
               "mine\n")(repository_);
    expectCleanAsGit();
}

TEST_F(MergeObstacles, AreNotIgnoredLinksWhichAreReplacedAsGitDoes)
{
    theyWrite({"d/ignored", "ignored-folder/new"});
    ignore("ignored*");
    repository_.symlink("../../outside/new", "d/ignored");
    repository_.symlink("../outside", "ignored-folder");
    // They come back if libgit2's notification of the edit refuses the merge.
    makesExecutable("other")(repository_);
    expectMergeRefused(refusal("the uncommitted changes of 'other' would be lost in the merge"));
    repository_.git({"restore", "other"});
    expectCleanAsGit();
    expectNothingOutsideChanged();
}

TEST_F(MergeObstacles, AreNotFifosAndLinksThatAreNowhereInTheWay)
{
    theyWrite({"theirs"});
    makeFifo(repository_ / "d/pipe");
    repository_.symlink("f", "d/link");
    struct stat before = {};
    ASSERT_EQ(::lstat((repository_ / "d/link").c_str(), &before), 0);
    merge("topic");
    struct stat after = {};
    ASSERT_EQ(::lstat((repository_ / "d/link").c_str(), &after), 0);
    EXPECT_EQ(after.st_ino, before.st_ino);
    EXPECT_TRUE(fs::is_fifo(repository_ / "d/pipe"));
}

TEST_F(MergeObstacles, AreNotIgnoredLinksBesideAFileThatBothDeleted)
{
    diverge(removes("d/f"), removes("d/f"));
    ignore("/ignored");
    repository_.symlink("../outside/new", "ignored");
    expectCleanAsGit();
}

TEST_F(MergeObstacles, OfHistoriesWithSeveralBasesAreFound)
{
    diverge(writes("ours", "1\n"), writes("theirs", "1\n"));
    crissCross(writes("ours", "2\n"), writes("d/new", "x"));
    expectEachRefused({{writes("d/new", "mine\n"), inTheWay("untracked file 'd/new'")}});
    expectCleanAsGit();
}

TEST_F(MergeObstacles, OfUnrelatedHistoriesAreFound)
{
    repository_.git({"checkout", "--quiet", "--orphan", "topic"});
    repository_.git({"rm", "-r", "--quiet", "--force", "."});
    repository_.commitAll(writes("n/new", "x"), "unrelated");
    repository_.git({"checkout", "--quiet", "main"});
    expectEachRefused({{writes("n/new", "mine\n"), inTheWay("untracked file 'n/new'")}});
    EXPECT_NO_THROW(merge("topic"));
}

TEST_F(MergeObstacles, ComeAfterACancellation)
{
    theyWrite({"d/new"});
    repository_.write("d/new", "mine\n");
    interactor_->cancel();
    expectNothingChanges(
        [this] { EXPECT_EQ(failureOfMerge("topic"), CancelledOperationException().what()); });
    const LogCapture log(git::SeverityProgress);
    expectMergeRefused(inTheWay("untracked file 'd/new'"));
    EXPECT_THAT(log.messages(), ElementsAre("Checkout Notify : 1 (d/new)"));
}

/// Whatever the host's factory gives.
TEST_F(MergeObstacles, DoNotDependOnTheFactory)
{
    theyWrite({"d/new"});
    repository_.write("untracked", "mine\n");
    repository_.write("d/new", "mine\n");
    const auto factory = std::make_shared<TestOptionsFactory>(interactor_);
    factory->checkoutOptions.checkoutStrategy =
        GIT_CHECKOUT_FORCE | GIT_CHECKOUT_REMOVE_UNTRACKED | GIT_CHECKOUT_REMOVE_IGNORED;
    git::GitAdapter adapter(asPath(repository_.path()), factory);
    expectNothingChanges(
        [&] { EXPECT_ANY_THROW(git::BranchManager::create(adapter)->merge("topic")); });
    repository_.remove("d/new");
    git::BranchManager::create(adapter)->merge("topic");
    EXPECT_EQ(repository_.read("untracked"), "mine\n");
}

} // namespace

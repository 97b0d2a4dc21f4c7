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
#include "support/text.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::test::GitRepository;
using vclink::test::makeFifo;
using vclink::test::makeSocket;
using vclink::test::textOf;
using vclink::util::exception::CancelledOperationException;

/// A true merge beside what the user has not committed.
class MergeObstacles : public vclink::test::ObstacleFixture
{
  protected:
    /// Diverges; theirs is "topic".
    void theyWrite(const std::vector<std::string> &names)
    {
        diverge(writing("ours", "x"),
                [&]
                {
                    for (const auto &name : names)
                        repository_.write(name, "theirs\n");
                });
    }
    void theyRemove(const std::string &name)
    {
        diverge(writing("ours", "x"), [&] { repository_.remove(name); });
    }
    /// What the other side does not touch.
    void theyWriteElsewhere()
    {
        theyWrite({"theirs"});
    }
    void expectEditRefused(const std::string &name) const
    {
        expectMergeRefused(
            refusal("the uncommitted changes of '" + name + "' would be lost in the merge"));
    }
    void expectHiddenEditRefused(const std::string &name, const std::string &option) const
    {
        expectMergeRefused(refusal(
            "the changes of '" + name + "' would be lost in the merge. Git hides them, because " +
            "the file is marked " + option + ": take the mark away with 'git update-index --no-" +
            option + "' and commit, or remove the file"));
    }
    /// Expects that the merge that was refused goes well once this is gone.
    void expectMergesWithout(const std::string &name)
    {
        repository_.remove(name);
        expectCleanAsGit();
    }
};

TEST_F(MergeObstacles, AreUntrackedFilesBelowATrackedFolder)
{
    theyWrite({"d/new"});
    repository_.write("d/new", "mine\n");
    expectMergeRefused(inTheWay("untracked file 'd/new'"));
    expectMergesWithout("d/new");
}

TEST_F(MergeObstacles, AreUntrackedFilesBelowAnUntrackedFolder)
{
    theyWrite({"n/m/new"});
    repository_.write("n/m/new", "mine\n");
    expectMergeRefused(inTheWay("untracked file 'n/m/new'"));
    expectMergesWithout("n");
}

TEST_F(MergeObstacles, AreUntrackedLinksBelowAFolder)
{
    theyWrite({"d/new"});
    repository_.symlink("../../outside/new", "d/new");
    expectMergeRefused(inTheWay("symbolic link 'd/new'"));
    expectMergesWithout("d/new");
}

TEST_F(MergeObstacles, AreUntrackedFilesWhereAFolderComes)
{
    theyWrite({"n/a", "n/b"});
    repository_.write("n", "mine\n");
    expectMergeRefused(inTheWay("untracked file 'n'"));
    expectMergesWithout("n");
}

TEST_F(MergeObstacles, AreUntrackedLinksWhereAFolderComes)
{
    theyWrite({"n/a", "n/new"});
    repository_.symlink("../outside", "n");
    expectMergeRefused(inTheWay("symbolic link 'n'"));
    EXPECT_FALSE(fs::exists(folder() / "outside/a"));
    expectMergesWithout("n");
}

/// libgit2's walk is past "n" when it comes to "n/new".
TEST_F(MergeObstacles, AreLinksAndFilesThatLibGit2IsPast)
{
    repository_.write("n-b", "x");
    repository_.commitAll("neighbour");
    theyWrite({"n-b", "n/new"});
    repository_.symlink("../outside", "n");
    expectMergeRefused(inTheWay("symbolic link 'n'"));
    repository_.remove("n");
    repository_.write("n", "mine\n");
    expectMergeRefused(inTheWay("untracked file 'n'"));
    expectMergesWithout("n");
}

TEST_F(MergeObstacles, AreUntrackedFoldersWhereAFileComes)
{
    theyWrite({"d/new"});
    repository_.write("d/new/inside", "mine\n");
    expectMergeRefused(inTheWay("folder 'd/new'"));
    repository_.write(".git/info/exclude", "inside\n");
    expectMergeRefused(inTheWay("folder 'd/new'"));
    repository_.remove("d/new");
    GitRepository::init(repository_ / "d/new").commit("first");
    expectMergeRefused(inTheWay("folder 'd/new'"));
    expectMergesWithout("d/new");
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
    repository_.write("n-b", "x");
    repository_.commitAll("neighbour");
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
    theyWriteElsewhere();
    repository_.git({"rm", "--quiet", "--cached", "d/f"});
    repository_.commit("drop");
    repository_.write("d/f", "mine\n");
    merge("topic");
    EXPECT_EQ(repository_.read("d/f"), "mine\n");
    EXPECT_THAT(status(), ElementsAre("?? d/f"));
}

TEST_F(MergeObstacles, AreIgnoredFilesThatAreStagedAsDeletedAndThatTheyDeletedOrRenamed)
{
    diverge(writing("ours", "x"),
            [this]
            {
                repository_.remove("file");
                repository_.git({"mv", "d/f", "renamed"});
            });
    repository_.git({"rm", "--quiet", "--cached", "file", "d/f"});
    repository_.write(".git/info/exclude", "file\nd/f\n");
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
    repository_.write(".git/info/exclude", "ignored*\n");
    repository_.write("ignored", "mine\n");
    repository_.write("d/ignored", "mine\n");
    repository_.write("ignored-folder/inside", "mine\n");
    repository_.write("n/ignored-file", "mine\n");
    expectCleanAsGit();
}

/// libgit2 opens the name for writing, and reports it too late to be refused.
TEST_F(MergeObstacles, AreAllFoldersWhereWeDeletedAFileThatTheyChanged)
{
    diverge([&] { repository_.remove("file"); }, writing("file", "theirs\n"));
    repository_.write(".git/info/exclude", "ignored\n");
    for (const auto *name : {"file/mine", "file/ignored"})
    {
        repository_.write(name, "mine\n");
        expectMergeRefused(inTheWay("folder 'file'"));
        EXPECT_EQ(repository_.read(name), "mine\n");
        repository_.remove(name);
    }
    expectMergeRefused(inTheWay("folder 'file'"));
    repository_.write(".git/info/exclude", "file\n");
    expectMergeRefused(inTheWay("folder 'file'"));
    repository_.remove("file");
    expectConflicts("topic");
}

TEST_F(MergeObstacles, AreNotIgnoredLinksWhichAreReplacedAsGitDoes)
{
    theyWrite({"d/ignored", "ignored-folder/new"});
    repository_.write(".git/info/exclude", "ignored*\n");
    repository_.symlink("../../outside/new", "d/ignored");
    repository_.symlink("../outside", "ignored-folder");
    expectCleanAsGit();
    expectNothingOutsideChanged();
}

TEST_F(MergeObstacles, IgnoredLinksComeBackIfTheMergeIsRefused)
{
    theyWrite({"d/ignored", "ignored-folder/new"});
    repository_.write(".git/info/exclude", "ignored*\n");
    repository_.symlink("../../outside/new", "d/ignored");
    repository_.symlink("../outside", "ignored-folder");
    repository_.write("other", "mine\n");
    expectEditRefused("other");
    EXPECT_EQ(fs::read_symlink(repository_ / "ignored-folder"), "../outside");
}

TEST_F(MergeObstacles, AreEditsOfFilesThatItDoesNotTouch)
{
    theyWriteElsewhere();
    repository_.write("other", "mine\n");
    expectEditRefused("other");
    repository_.git({"checkout", "--quiet", "other"});
    repository_.setMode("d/g", 0755);
    expectEditRefused("d/g");
    repository_.setMode("d/g", 0644);
    repository_.remove("d/g");
    repository_.symlink("f", "d/g");
    expectEditRefused("d/g");
    repository_.git({"reset", "--quiet", "--hard"});
    expectCleanAsGit();
}

TEST_F(MergeObstacles, NameTheFirstFile)
{
    theyWriteElsewhere();
    for (const auto *name : {"other", "file", "d/g"})
        repository_.write(name, "mine\n");
    expectEditRefused("d/g");
}

TEST_F(MergeObstacles, NameTheFirstFileWhateverIsFoundFirst)
{
    theyWrite({"d/new"});
    repository_.write("d/new", "mine\n");
    repository_.git({"update-index", "--skip-worktree", "other"});
    repository_.write("other", "mine\n");
    expectMergeRefused(inTheWay("untracked file 'd/new'"));
}

TEST_F(MergeObstacles, AreLinksAndFilesInThePlaceOfATrackedFolder)
{
    theyWriteElsewhere();
    repository_.remove("d");
    repository_.symlink("../outside", "d");
    expectEditRefused("d");
    repository_.remove("d");
    repository_.write("d", "mine\n");
    expectEditRefused("d");
    repository_.remove("d");
    repository_.git({"reset", "--quiet", "--hard"});
    expectCleanAsGit();
}

TEST_F(MergeObstacles, AreFoldersInThePlaceOfATrackedFile)
{
    theyWriteElsewhere();
    repository_.remove("other");
    repository_.write("other/inside", "mine\n");
    expectMergeRefused(inTheWay("folder 'other'"));
    repository_.remove("other/inside");
    merge("topic");
    EXPECT_EQ(repository_.read("other"), "other\n");
}

TEST_F(MergeObstacles, AreNotMissingFilesWhichComeBack)
{
    theyWriteElsewhere();
    repository_.remove("other");
    repository_.remove("d");
    merge("topic");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(MergeObstacles, AreFifosAndSockets)
{
    theyWrite({"d/new", "n/a"});
    makeFifo(repository_ / "d/new");
    expectMergeRefused(inTheWay("FIFO, socket or device 'd/new'"));
    repository_.remove("d/new");
    makeFifo(repository_ / "n");
    expectMergeRefused(inTheWay("FIFO, socket or device 'n'"));
    repository_.remove("n");
    makeSocket(repository_ / "n");
    expectMergeRefused(inTheWay("FIFO, socket or device 'n'"));
    repository_.remove("n");
    repository_.remove("other");
    makeFifo(repository_ / "other");
    expectMergeRefused(inTheWay("FIFO, socket or device 'other'"));
    repository_.remove("other");
    repository_.remove("d");
    makeSocket(repository_ / "d");
    expectMergeRefused(inTheWay("FIFO, socket or device 'd'"));
    repository_.remove("d");
    merge("topic");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(MergeObstacles, AreNotFifosAndLinksThatAreNowhereInTheWay)
{
    theyWriteElsewhere();
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

/// libgit2 writes what is in conflict without telling of it before.
TEST_F(MergeObstacles, AreUntrackedFilesWhereAConflictIsWritten)
{
    diverge([this] { repository_.remove("d/f"); }, writing("d/f", "theirs\n"));
    repository_.write("d/f", "mine\n");
    expectMergeRefused(inTheWay("untracked file 'd/f'"));
    repository_.remove("d/f");
    expectConflictsAsGit({"1 d/f", "3 d/f"});
}

TEST_F(MergeObstacles, AreIgnoredLinksWhereAConflictIsWritten)
{
    diverge([this] { repository_.remove("d/f"); }, writing("d/f", "theirs\n"));
    repository_.write(".git/info/exclude", "/d/f\n");
    repository_.symlink("../../outside/new", "d/f");
    expectMergeRefused(inTheWay("symbolic link 'd/f'"));
    expectNothingOutsideChanged();
    repository_.remove("d/f");
    expectConflictsAsGit({"1 d/f", "3 d/f"});
}

TEST_F(MergeObstacles, AreIgnoredLinksAboveAConflict)
{
    diverge([this] { repository_.remove("d"); }, writing("d/f", "theirs\n"));
    repository_.write(".git/info/exclude", "/d\n");
    repository_.symlink("../outside", "d");
    expectMergeRefused(inTheWay("symbolic link 'd'"));
    expectNothingOutsideChanged();
    repository_.remove("d");
    repository_.write("d", "ignored\n");
    expectMergeRefused(inTheWay("untracked file 'd'"));
    repository_.remove("d");
    expectConflictsAsGit({"1 d/f", "3 d/f"});
}

/// Also for a file that they have renamed, which none of their changes shows.
TEST_F(MergeObstacles, AreIgnoredLinksWhereTheyRenamedWhatWeDeleted)
{
    diverge([this] { repository_.remove("file"); },
            [this]
            {
                repository_.makeFolder("n");
                moving("file", "n/f")();
            });
    repository_.write(".git/info/exclude", "/n\n");
    repository_.symlink("../outside", "n");
    expectMergeRefused(inTheWay("symbolic link 'n'"));
    repository_.remove("n");
    repository_.write("n", "ignored\n");
    expectMergeRefused(inTheWay("untracked file 'n'"));
    repository_.remove("n");
    repository_.symlink("../../outside/f", "n/f");
    expectMergeRefused(inTheWay("symbolic link 'n/f'"));
    expectNothingOutsideChanged();
    repository_.remove("n");
    expectConflicts("topic");
    EXPECT_THAT(conflicts(), ElementsAre("1 file", "3 n/f"));
}

TEST_F(MergeObstacles, AreNotIgnoredLinksBesideAFileThatBothDeleted)
{
    const auto remove = [this] { repository_.remove("d/f"); };
    diverge([&] { remove(); }, [&] { remove(); });
    repository_.write(".git/info/exclude", "/ignored\n");
    repository_.symlink("../outside/new", "ignored");
    expectCleanAsGit();
}

TEST_F(MergeObstacles, AreLinksAboveAConflict)
{
    diverge([this] { repository_.remove("d"); }, writing("d/f", "theirs\n"));
    repository_.symlink("../outside", "d");
    expectMergeRefused(inTheWay("symbolic link 'd'"));
    repository_.remove("d");
    expectConflictsAsGit({"1 d/f", "3 d/f"});
}

TEST_F(MergeObstacles, AreThingsInAFolderThatBecomesAFile)
{
    diverge(writing("ours", "x"),
            [this]
            {
                repository_.remove("d");
                repository_.write("d", "theirs\n");
            });
    repository_.write(".git/info/exclude", "*.o\n");
    repository_.write("d/mine.o", "mine\n");
    expectMergeRefused(inChangedFolder("file 'd/mine.o'"));
    repository_.remove("d/mine.o");
    repository_.makeFolder("d/empty");
    expectMergeRefused(inChangedFolder("folder 'd/empty'"));
    expectMergesWithout("d/empty");
}

TEST_F(MergeObstacles, AreEditsThatGitHides)
{
    for (const std::string option : {"skip-worktree", "assume-unchanged"})
    {
        for (const std::string change : {"touched", "removed", "left alone"})
        {
            SCOPED_TRACE(option + ", " + change);
            const std::string start = idOf("main");
            diverge(writing("ours", "x"),
                    [&]
                    {
                        repository_.write("theirs", "x");
                        if (change == "touched")
                            repository_.write("d/g", "theirs\n");
                        else if (change == "removed")
                            repository_.remove("d/g");
                    });
            repository_.git({"update-index", "--" + option, "d/g"});
            repository_.write("d/g", "mine\n");
            expectHiddenEditRefused("d/g", option);
            repository_.git({"update-index", "--no-" + option, "d/g"});
            repository_.git({"reset", "--quiet", "--hard", start});
            repository_.git({"branch", "--quiet", "-D", "topic"});
        }
    }
}

TEST_F(MergeObstacles, AreNotHiddenFilesWithoutAnEdit)
{
    theyWrite({"d/g", "theirs"});
    repository_.symlink("d", "link");
    repository_.commitAll("link");
    repository_.git({"update-index", "--skip-worktree", "d/f", "other", "link"});
    repository_.git({"update-index", "--assume-unchanged", "d/g"});
    repository_.remove("other");
    merge("topic");
    EXPECT_EQ(repository_.read("d/g"), "theirs\n");
}

TEST_F(MergeObstacles, AreLinksInThePlaceOfHiddenFiles)
{
    theyWriteElsewhere();
    repository_.git({"update-index", "--skip-worktree", "d/f"});
    repository_.remove("d/f");
    repository_.symlink("f\n", "d/f");
    expectHiddenEditRefused("d/f", "skip-worktree");
    repository_.remove("d/f");
    makeFifo(repository_ / "d/f");
    expectHiddenEditRefused("d/f", "skip-worktree");
    repository_.remove("d/f");
    repository_.write("d/f/mine", "mine\n");
    expectHiddenEditRefused("d/f", "skip-worktree");
    repository_.remove("d");
    repository_.symlink("../outside", "d");
    expectHiddenEditRefused("d/f", "skip-worktree");
}

TEST_F(MergeObstacles, AreNotChangesInASubmodule)
{
    addModule();
    theyWriteElsewhere();
    GitRepository module(repository_ / "module");
    module.write("untracked", "mine\n");
    module.commitAll("mine");
    const std::string id = module.line({"rev-parse", "HEAD"});
    merge("topic");
    EXPECT_EQ(module.line({"rev-parse", "HEAD"}), id);
    EXPECT_EQ(module.read("untracked"), "mine\n");
}

TEST_F(MergeObstacles, AreFilesInThePlaceOfASubmodule)
{
    addModule();
    theyWriteElsewhere();
    repository_.remove("module");
    repository_.write("module", "mine\n");
    expectEditRefused("module");
}

TEST_F(MergeObstacles, AreSubmodulesThatBecomeAFile)
{
    addModule();
    diverge(writing("ours", "x"),
            [this]
            {
                repository_.git({"rm", "--quiet", "--cached", "module"});
                repository_.remove("module");
                repository_.write("module", "theirs\n");
            });
    repository_.git({"submodule", "--quiet", "update", "--init"});
    repository_.write("module/mine", "mine\n");
    expectMergeRefused(inTheWay("folder 'module'"));
}

TEST_F(MergeObstacles, OfHistoriesWithSeveralBasesAreFound)
{
    diverge(writing("ours", "1\n"), writing("theirs", "1\n"));
    crissCross(writing("ours", "2\n"), writing("d/new", "x"));
    repository_.write("d/new", "mine\n");
    expectMergeRefused(inTheWay("untracked file 'd/new'"));
    expectMergesWithout("d/new");
}

TEST_F(MergeObstacles, OfUnrelatedHistoriesAreFound)
{
    repository_.git({"checkout", "--quiet", "--orphan", "topic"});
    repository_.git({"rm", "-r", "--quiet", "--force", "."});
    repository_.write("n/new", "x");
    repository_.commitAll("unrelated");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.write("n/new", "mine\n");
    expectMergeRefused(inTheWay("untracked file 'n/new'"));
    repository_.remove("n/new");
    EXPECT_NO_THROW(merge("topic"));
}

TEST_F(MergeObstacles, ComeAfterACancellation)
{
    theyWrite({"d/new"});
    repository_.write("d/new", "mine\n");
    interactor_->cancel();
    expectNothingChanges(
        [this] { EXPECT_EQ(failureOfMerge("topic"), CancelledOperationException().what()); });
    expectMergeRefused(inTheWay("untracked file 'd/new'"));
}

/// Whatever the host's factory gives.
TEST_F(MergeObstacles, DoNotDependOnTheFactory)
{
    theyWrite({"d/new"});
    repository_.write("untracked", "mine\n");
    repository_.write("d/new", "mine\n");
    const auto factory = std::make_shared<vclink::test::TestOptionsFactory>(interactor_);
    factory->checkoutOptions.checkoutStrategy =
        GIT_CHECKOUT_FORCE | GIT_CHECKOUT_REMOVE_UNTRACKED | GIT_CHECKOUT_REMOVE_IGNORED;
    git::GitAdapter adapter(vclink::test::asPath(repository_.path()), factory);
    expectNothingChanges(
        [&] { EXPECT_ANY_THROW(git::BranchManager::create(adapter)->merge("topic")); });
    repository_.remove("d/new");
    git::BranchManager::create(adapter)->merge("topic");
    EXPECT_EQ(repository_.read("untracked"), "mine\n");
}

} // namespace

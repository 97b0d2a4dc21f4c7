// SPDX-License-Identifier: MIT
#include <string>

#include <git2/errors.h>
#include <gtest/gtest.h>

#include "expectedStates.hpp"
#include "support/Failure.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/adapterFor.hpp"
#include "support/text.hpp"

/// What the library says or does where git does something else, for states and changes that the
/// random working copies and sequences keep clear of.
namespace
{

using vclink::FileState;
using namespace vclink::test;

class DifferencesFromGit : public GitFixture
{
  protected:
    static States statesOf(const GitRepository &repository)
    {
        return statesOfAll(*adapterFor(repository));
    }
    static std::string statusOf(const GitRepository &repository)
    {
        return repository.git({"status", "--porcelain", "--untracked-files=all"});
    }

  private:
    LibGit2Session session_{environment()};
};

// For git, all below an ignored folder is ignored. libgit2 asks the rules about each folder on the
// way, and goes into an ignored one where something in it is tracked.
TEST_F(DifferencesFromGit, NegatedRulesReachIntoIgnoredFoldersThatHoldTrackedFiles)
{
    auto repository = makeRepository();
    repository.write(".gitignore", "!*/\nout/\n");
    repository.write("out/sub/tracked", "x");
    repository.add({".gitignore", "out/sub/tracked"});
    repository.commit("first");
    repository.write("out/other", "x");
    repository.write("out/sub/other", "x");
    EXPECT_EQ(statusOf(repository), "");
    EXPECT_EQ(statesOf(repository), (States{{".gitignore", FileState::Clean},
                                            {"out/sub/other", FileState::Unversioned},
                                            {"out/sub/tracked", FileState::Clean}}));
}

// git takes an ignore file for what it is, libgit2 for what a link leads to.
TEST_F(DifferencesFromGit, IgnoreFilesMayBeSymbolicLinks)
{
    const auto repository = makeRepository();
    repository.write("rules", "*.log\n");
    repository.symlink("rules", ".gitignore");
    repository.write("a.log", "x");
    EXPECT_EQ(statusOf(repository), "?? .gitignore\n?? a.log\n?? rules\n");
    EXPECT_EQ(statesOf(repository),
              (States{{".gitignore", FileState::Unversioned}, {"rules", FileState::Unversioned}}));
}

// libgit2 knows nothing of a sparse checkout.
TEST_F(DifferencesFromGit, FilesThatASparseCheckoutLeavesOutAreMissing)
{
    auto repository = makeRepository();
    repository.write("here", "x");
    repository.write("left out", "x");
    repository.commitAll("first");
    repository.git({"update-index", "--skip-worktree", "left out"});
    repository.remove("left out");
    EXPECT_EQ(statusOf(repository), "");
    EXPECT_EQ(statesOf(repository),
              (States{{"here", FileState::Clean}, {"left out", FileState::Missing}}));
}

// git leaves out what it can't look at for a reason other than that it isn't there.
TEST_F(DifferencesFromGit, FilesBelowALinkToItselfAreMissing)
{
    auto repository = makeRepository();
    repository.write("folder/file", "x");
    repository.commitAll("first");
    repository.remove("folder");
    repository.symlink("folder", "folder");
    EXPECT_EQ(statusOf(repository), "?? folder\n");
    EXPECT_EQ(statesOf(repository),
              (States{{"folder", FileState::Unversioned}, {"folder/file", FileState::Missing}}));
}

// libgit2 looks a submodule up under the name "submodule.<path>.path", which can't hold a line
// feed; the walk fails, and a walk that fails gives what it found before, here nothing.
TEST_F(DifferencesFromGit, ASubmoduleWhosePathHoldsALineFeedHidesAllStates)
{
    auto repository = makeRepository();
    repository.write("file", "x");
    GitRepository::init(repository / "line\nfeed").commit("first");
    repository.write(".gitmodules", "[submodule \"s\"]\n\tpath = \"line\\nfeed\"\n");
    repository.commitAll("first");
    EXPECT_EQ(statusOf(repository), "");
    EXPECT_EQ(statesOf(repository), States());
}

// git takes the file away; a revert of what belongs below it is refused. The index is put back
// first.
TEST_F(DifferencesFromGit, AFileThatTookTheirFoldersPlaceIsInTheWayOfARevert)
{
    auto repository = makeRepository();
    repository.write("folder/file", "x");
    repository.commitAll("first");
    repository.remove("folder");
    repository.write("folder", "instead");
    repository.git({"rm", "--quiet", "--cached", "folder/file"});
    const auto adapter = adapterFor(repository);
    const Failure failure =
        failureOf([&] { adapter->revertFiles({asPath(repository / "folder/file")}); });
    EXPECT_EQ(failure.code, GIT_ECONFLICT);
    EXPECT_EQ(repository.read("folder"), "instead");
    EXPECT_EQ(statusOf(repository), "D  folder/file\n?? folder\n");
}

} // namespace

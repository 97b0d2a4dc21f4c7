// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "AdapterTest.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "support/Descriptors.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/libgit2Release.hpp"
#include "support/text.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

using vclink::git::LibGit2Exception;
using vclink::test::asPath;
using vclink::test::GitRepository;
using vclink::test::States;

/// Code of what the query of the whole tree raises; 0 for none.
int raisedBy(vclink::git::GitAdapter &adapter)
{
    try
    {
        adapter.getFolderStates(adapter.getRootFolder());
        return 0;
    }
    catch (const LibGit2Exception &exception)
    {
        EXPECT_FALSE(exception.getError().getMessage().empty());
        return exception.getError().getCode();
    }
}

class StatusFailure : public vclink::test::AdapterTest
{
  protected:
    StatusFailure()
    {
        repository_.write("file", "x");
        repository_.commitAll("first");
        repository_.write("new", "x");
    }

    GitRepository repository_ = makeRepository();
};

TEST_F(StatusFailure, OfABareRepositoryGivesAnEmptyMap)
{
    const std::string bare = folder() / "bare";
    repository_.git({"clone", "--quiet", "--bare", repository_.path().string(), bare});
    const auto adapter = makeAdapter(bare);
    EXPECT_TRUE(adapter->getFolderStates(asPath(bare)).empty());
    EXPECT_TRUE(adapter->getFileStates({asPath(bare + "/file")}).empty());
}

TEST_F(StatusFailure, OfABrokenIndexGivesAnEmptyMap)
{
    repository_.write(".git/index",
                      "this is no index, and long enough to be told from an empty one");
    EXPECT_EQ(allStates(repository_), States());
    EXPECT_EQ(states(repository_, {"file"}), States());
}

TEST_F(StatusFailure, OfATruncatedIndexGivesAnEmptyMap)
{
    const std::string index = repository_.read(".git/index");
    repository_.write(".git/index", index.substr(0, index.size() / 2));
    EXPECT_EQ(allStates(repository_), States());
}

TEST_F(StatusFailure, OfABrokenTreeGivesAnEmptyMap)
{
    const std::string tree = repository_.line({"rev-parse", "HEAD^{tree}"});
    const std::string object = ".git/objects/" + tree.substr(0, 2) + "/" + tree.substr(2);
    repository_.remove(object);
    repository_.write(object, "this is no object");
    EXPECT_EQ(allStates(repository_), States());
}

TEST_F(StatusFailure, LeavesNoExceptionWaiting)
{
    repository_.write(".git/index",
                      "this is no index, and long enough to be told from an empty one");
    allStates(repository_);
    EXPECT_EQ(vclink::git::pendingCallbackException(), nullptr);
}

TEST_F(StatusFailure, OfAnOpeningIsRaised)
{
    repository_.write(".git/config", "[core\n");
    EXPECT_EQ(raisedBy(*makeAdapter(repository_.path())), GIT_ERROR);
    EXPECT_THROW(states(repository_, {"file"}), LibGit2Exception);
    EXPECT_EQ(raisedBy(*makeAdapter(folder() / "missing")), GIT_ENOTFOUND);
    EXPECT_EQ(raisedBy(*makeAdapter("")), GIT_ENOTFOUND);
}

TEST_F(StatusFailure, OfAFormatThatLibGit2DoesNotKnowIsRaised)
{
    repository_.git({"config", "core.repositoryFormatVersion", "9"});
    EXPECT_EQ(raisedBy(*makeAdapter(repository_.path())), GIT_ERROR);
    const auto sha256 = folder() / "sha256";
    repository_.git({"init", "--quiet", "--object-format=sha256", sha256.string()});
    EXPECT_EQ(raisedBy(*makeAdapter(sha256)), vclink::test::libgit2Release::refusalOfSha256);
    const auto extended = makeRepository("extended");
    extended.git({"config", "core.repositoryFormatVersion", "1"});
    extended.git({"config", "extensions.worktreeConfig", "true"});
    EXPECT_EQ(raisedBy(*makeAdapter(extended.path())),
              vclink::test::libgit2Release::refusalOfWorktreeConfig);
}

/// A format that only the walk meets.
TEST_F(StatusFailure, OfASplitIndexGivesAnEmptyMap)
{
    repository_.git({"update-index", "--split-index"});
    EXPECT_EQ(allStates(repository_), States());
}

TEST_F(StatusFailure, OfASparseIndexGivesAnEmptyMap)
{
    repository_.write("sub/inside", "x");
    repository_.commitAll("second");
    repository_.git({"config", "index.sparse", "true"});
    repository_.git({"config", "core.sparseCheckoutCone", "true"});
    repository_.git({"config", "core.sparseCheckout", "true"});
    repository_.write(".git/info/sparse-checkout", "/*\n!/*/\n");
    repository_.git({"read-tree", "-mu", "HEAD"});
    ASSERT_NE(repository_.git({"ls-files", "--sparse"}).find("sub/\n"), std::string::npos);
    EXPECT_EQ(allStates(repository_), States());
}

TEST_F(StatusFailure, DoesNotComeOfALockedIndex)
{
    repository_.write(".git/index.lock", "");
    EXPECT_EQ(allStates(repository_), (States{{"file", "Clean"}, {"new", "Unversioned"}}));
}

TEST_F(StatusFailure, DoesNotComeOfAHeadThatNamesNothing)
{
    repository_.write(".git/HEAD", "ref: refs/heads/nowhere\n");
    EXPECT_EQ(allStates(repository_), (States{{"file", "Added"}, {"new", "Unversioned"}}));
}

TEST_F(StatusFailure, OfAHeadThatIsGarbageGivesAnEmptyMap)
{
    repository_.write(".git/HEAD", "no reference\n");
    EXPECT_EQ(allStates(repository_), States());
}

/// What an unreadable folder of untracked files holds is not known, and the rest is told.
TEST_F(StatusFailure, OfAnUntrackedFolderThatCannotBeReadLeavesItOut)
{
    repository_.write("locked/inside", "x");
    repository_.setMode("locked", 0000);
    vclink::test::giveToUnprivilegedUser(repository_.path());
    EXPECT_EQ(vclink::test::runAsUnprivilegedUser(
                  [this] { return testing::PrintToString(allStates(repository_)); }),
              testing::PrintToString(States{{"file", "Clean"}, {"new", "Unversioned"}}));
}

TEST_F(StatusFailure, OfATrackedFolderThatCannotBeReadTellsItsFilesAsMissing)
{
    repository_.write("locked/inside", "x");
    repository_.commitAll("second");
    repository_.setMode("locked", 0000);
    vclink::test::giveToUnprivilegedUser(repository_.path());
    EXPECT_EQ(vclink::test::runAsUnprivilegedUser(
                  [this] { return testing::PrintToString(allStates(repository_)); }),
              testing::PrintToString(
                  States{{"file", "Clean"}, {"locked/inside", "Missing"}, {"new", "Clean"}}));
}

TEST_F(StatusFailure, LeavesNoDescriptorOpen)
{
    const auto fine = makeAdapter(repository_.path());
    const GitRepository broken = GitRepository::clone(repository_.path(), folder() / "broken");
    broken.write(".git/index", "this is no index, and long enough to be told from an empty one");
    const auto failing = makeAdapter(broken.path());
    const auto missing = makeAdapter(folder() / "missing");
    raisedBy(*fine);
    const vclink::test::NoDescriptorLeak noLeak;
    for (int i = 0; i < 10; ++i)
    {
        EXPECT_EQ(raisedBy(*fine), 0);
        EXPECT_EQ(raisedBy(*failing), 0);
        EXPECT_EQ(raisedBy(*missing), GIT_ENOTFOUND);
    }
}

} // namespace

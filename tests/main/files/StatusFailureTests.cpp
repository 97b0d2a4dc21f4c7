// SPDX-License-Identifier: MIT
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "error/errorUtil/callbackException.hpp"
#include "main/AdapterFixture.hpp"
#include "support/Change.hpp"
#include "support/Failure.hpp"
#include "support/Sentence.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/libgit2Release.hpp"
#include "support/text.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

using vclink::git::LibGit2Exception;
using namespace vclink::test;

/// Code of what the query of the whole tree throws.
int raisedBy(vclink::git::GitAdapter &adapter)
{
    const Failure failure = failureOf([&] { adapter.getFolderStates(adapter.getRootFolder()); });
    EXPECT_NE(failure.text, "");
    return failure.code;
}

class StatusFailure : public AdapterFixture
{
  protected:
    StatusFailure()
    {
        repository_.commitAll(writes("file", "x"), "first");
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
    EXPECT_EQ(raisedBy(*makeAdapter(sha256)), libgit2_release::refusalOfSha256);
    const auto extended = makeRepository("extended");
    extended.git({"config", "core.repositoryFormatVersion", "1"});
    extended.git({"config", "extensions.worktreeConfig", "true"});
    EXPECT_EQ(raisedBy(*makeAdapter(extended.path())), libgit2_release::refusalOfWorktreeConfig);
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

/// What an unreadable folder of untracked files holds is not known, and the rest is told.
TEST_F(StatusFailure, OfAnUntrackedFolderThatCannotBeReadLeavesItOut)
{
    repository_.write("locked/inside", "x");
    repository_.setMode("locked", 0000);
    giveToUnprivilegedUser(repository_.path());
    EXPECT_EQ(
        runAsUnprivilegedUser([this] { return testing::PrintToString(allStates(repository_)); }),
        testing::PrintToString(States{{"file", "Clean"}, {"new", "Unversioned"}}));
}

TEST_F(StatusFailure, OfATrackedFolderThatCannotBeReadTellsItsFilesAsMissing)
{
    repository_.commitAll(writes("locked/inside", "x"), "second");
    repository_.setMode("locked", 0000);
    giveToUnprivilegedUser(repository_.path());
    EXPECT_EQ(
        runAsUnprivilegedUser([this] { return testing::PrintToString(allStates(repository_)); }),
        testing::PrintToString(
            States{{"file", "Clean"}, {"locked/inside", "Missing"}, {"new", "Clean"}}));
}

void truncateIndex(const GitRepository &repository)
{
    const std::string index = repository.read(".git/index");
    repository.write(".git/index", index.substr(0, index.size() / 2));
}

void makeIndexSparse(const GitRepository &repository)
{
    repository.write("sub/inside", "x");
    GitRepository(repository).commitAll("second");
    repository.git({"config", "index.sparse", "true"});
    repository.git({"config", "core.sparseCheckoutCone", "true"});
    repository.git({"config", "core.sparseCheckout", "true"});
    repository.write(".git/info/sparse-checkout", "/*\n!/*/\n");
    repository.git({"read-tree", "-mu", "HEAD"});
    ASSERT_NE(repository.git({"ls-files", "--sparse"}).find("sub/\n"), std::string::npos);
}

void breakTree(const GitRepository &repository)
{
    const std::string tree = repository.line({"rev-parse", "HEAD^{tree}"});
    const std::string object = ".git/objects/" + tree.substr(0, 2) + "/" + tree.substr(2);
    repository.remove(object);
    repository.write(object, "this is no object");
}

/// What only the walk meets.
struct BrokenPart : Sentence
{
    Change breakIt;
};

class StatusOf : public StatusFailure, public testing::WithParamInterface<BrokenPart>
{
};

TEST_P(StatusOf, IsAnEmptyMapAndNoExceptionWaits)
{
    GetParam().breakIt(repository_);
    EXPECT_EQ(allStates(repository_), States());
    EXPECT_EQ(states(repository_, {"file"}), States());
    EXPECT_EQ(vclink::git::pendingCallbackException(), nullptr);
}

const BrokenPart brokenParts[]{
    {{"ABrokenIndex"}, writes(".git/index", notAnIndex)},
    {{"ATruncatedIndex"}, truncateIndex},
    {{"ASplitIndex"}, runsGit({"update-index", "--split-index"})},
    {{"ASparseIndex"}, makeIndexSparse},
    {{"ABrokenTree"}, breakTree},
    {{"AHeadThatIsGarbage"}, writes(".git/HEAD", "no reference\n")},
};

INSTANTIATE_TEST_SUITE_P(With, StatusOf, testing::ValuesIn(brokenParts),
                         testing::PrintToStringParamName());

} // namespace

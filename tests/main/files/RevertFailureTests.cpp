// SPDX-License-Identifier: MIT
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"

namespace
{

using testing::ElementsAre;
using namespace vclink::test;

/// What a failure of a revert leaves behind: everything, or what the reset of the index made.
class RevertFailure : public StagingFixture
{
  protected:
    RevertFailure()
    {
        repository_.write("file", "staged\n");
        repository_.add({"file"});
        repository_.write("file", "edited\n");
        repository_.write("other", "edited\n");
        repository_.write("sub/inside", "staged\n");
        repository_.add({"sub/inside"});
    }

    RepositoryState::Entries committedIndex() const
    {
        return stateAfterGit({{"restore", "--staged", "."}}).index;
    }
    std::string path(const std::string &name) const
    {
        return repository_ / name;
    }
};

TEST_F(RevertFailure, OfABrokenIndexChangesNothing)
{
    repository_.write(".git/index", notAnIndex);
    const auto index = stampOf(path(".git/index"));
    const auto tree = workingTreeOf(repository_);
    EXPECT_EQ(failureOf([this] { revert({"file"}); }),
              (Failure{GIT_ERROR, GIT_ERROR_INDEX,
                       "invalid data in index - incorrect header signature"}));
    EXPECT_EQ(stampOf(path(".git/index")), index);
    EXPECT_EQ(workingTreeOf(repository_), tree);
}

/// The file is out of the index, as where there is no commit, and on disk as it was. In a process
/// of its own, because libgit2 loses memory over a reference like this one.
TEST_F(RevertFailure, OfAHeadThatCannotBeReadLeavesTheResetInPlace)
{
    repository_.write(".git/refs/heads/main", std::string(40, '1') + "\n");
    giveAway();
    RepositoryState expected = stateOf(repository_);
    expected.index.erase("file");
    EXPECT_EQ(unprivilegedFailureOf([this] { revert({"file"}); }),
              printed({GIT_ENOTFOUND, GIT_ERROR_ODB,
                       "object not found - no match for id (" + std::string(40, '1') + ")"}));
    EXPECT_EQ(stateOf(repository_), expected);
}

TEST_F(RevertFailure, OfAFileThatCannotBeCreatedChangesNothingAndIsOverWhenItsCauseIsGone)
{
    repository_.remove("sub/inside");
    giveAway();
    repository_.setMode("sub", 0555);
    const RepositoryState expected = stateOf(repository_);
    EXPECT_EQ(unprivilegedFailureOf(
                  [this] {
                      revert({"sub/inside", "file", "other"});
                  }),
              printed({GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
                       "the file 'sub/inside' cannot be created in its folder"}));
    EXPECT_EQ(stateOf(repository_), expected);
    repository_.setMode("sub", 0755);
    revert({"sub/inside", "file", "other"});
    EXPECT_THAT(status(), ElementsAre());
}

/// An entry is not made for what is not there.
TEST_F(RevertFailure, OfAContentThatTheResetMissesChangesNothing)
{
    const std::string id = repository_.line({"rev-parse", "HEAD:file"});
    repository_.remove(".git/objects/" + id.substr(0, 2) + "/" + id.substr(2));
    const NothingChanges nothing(repository_);
    EXPECT_EQ(failureOf(
                  [this] {
                      revert({"file", "other"});
                  }),
              (Failure{GIT_ERROR, GIT_ERROR_ODB,
                       "object not found - cannot read header for (" + id + ")"}));
}

/// What came before the failure is on disk.
TEST_F(RevertFailure, OfAContentThatTheCheckoutMissesLeavesTheResetAndTheFile)
{
    const std::string id = repository_.line({"rev-parse", "HEAD:other"});
    repository_.remove(".git/objects/" + id.substr(0, 2) + "/" + id.substr(2));
    RepositoryState expected = stateOf(repository_);
    expected.index = committedIndex();
    expected.index["sub/inside"] = indexOf(repository_).at("sub/inside");
    EXPECT_EQ(
        failureOf(
            [this] {
                revert({"file", "other"});
            }),
        (Failure{GIT_ENOTFOUND, GIT_ERROR_ODB, "object not found - no match for id (" + id + ")"}));
    expected.workingTree = workingTreeOf(repository_);
    EXPECT_EQ(stateOf(repository_), expected);
    EXPECT_EQ(repository_.read("other"), "edited\n");
}

/// git would take the file away.
TEST_F(RevertFailure, OfAFolderWhereAFileStandsNowChangesNothingAndIsOverWhenTheFileIsGone)
{
    repository_.remove("sub");
    repository_.write("sub", "precious");
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOf([this] { revert({"sub/inside"}); }),
                  (Failure{GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
                           "the untracked file 'sub' is in the way of the checkout"}));
    }
    repository_.remove("sub");
    revert({"sub/inside"});
    EXPECT_THAT(status(), ElementsAre("MM file", " M other"));
}

/// The link would be written through.
TEST_F(RevertFailure, OfALinkThatCannotBeRemovedWritesNothingThroughIt)
{
    repository_.write("../outside", "precious");
    repository_.remove("sub/inside");
    repository_.symlink("../../outside", "sub/inside");
    giveAway();
    repository_.setMode("sub", 0555);
    RepositoryState expected = stateOf(repository_);
    expected.index = committedIndex();
    expected.index["file"] = indexOf(repository_).at("file");
    EXPECT_EQ(unprivilegedFailureOf([this] { revert({"sub"}); }),
              printed({GIT_ERROR, GIT_ERROR_OS,
                       "could not remove '" + path("sub/inside") + "': Permission denied"}));
    EXPECT_EQ(stateOf(repository_), expected);
    EXPECT_EQ(repository_.read("../outside"), "precious");
    repository_.setMode("sub", 0755);
}

} // namespace

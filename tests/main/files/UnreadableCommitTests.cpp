// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include "CommitFixture.hpp"
#include "support/UnprivilegedUser.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

using testing::ElementsAre;
using namespace vclink::test;

/// Base of the fixtures whose working copy can't be read whole by its owner.
class UnreadableTest : public CommitFixture
{
  protected:
    UnreadableTest()
    {
        repository_.commitAll(writes("sub/deep/lowest", "x"), "deep");
    }

    /// Takes permissions away, commits, and gives them back.
    std::string commitWithMode(const std::string &name, unsigned mode) const
    {
        const unsigned before =
            static_cast<unsigned>(std::filesystem::status(repository_ / name).permissions());
        repository_.setMode(name, mode);
        const std::string outcome = commitAsItsOwner();
        repository_.setMode(name, before);
        return outcome;
    }
    void expectRefused(const std::string &name, unsigned mode, const std::string &outcome) const
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(commitWithMode(name, mode), outcome);
    }
    std::string lockedText(const std::string &call, const std::string &name) const
    {
        return "-14 2 failed " + call + " - '" + (repository_ / name).string() +
               "' is locked: Permission denied";
    }

    const std::string lowestText_ =
        "-1 2 could not read 'sub/deep/lowest', which is tracked: Permission denied";
};

class UnreadableCommit : public UnreadableTest
{
  protected:
    UnreadableCommit()
    {
        repository_.write("file", "changed\n");
        giveAway();
    }
};

TEST_F(UnreadableCommit, IsMadeWhereEverythingCanBeRead)
{
    EXPECT_EQ(commitAsItsOwner(), "committed");
    EXPECT_EQ(committed("file"), "changed\n");
}

/// Folders without any permission, that can be entered and not listed, and listed and not entered;
/// a file that changed and one that did not; the root; and a folder beside a file that is deleted.
TEST_F(UnreadableCommit, IsRefusedOverWhatCannotBeRead)
{
    for (const auto *name : {"sub", "sub/deep"})
    {
        expectRefused(name, 0000, lowestText_);
        expectRefused(name, 0311, lowestText_);
    }
    expectRefused("sub/deep", 0644, lockedText("stat", "sub/deep/lowest"));
    expectRefused("file", 0000, lockedText("open", "file"));
    expectRefused("other", 0000, lockedText("open", "other"));
    expectRefused("", 0311,
                  "-3 2 failed to open directory '" + repository_.path().string() +
                      "/': Permission denied");
    repository_.remove("other");
    expectRefused("sub", 0000, lowestText_);
}

/// What counts is the user by whose rights files are opened.
TEST_F(UnreadableCommit, IsRefusedWhateverTheRealUserMayRead)
{
    struct stat owned = {};
    ASSERT_EQ(::stat(repository_.path().c_str(), &owned), 0);
    repository_.setMode("sub", 0311);
    const uid_t before = ::geteuid();
    ASSERT_EQ(::seteuid(owned.st_uid), 0);
    EXPECT_THROW(commit(), vclink::git::LibGit2Exception);
    ASSERT_EQ(::seteuid(before), 0);
    repository_.setMode("sub", 0755);
    EXPECT_EQ(repository_.git({"diff", "--cached", "--name-only"}), "");
}

TEST_F(UnreadableCommit, DropsAFileThatIsGoneFromAFolderThatCannotBeListed)
{
    repository_.remove("sub/deep/lowest");
    EXPECT_EQ(commitWithMode("sub/deep", 0311), "committed");
    EXPECT_THAT(namesIn(), ElementsAre("file", "other", "sub/inside"));
}

TEST_F(UnreadableCommit, DoesNotCareForAnUntrackedFolder)
{
    repository_.write("untracked/file", "x");
    giveToUnprivilegedUser(repository_.path());
    EXPECT_EQ(commitWithMode("untracked", 0000), "committed");
    EXPECT_EQ(committed("file"), "changed\n");
}

TEST_F(UnreadableCommit, KeepsWhatIsNotCheckedOutInAFolderThatCannotBeRead)
{
    repository_.git({"update-index", "--skip-worktree", "sub/inside", "sub/deep/lowest"});
    giveToUnprivilegedUser(repository_.path());
    EXPECT_EQ(commitWithMode("sub", 0000), "committed");
    EXPECT_THAT(namesIn(), ElementsAre("file", "other", "sub/deep/lowest", "sub/inside"));
}

/// A merge that stopped at a conflict in "sub/inside".
class UnreadableMergeConclusion : public UnreadableTest
{
  protected:
    UnreadableMergeConclusion()
    {
        beginMerge({"sub/inside"});
        giveAway();
    }
};

TEST_F(UnreadableMergeConclusion, IsRefusedAndTheMergeStaysUnderWayUntilItCanBeRead)
{
    expectRefused("sub", 0000, lowestText_);
    EXPECT_EQ(repository_.read(".git/MERGE_HEAD"), idOf("theirs") + '\n');
    EXPECT_NE(repository_.git({"ls-files", "--unmerged"}), "");
    EXPECT_EQ(commitAsItsOwner(), "committed");
    EXPECT_EQ(parents().size(), 2U);
}

TEST_F(UnreadableMergeConclusion, IsRefusedOverAConflictThatCannotBeRead)
{
    repository_.git({"rm", "--quiet", "--cached", "sub/deep/lowest"});
    giveToUnprivilegedUser(repository_.path());
    expectRefused("sub", 0000,
                  "-1 2 could not read 'sub/inside', which is tracked: Permission denied");
}

} // namespace

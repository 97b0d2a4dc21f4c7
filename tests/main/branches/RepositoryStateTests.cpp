// SPDX-License-Identifier: MIT
#include "support/RepositoryState.hpp"

#include <functional>
#include <string>

#include <gtest/gtest.h>

#include "support/GitFixture.hpp"

namespace
{

using vclink::test::indexStampOf;
using vclink::test::RepositoryState;
using vclink::test::stampOf;
using vclink::test::stateOf;

/// That a comparison of two of them can fail.
class RepositoryStateTest : public vclink::test::GitFixture
{
  protected:
    RepositoryStateTest()
    {
        repository_.write("file", "content\n");
        repository_.write("sub/other", "content\n");
        repository_.commitAll("first");
    }

    /// The state after a change that one field alone tells.
    RepositoryState after(const std::function<void()> &change)
    {
        const RepositoryState before = stateOf(repository_);
        EXPECT_EQ(stateOf(repository_), before);
        change();
        RepositoryState changed = stateOf(repository_);
        EXPECT_NE(changed, before);
        return changed;
    }

    vclink::test::GitRepository repository_ = makeRepository();
};

TEST_F(RepositoryStateTest, TellsAChangedContent)
{
    const RepositoryState state = after([this] { repository_.write("file", "CONTENT\n"); });
    EXPECT_EQ(state.workingTree.at("file"), "644 CONTENT\n");
}

TEST_F(RepositoryStateTest, TellsALongContentByItsHash)
{
    repository_.write("file", std::string(10'000, 'x'));
    after([this] { repository_.write("file", std::string(9'999, 'x') + 'y'); });
}

TEST_F(RepositoryStateTest, TellsAModeALinkAndAFolder)
{
    RepositoryState state = after([this] { repository_.setMode("file", 0755); });
    EXPECT_EQ(state.workingTree.at("file"), "755 content\n");
    state = after([this] { repository_.symlink("file", "link"); });
    EXPECT_EQ(state.workingTree.at("link"), "link to file");
    state = after([this] { repository_.makeFolder("empty"); });
    EXPECT_EQ(state.workingTree.at("empty"), "755 folder");
}

TEST_F(RepositoryStateTest, TellsAnIndexEntry)
{
    const RepositoryState before = stateOf(repository_);
    const RepositoryState state = after(
        [this] {
            repository_.git({"rm", "--quiet", "--cached", "file"});
        });
    EXPECT_EQ(state.index.count("file"), 0U);
    EXPECT_EQ(state.workingTree, before.workingTree);
}

TEST_F(RepositoryStateTest, TellsTheFlagsOfAnIndexEntry)
{
    const std::string id = repository_.line({"hash-object", "file"});
    RepositoryState state = after(
        [this] {
            repository_.git({"update-index", "--skip-worktree", "file"});
        });
    EXPECT_EQ(state.index.at("file"), "S 100644 " + id + " 0");
    state = after([this] { repository_.git({"update-index", "--assume-unchanged", "file"}); });
    EXPECT_EQ(state.index.at("file"), "s 100644 " + id + " 0");
}

TEST_F(RepositoryStateTest, TellsTheStagesOfAConflict)
{
    const std::string id = repository_.line({"hash-object", "file"});
    const std::string zeros(40, '0');
    const RepositoryState state = after(
        [&]
        {
            repository_.command({"update-index", "--index-info"})
                .input("0 " + zeros + "\tfile\n100644 " + id + " 2\tfile\n100644 " + id +
                       " 3\tfile\n")
                .run();
        });
    EXPECT_EQ(state.index.at("file"), "M 100644 " + id + " 2\nM 100644 " + id + " 3");
}

TEST_F(RepositoryStateTest, TellsHeadAndReferences)
{
    after([this] { repository_.git({"branch", "other"}); });
    after([this] { repository_.git({"checkout", "--quiet", "other"}); });
    after([this] { repository_.git({"checkout", "--quiet", "--detach"}); });
    const RepositoryState state = after([this] { repository_.commit("second"); });
    EXPECT_EQ(state.head, repository_.git({"rev-parse", "HEAD"}));
}

TEST_F(RepositoryStateTest, TellsAMergeThatIsUnderWayAndALock)
{
    const RepositoryState state = after([this] { repository_.write(".git/MERGE_HEAD", "x\n"); });
    EXPECT_EQ(state.underWay.at("MERGE_HEAD"), "x\n");
    after([this] { repository_.write(".git/index.lock", ""); });
}

TEST_F(RepositoryStateTest, OfARepositoryWithoutACommitCanBeTaken)
{
    const auto empty = makeRepository("empty");
    EXPECT_EQ(stateOf(empty).head, "refs/heads/main\n");
    EXPECT_TRUE(stateOf(empty).index.empty());
}

TEST_F(RepositoryStateTest, LeavesTheIndexFileAlone)
{
    const auto before = indexStampOf(repository_);
    stateOf(repository_);
    EXPECT_EQ(indexStampOf(repository_), before);
}

TEST_F(RepositoryStateTest, HasAStampForAFileWrittenWithTheSameBytes)
{
    const auto before = indexStampOf(repository_);
    repository_.git({"update-index", "--force-write-index"});
    EXPECT_EQ(indexStampOf(repository_).bytes, before.bytes);
    EXPECT_NE(indexStampOf(repository_), before);
    EXPECT_EQ(stampOf(repository_ / "missing"), vclink::test::FileStamp());
    EXPECT_NE(stampOf(repository_ / "file"), stampOf(repository_ / "sub/other"));
}

} // namespace

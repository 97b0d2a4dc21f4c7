// SPDX-License-Identifier: MIT
#include <cstddef>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "InterruptedMergeFixture.hpp"

namespace
{

using testing::HasSubstr;
using namespace vclink::test;

/// Kinds of changes, in the order in which libgit2 writes them: deletions first.
class KilledMerge : public InterruptedMerge, public testing::WithParamInterface<std::size_t>
{
  protected:
    KilledMerge()
    {
        repository_.write("both", "1\n2\n3\n4\n5\n6\n7\n");
        repository_.write("renamed", "one line\nand another\nand a third\n");
        for (const auto *name : {"deleted", "untouched", "sub/tracked", "becomes a file/a",
                                 "becomes a file/b", "becomes a folder"})
            repository_.write(name, "x");
        repository_.commitAll(writes(".gitignore", "*.ignored\n"), "more");
        diverge(writes("both", "ours\n2\n3\n4\n5\n6\n7\n") + moves("renamed", "of another name"),
                writes("both", "1\n2\n3\n4\n5\n6\ntheirs\n") + removes("deleted") +
                    writes("renamed", "one line\nand another\nand a third\nof theirs\n") +
                    writes("file", "theirs\n") + writes("new", std::string("\0binary\1", 8)) +
                    writes("sub/new", "theirs\n") + writes("fresh/new", "theirs\n") +
                    removes("becomes a file") + writes("becomes a file", "theirs\n") +
                    removes("becomes a folder") + writes("becomes a folder/a", "theirs\n") +
                    writes("becomes a folder/b", "theirs\n") +
                    writes("forced.ignored", "theirs\n") +
                    runsGit({"add", "--force", "forced.ignored"}));
        repository_.write("untracked", "mine");
        repository_.write("sub/untracked", "mine");
        repository_.write("mine.ignored", "mine");
        before_ = stateOf(repository_);
    }

    RepositoryState before_;
};

TEST_P(KilledMerge, IsNotConcludedByACommit)
{
    killMergeAt(GetParam());
    expectRefused();
    repository_.git({"add", "--update"});
    expectRefused();
}

TEST_P(KilledMerge, IsTakenBackByTheCommandsThatTheRefusalNames)
{
    killMergeAt(GetParam());
    run(wayOut());
    const auto after = stateOf(repository_);
    EXPECT_EQ(after.head, before_.head);
    EXPECT_EQ(after.index, before_.index);
    EXPECT_EQ(after.workingTree, before_.workingTree);
    EXPECT_EQ(after.underWay.count("MERGE_HEAD"), 0U);
    merge("topic");
    EXPECT_EQ(parents(), (std::vector<std::string>{idOf("main^"), idOf("topic")}));
    EXPECT_EQ(repository_.read("both"), "ours\n2\n3\n4\n5\n6\ntheirs\n");
    EXPECT_EQ(repository_.read("sub/new"), "theirs\n");
    EXPECT_EQ(repository_.read("becomes a file"), "theirs\n");
    EXPECT_EQ(repository_.read("becomes a folder/b"), "theirs\n");
    EXPECT_THAT(repository_.read("of another name"), HasSubstr("of theirs"));
    EXPECT_FALSE(exists("deleted"));
    EXPECT_EQ(repository_.read("sub/untracked"), "mine");
}

TEST_P(KilledMerge, IsTakenBackWithoutWhatWasEditedSince)
{
    killMergeAt(GetParam());
    // The last in a file of the merge.
    for (const auto *name : {"untouched", "later", "sub/later", "file"})
        repository_.write(name, "edited since\n");
    run(wayOut());
    for (const auto *name : {"untouched", "later", "sub/later"})
        EXPECT_EQ(repository_.read(name), "edited since\n") << name;
    EXPECT_EQ(repository_.git({"show", "stash@{0}:file"}), "edited since\n");
    EXPECT_EQ(repository_.git({"status", "--porcelain", "--untracked-files=no"}), " M untouched\n");
    commit();
    merge("topic");
    EXPECT_EQ(repository_.git({"show", "HEAD:untouched"}), "edited since\n");
    EXPECT_EQ(repository_.git({"show", "HEAD:fresh/new"}), "theirs\n");
}

INSTANTIATE_TEST_SUITE_P(AtCall, KilledMerge, testing::Values(1U, 2U, 3U, 4U, 6U, 8U, 10U, 12U));

} // namespace

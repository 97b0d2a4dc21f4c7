// SPDX-License-Identifier: MIT
#include "main/checkout/conflictLocks.hpp"

#include <functional>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"

namespace
{

using testing::IsEmpty;

/// A conflict in "file", and something with the name "file.lock".
class ConflictLocks : public vclink::test::ObstacleFixture
{
  protected:
    void makeConflict(const std::function<void()> &also = [] {})
    {
        diverge(writing("file", "ours\n"),
                [&]
                {
                    repository_.write("a first", "x");
                    repository_.write("file", "theirs\n");
                    also();
                });
    }
    void expectRefused(const std::string &name = "file") const
    {
        expectMergeRefused(refusal("the conflict in '" + name + "' cannot be written beside '" +
                                   name + ".lock': merge with 'git merge'"));
    }
    void commitLock()
    {
        repository_.write("file.lock", "x");
        repository_.commitAll("lock");
    }
};

TEST_F(ConflictLocks, RefuseTheMergeIfTheyAreUntracked)
{
    makeConflict();
    repository_.write("file.lock", "mine\n");
    expectRefused();
    repository_.remove("file.lock");
    repository_.makeFolder("file.lock");
    expectRefused();
    repository_.remove("file.lock");
    expectConflictsAsGit({"1 file", "2 file", "3 file"});
}

TEST_F(ConflictLocks, RefuseTheMergeIfTheyAreTracked)
{
    commitLock();
    makeConflict();
    expectRefused();
    repository_.remove("file.lock");
    expectRefused();
}

/// A merge puts back what is missing, before it writes the conflicts.
TEST_F(ConflictLocks, RefuseTheMergeIfTheyAreMissing)
{
    diverge(
        [this]
        {
            repository_.write("file", "ours\n");
            repository_.write("file.lock", "x");
        },
        writing("file", "theirs\n"));
    repository_.remove("file.lock");
    expectRefused();
}

TEST_F(ConflictLocks, RefuseTheMergeIfTheyCome)
{
    makeConflict(writing("file.lock", "x"));
    expectRefused();
}

TEST_F(ConflictLocks, RefuseTheMergeOfAFileThatBothHaveAdded)
{
    diverge(writing("new", "ours\n"), writing("new", "theirs\n"));
    repository_.write("new.lock", "mine\n");
    expectMergeRefused(refusal("the conflict in 'new' cannot be written beside 'new.lock': "
                               "merge with 'git merge'"));
}

TEST_F(ConflictLocks, RefuseTheMergeOfAFileWhoseCommandMayGiveUp)
{
    repository_.write("file", "1\n2\n3\n4\n5\n");
    repository_.write(".gitattributes", "file merge=tool\n");
    repository_.write("file.lock", "x");
    repository_.commitAll("lock");
    diverge(writing("file", "ours\n2\n3\n4\n5\n"), writing("file", "1\n2\n3\n4\ntheirs\n"));
    expectRefused();
}

/// Either side renames a file that the other has changed.
TEST_F(ConflictLocks, RefuseTheMergeOfAFileThatOursHasRenamed)
{
    const std::string text = "1\n2\n3\n4\n5\n6\n7\n8\n";
    repository_.write("old", text);
    repository_.commitAll("old");
    diverge(
        [&]
        {
            repository_.remove("old");
            repository_.write("renamed", "ours\n" + text);
        },
        writing("old", "theirs\n" + text));
    repository_.write("renamed.lock", "mine\n");
    expectRefused("renamed");
    repository_.remove("renamed.lock");
    expectConflicts("topic");
}

TEST_F(ConflictLocks, RefuseTheMergeOfAFileThatTheirsHasRenamed)
{
    const std::string text = "1\n2\n3\n4\n5\n6\n7\n8\n";
    repository_.write("old", text);
    repository_.commitAll("old");
    diverge(writing("old", "ours\n" + text),
            [&]
            {
                repository_.remove("old");
                repository_.write("renamed", "theirs\n" + text);
                repository_.write("renamed.lock", "x");
            });
    expectRefused("renamed");
}

TEST_F(ConflictLocks, AreInNobodysWayIfARenamedFileMergesCleanly)
{
    const std::string text = "1\n2\n3\n4\n5\n6\n7\n8\n";
    repository_.write("old", text);
    repository_.commitAll("old");
    diverge(
        [&]
        {
            repository_.remove("old");
            repository_.write("new/file", "ours\n" + text);
            repository_.write("new/file.lock", "x");
        },
        writing("old", text + "theirs\n"));
    expectCleanAsGit();
    EXPECT_EQ(repository_.read("new/file"), "ours\n" + text + "theirs\n");
}

TEST_F(ConflictLocks, AreInNobodysWayWithoutAConflict)
{
    repository_.write("file", "1\n2\n3\n4\n5\n");
    commitLock();
    diverge(writing("file", "ours\n2\n3\n4\n5\n"), writing("file", "1\n2\n3\n4\ntheirs\n"));
    expectCleanAsGit();
    EXPECT_EQ(repository_.read("file.lock"), "x");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(ConflictLocks, AreInNobodysWayIfOneSideHasDeletedTheFile)
{
    commitLock();
    diverge(writing("file", "ours\n"), [this] { repository_.remove("file"); });
    expectConflictsAsGit({"1 file", "2 file"});
}

} // namespace

// SPDX-License-Identifier: MIT
#include "main/checkout/conflictLocks.hpp"

#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"

namespace
{

using testing::IsEmpty;
using namespace vclink::test;

const std::string eightLines = "1\n2\n3\n4\n5\n6\n7\n8\n";

/// A conflict in "file", and something with the name "file.lock".
class ConflictLocks : public ObstacleFixture
{
  protected:
    void makeConflict(const Change &also = changesNothing)
    {
        diverge(writes("file", "ours\n"), writesEach({"a first", "file"}, "theirs\n") + also);
    }
    void expectLockRefused(const std::string &name = "file") const
    {
        expectMergeRefused(refusal("the conflict in '" + name + "' cannot be written beside '" +
                                   name + ".lock': merge with 'git merge'"));
    }
    void commitLock()
    {
        repository_.commitAll(writes("file.lock", "x"), "lock");
    }
};

TEST_F(ConflictLocks, RefuseTheMergeIfTheyAreUntracked)
{
    makeConflict();
    repository_.write("file.lock", "mine\n");
    expectLockRefused();
    repository_.remove("file.lock");
    repository_.makeFolder("file.lock");
    expectLockRefused();
    repository_.remove("file.lock");
    expectConflictsAsGit({"1 file", "2 file", "3 file"});
}

TEST_F(ConflictLocks, RefuseTheMergeIfTheyAreTracked)
{
    commitLock();
    makeConflict();
    expectLockRefused();
    repository_.remove("file.lock");
    expectLockRefused();
}

/// A merge puts back what is missing, before it writes the conflicts.
TEST_F(ConflictLocks, RefuseTheMergeIfTheyAreMissing)
{
    diverge(writes("file", "ours\n") + writes("file.lock", "x"), writes("file", "theirs\n"));
    repository_.remove("file.lock");
    expectLockRefused();
}

TEST_F(ConflictLocks, RefuseTheMergeIfTheyCome)
{
    makeConflict(writes("file.lock", "x"));
    expectLockRefused();
}

TEST_F(ConflictLocks, RefuseTheMergeOfAFileThatBothHaveAdded)
{
    diverge(writes("new", "ours\n"), writes("new", "theirs\n"));
    repository_.write("new.lock", "mine\n");
    expectLockRefused("new");
}

TEST_F(ConflictLocks, RefuseTheMergeOfAFileWhoseCommandMayGiveUp)
{
    repository_.commitAll(writes("file", "1\n2\n3\n4\n5\n") +
                              writes(".gitattributes", "file merge=tool\n") +
                              writes("file.lock", "x"),
                          "lock");
    diverge(writes("file", "ours\n2\n3\n4\n5\n"), writes("file", "1\n2\n3\n4\ntheirs\n"));
    expectLockRefused();
}

/// Either side renames a file that the other has changed.
TEST_F(ConflictLocks, RefuseTheMergeOfAFileThatOursHasRenamed)
{
    repository_.commitAll(writes("old", eightLines), "old");
    diverge(removes("old") + writes("renamed", "ours\n" + eightLines),
            writes("old", "theirs\n" + eightLines));
    repository_.write("renamed.lock", "mine\n");
    expectLockRefused("renamed");
    repository_.remove("renamed.lock");
    expectConflicts("topic");
}

TEST_F(ConflictLocks, RefuseTheMergeOfAFileThatTheirsHasRenamed)
{
    repository_.commitAll(writes("old", eightLines), "old");
    diverge(writes("old", "ours\n" + eightLines), removes("old") +
                                                      writes("renamed", "theirs\n" + eightLines) +
                                                      writes("renamed.lock", "x"));
    expectLockRefused("renamed");
}

TEST_F(ConflictLocks, AreInNobodysWayIfARenamedFileMergesCleanly)
{
    repository_.commitAll(writes("old", eightLines), "old");
    diverge(removes("old") + writes("new/file", "ours\n" + eightLines) +
                writes("new/file.lock", "x"),
            writes("old", eightLines + "theirs\n"));
    expectCleanAsGit();
    EXPECT_EQ(repository_.read("new/file"), "ours\n" + eightLines + "theirs\n");
}

TEST_F(ConflictLocks, AreInNobodysWayWithoutAConflict)
{
    repository_.write("file", "1\n2\n3\n4\n5\n");
    commitLock();
    diverge(writes("file", "ours\n2\n3\n4\n5\n"), writes("file", "1\n2\n3\n4\ntheirs\n"));
    expectCleanAsGit();
    EXPECT_EQ(repository_.read("file.lock"), "x");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(ConflictLocks, AreInNobodysWayIfOneSideHasDeletedTheFile)
{
    commitLock();
    diverge(writes("file", "ours\n"), removes("file"));
    expectConflictsAsGit({"1 file", "2 file"});
}

} // namespace

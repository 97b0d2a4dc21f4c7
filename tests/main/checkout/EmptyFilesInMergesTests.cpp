// SPDX-License-Identifier: MIT
#include "main/checkout/conflictLocks.hpp"

#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"
#include "support/libgit2Release.hpp"

namespace
{

using namespace vclink::test;

/// An empty file that one side has deleted and the other has filled. Before 1.8, libgit2 takes any
/// new empty file for the same one under another name, and would write the text there; git never
/// does.
class EmptyFilesInMerges : public ObstacleFixture
{
  protected:
    EmptyFilesInMerges()
    {
        repository_.commitAll(writes("a/__init__.py", ""), "empty");
    }

    const Change fills_ = writes("a/__init__.py", "text\n");
    const Change moves_ = removes("a/__init__.py") + writes("b/__init__.py", "");

    /// @param conflict what git has in the index
    void expectNotMergedIntoTheOther(const std::vector<std::string> &conflict)
    {
        if (!libgit2_release::takesEmptyForRenamed)
        {
            expectConflictsAsGit(conflict);
            return;
        }
        expectMergeRefused(
            refusal("one side has changed the empty file 'a/__init__.py' and the other has deleted "
                    "it, and its change would go to 'b/__init__.py', which is empty too: merge "
                    "with 'git merge'"));
    }
};

TEST_F(EmptyFilesInMerges, GiveNothingToAnotherIfOursIsDeleted)
{
    diverge(moves_, fills_);
    expectNotMergedIntoTheOther({"1 a/__init__.py", "3 a/__init__.py"});
}

TEST_F(EmptyFilesInMerges, GiveNothingToAnotherIfTheirsIsDeleted)
{
    diverge(fills_, moves_);
    expectNotMergedIntoTheOther({"1 a/__init__.py", "2 a/__init__.py"});
}

TEST_F(EmptyFilesInMerges, AreMergedIfNobodyFillsThem)
{
    diverge(writes("ours", "x"), moves_);
    expectCleanAsGit();
}

TEST_F(EmptyFilesInMerges, AreInConflictIfThereIsNoOtherEmptyFile)
{
    diverge(removes("a/__init__.py"), fills_);
    expectConflictsAsGit({"1 a/__init__.py", "3 a/__init__.py"});
}

/// Two files with the same content, of which one side has renamed at least one, and the other has
/// changed one. libgit2 takes the first for the renamed one.
class EqualFilesInMerges : public ObstacleFixture
{
  protected:
    EqualFilesInMerges()
    {
        repository_.commitAll(writesEach({"a/x", "b/y"}, "1\n2\n3\n"), "two of the same content");
    }

    void expectEqualRefused(const std::string &name) const
    {
        expectMergeRefused(
            refusal("one side has changed '" + name +
                    "', the other has renamed it or a file with the same content, and the change "
                    "could go to the wrong one: merge with 'git merge'"));
    }
};

TEST_F(EqualFilesInMerges, AreRefusedIfTheChangedOneIsDeleted)
{
    diverge(writes("a/x", "1\n2\n3\n4\n"), removes("a/x") + makesFolder("c") + moves("b/y", "c/y"));
    expectEqualRefused("a/x");
}

TEST_F(EqualFilesInMerges, AreRefusedIfBothAreRenamed)
{
    diverge(makesFolder("c") + moves("b/y", "c/y") + makesFolder("d") + moves("a/x", "d/x"),
            writes("b/y", "1\n2\n3\n4\n"));
    expectEqualRefused("b/y");
}

TEST_F(EqualFilesInMerges, AreMergedIfOnlyTheChangedOneIsRenamed)
{
    diverge(writes("b/y", "1\n2\n3\n4\n"), makesFolder("c") + moves("b/y", "c/y"));
    expectCleanAsGit();
}

TEST_F(EqualFilesInMerges, AreRefusedIfTheChangedOneIsRenamedAndCopied)
{
    diverge(makesFolder("z") + moves("b/y", "z/y") + writes("a/copy", "1\n2\n3\n"),
            writes("b/y", "1\n2\n3\n4\n"));
    expectEqualRefused("b/y");
}

TEST_F(EqualFilesInMerges, AreMergedIfTheirFoldersAreMoved)
{
    diverge(makesFolder("lib") + moves("a", "lib/a") + moves("b", "lib/b"),
            writes("b/y", "1\n2\n3\n4\n"));
    expectCleanAsGit();
    EXPECT_EQ(repository_.read("lib/b/y"), "1\n2\n3\n4\n");
    EXPECT_EQ(repository_.read("lib/a/x"), "1\n2\n3\n");
}

} // namespace

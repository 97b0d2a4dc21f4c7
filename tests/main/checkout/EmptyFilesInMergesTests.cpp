// SPDX-License-Identifier: MIT
#include "main/checkout/conflictLocks.hpp"

#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"

namespace
{

using namespace vclink::test;

/// An empty file that one side has deleted and the other has filled. libgit2 takes any new empty
/// file for the same one under another name, and would write the text there; git never does.
class EmptyFilesInMerges : public ObstacleFixture
{
  protected:
    EmptyFilesInMerges()
    {
        repository_.commitAll(writes("a/__init__.py", ""), "empty");
    }

    const Change fills_ = writes("a/__init__.py", "text\n");
    const Change moves_ = removes("a/__init__.py") + writes("b/__init__.py", "");

    void expectEmptyRefused() const
    {
        expectMergeRefused(
            refusal("one side has changed the empty file 'a/__init__.py' and the other has deleted "
                    "it, and its change would go to 'b/__init__.py', which is empty too: merge "
                    "with 'git merge'"));
    }
};

TEST_F(EmptyFilesInMerges, AreRefusedIfOursIsDeleted)
{
    diverge(moves_, fills_);
    expectEmptyRefused();
}

TEST_F(EmptyFilesInMerges, AreRefusedIfTheirsIsDeleted)
{
    diverge(fills_, moves_);
    expectEmptyRefused();
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

} // namespace

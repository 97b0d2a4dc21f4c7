// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>

#include <gtest/gtest.h>

#include "BranchFixture.hpp"

namespace vclink::test
{

/// "main" with the files "a", "b" and "same", and "topic" that changes "a", drops "b" and has
/// "folder/new".
class SwitchBranchFixture : public BranchFixture
{
  protected:
    SwitchBranchFixture()
    {
        repository_.commitAll(writesEach({"a", "b", "same"}, "of main\n"), "first");
        makeBranch("topic", writes("a", "of topic, and longer\n") + removes("b") +
                                writes("folder/new", "x"));
    }

    void switchTo(const std::string &name) const
    {
        branches().switchBranch(name);
    }
    /// What `git checkout` makes of a copy of the working copy as it is now.
    RepositoryState stateAfterGit(const std::string &name) const
    {
        const GitRepository twin = repository_.copyTo(folder() / "twin");
        twin.git({"checkout", "--quiet", name});
        RepositoryState state = stateOf(twin);
        std::filesystem::remove_all(twin.path());
        return state;
    }
    /// Everything but the words of the reflog.
    static void expectSame(RepositoryState state, RepositoryState expected)
    {
        state.reflog.clear();
        expected.reflog.clear();
        EXPECT_EQ(state, expected);
    }
    void expectRefused(const std::string &name, const Failure &failure) const
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOf([&] { switchTo(name); }), failure);
    }
};

} // namespace vclink::test

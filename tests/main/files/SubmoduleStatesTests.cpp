// SPDX-License-Identifier: MIT
#include <string>

#include <gtest/gtest.h>

#include "main/AdapterFixture.hpp"

namespace
{

using namespace vclink::test;

class SubmoduleStates : public AdapterFixture
{
  protected:
    SubmoduleStates()
    {
        auto inner = makeRepository("inner");
        inner.write("file", "x");
        inner.commitAll("first");
        inner.write("file", "y");
        inner.commitAll("second");
        repository_.git({"submodule", "--quiet", "add", inner.path().string(), "module"});
        repository_.commit("first");
    }

    void expectState(const std::string &state) const
    {
        EXPECT_EQ(allStates(repository_), (States{{".gitmodules", "Clean"}, {"module", state}}));
        EXPECT_EQ(states(repository_, {"module"}), (States{{"module", state}}));
    }
    GitRepository module() const
    {
        return GitRepository(repository_ / "module");
    }

    GitRepository repository_ = makeRepository();
};

TEST_F(SubmoduleStates, OfAnUnchangedOneIsCleanAndOfOneWhoseFolderIsGoneMissing)
{
    expectState("Clean");
    repository_.git({"submodule", "--quiet", "deinit", "--force", "module"});
    expectState("Clean");
    repository_.remove("module");
    expectState("Missing");
}

TEST_F(SubmoduleStates, OfOneAtAnotherCommitOrWithChangedFilesIsModified)
{
    module().git({"checkout", "--quiet", "HEAD~1"});
    expectState("Modified");
    repository_.add({"module"});
    expectState("Modified");
    repository_.commit("another");
    expectState("Clean");
    for (const auto *name : {"file", "new"})
    {
        module().write(name, "edited");
        expectState("Modified");
        module().git({"stash", "--quiet", "--include-untracked"});
        expectState("Clean");
    }
}

TEST_F(SubmoduleStates, OfANewOneIsAdded)
{
    const GitRepository other = makeRepository("other");
    GitRepository(other).write("file", "x");
    other.git({"submodule", "--quiet", "add", (folder() / "inner").string(), "module"});
    EXPECT_EQ(allStates(other),
              (States{{".gitmodules", "Added"}, {"file", "Unversioned"}, {"module", "Added"}}));
}

TEST_F(SubmoduleStates, NeverTellOfTheFilesWithin)
{
    module().write("file", "edited");
    EXPECT_EQ(folderStates(repository_, "module"), States());
    EXPECT_EQ(states(repository_, {"module/file"}), States());
    EXPECT_EQ(allStates(module()), (States{{"file", "Modified"}}));
}

/// A repository within the tree that is no submodule is told as one path.
TEST_F(SubmoduleStates, OfAnUntrackedRepositoryWithinIsUnversioned)
{
    auto nested = GitRepository::init(repository_ / "nested");
    nested.write("file", "x");
    nested.commitAll("first");
    EXPECT_EQ(allStates(repository_),
              (States{{".gitmodules", "Clean"}, {"module", "Clean"}, {"nested/", "Unversioned"}}));
}

} // namespace

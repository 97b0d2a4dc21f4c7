// SPDX-License-Identifier: MIT
#include <string>

#include <gtest/gtest.h>

#include "main/AdapterFixture.hpp"

namespace
{

using vclink::test::GitRepository;
using vclink::test::States;

class SubmoduleStates : public vclink::test::AdapterFixture
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

TEST_F(SubmoduleStates, OfAnUnchangedOneIsClean)
{
    expectState("Clean");
}

TEST_F(SubmoduleStates, OfOneAtAnotherCommitIsModified)
{
    module().git({"checkout", "--quiet", "HEAD~1"});
    expectState("Modified");
    repository_.add({"module"});
    expectState("Modified");
}

TEST_F(SubmoduleStates, OfOneWithAnEditedFileIsModified)
{
    module().write("file", "edited");
    expectState("Modified");
}

TEST_F(SubmoduleStates, OfOneWithAnUntrackedFileIsModified)
{
    module().write("new", "x");
    expectState("Modified");
}

TEST_F(SubmoduleStates, OfOneThatIsNotCheckedOutIsClean)
{
    repository_.git({"submodule", "--quiet", "deinit", "--force", "module"});
    expectState("Clean");
}

TEST_F(SubmoduleStates, OfOneWhoseFolderIsGoneIsMissing)
{
    repository_.remove("module");
    expectState("Missing");
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

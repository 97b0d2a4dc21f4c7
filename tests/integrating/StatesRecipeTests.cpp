// SPDX-License-Identifier: MIT
#include <memory>
#include <optional>

#include <gtest/gtest.h>

#include "fl/filesystem/path.hpp"
#include "support/GitFixture.hpp"
#include "support/WithoutLeakChecks.hpp"
#include "support/adapterFor.hpp"
#include "support/text.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/LibGit2Exception.hpp"

// examples/integrating/states.cpp
bool hasFilesInHead(const vclink::git::BranchManager &branches);
std::optional<vclink::FileStateMap> readStates(vclink::CMAdapter &adapter);

namespace
{

using vclink::FileState;
using vclink::test::asPath;
using vclink::test::GitRepository;

class StatesRecipe : public vclink::test::GitFixture
{
  protected:
    bool hasFiles() const
    {
        return hasFilesInHead(*vclink::git::BranchManager::create(*adapter_));
    }

    GitRepository repository_ = makeRepository();
    std::unique_ptr<vclink::CMAdapter> adapter_ = vclink::test::adapterFor(repository_);
};

TEST_F(StatesRecipe, GivesTheStatesOfAllFiles)
{
    repository_.write("file", "1\n");
    repository_.commitAll("begin");
    repository_.write("file", "2\n");
    repository_.write("new", "");
    EXPECT_TRUE(hasFiles());
    const auto states = readStates(*adapter_);
    ASSERT_TRUE(states.has_value());
    const auto stateOf = [&](const char *name)
    { return states->at(asPath((repository_ / name).string())).getState(); };
    EXPECT_EQ(states->size(), 2U);
    EXPECT_EQ(stateOf("file"), FileState::Modified);
    EXPECT_EQ(stateOf("new"), FileState::Unversioned);
}

TEST_F(StatesRecipe, SaysThatTheyCannotBeKnown)
{
    repository_.write("file", "1\n");
    repository_.commitAll("begin");
    repository_.git({"config", "core.ignorecase", "bogus"});
    EXPECT_FALSE(readStates(*adapter_).has_value());
}

/// libgit2 reports each file as added then.
TEST_F(StatesRecipe, ThrowsWhereTheLastCommitCannotBeRead)
{
    repository_.write("file", "1\n");
    repository_.commitAll("begin");
    const std::string head = repository_.line({"rev-parse", "HEAD"});
    repository_.remove(".git/objects/" + head.substr(0, 2) + '/' + head.substr(2));
    // libgit2 leaks the reference.
    const vclink::test::WithoutLeakChecks unchecked;
    EXPECT_THROW(readStates(*adapter_), vclink::git::LibGit2Exception);
}

TEST_F(StatesRecipe, GivesStatesWhileHeadIsDetached)
{
    repository_.write("file", "1\n");
    repository_.commitAll("begin");
    repository_.git({"checkout", "--quiet", "--detach"});
    EXPECT_TRUE(hasFiles());
    EXPECT_TRUE(readStates(*adapter_).has_value());
}

TEST_F(StatesRecipe, TakesAnEmptyWorkingCopyAsOne)
{
    EXPECT_FALSE(hasFiles());
    EXPECT_TRUE(readStates(*adapter_).has_value());
    repository_.commitAll("empty");
    EXPECT_FALSE(hasFiles());
    EXPECT_TRUE(readStates(*adapter_).has_value());
}

} // namespace

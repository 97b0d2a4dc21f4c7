// SPDX-License-Identifier: MIT
#include <filesystem>
#include <functional>
#include <map>
#include <memory>
#include <string>

#include <git2/checkout.h>
#include <gtest/gtest.h>

#include "main/TestOptionsFactory.hpp"
#include "main/merge/MergeFixture.hpp"
#include "support/text.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using namespace vclink::test;

/// What is beside the files that an operation writes: "topic" adds "folder/new" and changes "file".
class Neighbours : public MergeFixture
{
  protected:
    Neighbours()
    {
        repository_.write("folder/file", "x");
        repository_.write(".git/info/exclude", "*.log\n");
        repository_.commitAll("folder");
        repository_.git({"tag", "begin"});
        makeBranch("topic", writes("folder/new", "theirs") + writes("file", "theirs\n"));
        makeBranch("ours", writes("other", "ours\n"));
        repository_.symlink("../file", "folder/link");
        repository_.symlink("nowhere", "a link");
        writesEach({"folder/own", "own", "own.log", "folder/own.log", "mine/own"},
                   "mine\n")(repository_);
    }

    /// Each operation that checks out with a strategy of its own, by name.
    std::map<std::string, std::function<void(git::GitAdapter &adapter)>> operations() const
    {
        const auto merge = [](git::GitAdapter &adapter)
        { git::BranchManager::create(adapter)->merge("topic"); };
        const auto &repository = repository_;
        return {{"fast-forward", merge},
                {"merge",
                 [&repository, merge](git::GitAdapter &adapter)
                 {
                     repository.git({"switch", "--quiet", "--detach", "ours"});
                     merge(adapter);
                 }},
                {"revert", [&repository](git::GitAdapter &adapter)
                 {
                     repository.write("folder/file", "edited");
                     adapter.revertFiles({asPath(repository / "folder/file")});
                 }}};
    }
    void goBack() const
    {
        repository_.git({"checkout", "--quiet", "--force", "-B", "main", "begin"});
    }
};

TEST_F(Neighbours, StayWhateverStrategyTheFactoryGives)
{
    for (const auto checkout : {GIT_CHECKOUT_FORCE, GIT_CHECKOUT_SAFE})
    {
        const auto strategy = static_cast<unsigned>(checkout | GIT_CHECKOUT_REMOVE_UNTRACKED |
                                                    GIT_CHECKOUT_REMOVE_IGNORED);
        for (const auto &[name, perform] : operations())
        {
            SCOPED_TRACE(name);
            const auto before = workingTreeOf(repository_);
            const auto factory = std::make_shared<TestOptionsFactory>(interactor_);
            factory->checkoutOptions.checkoutStrategy = strategy;
            git::GitAdapter adapter(asPath(repository_.path()), factory);
            perform(adapter);
            EXPECT_EQ(fs::exists(repository_ / "folder/new"), name != "revert");
            goBack();
            EXPECT_EQ(workingTreeOf(repository_), before);
        }
    }
}

TEST_F(Neighbours, KeepTheirInodesAndTimes)
{
    auto all = operations();
    all["switch"] = [](git::GitAdapter &adapter)
    { git::BranchManager::create(adapter)->switchBranch("topic"); };
    for (const auto &[name, perform] : all)
    {
        for (const auto *neighbour : {"a link", "folder/link", "folder/own", "own.log"})
        {
            SCOPED_TRACE(name + " beside " + neighbour);
            const auto before = stampOf(repository_ / neighbour);
            perform(*adapter_);
            goBack();
            EXPECT_EQ(stampOf(repository_ / neighbour), before);
        }
    }
}

} // namespace

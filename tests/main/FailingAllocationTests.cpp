// SPDX-License-Identifier: MIT
#include <climits>
#include <cstddef>
#include <exception>
#include <memory>
#include <new>
#include <string>
#include <utility>

#include <git2.h>
#include <gtest/gtest.h>

#include "AdapterFixture.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "support/FailingAllocations.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

namespace
{

using vclink::git::GitAdapterFactory;
using vclink::git::pendingCallbackException;
using vclink::test::asPath;

class FailingAllocation : public vclink::test::AdapterFixture
{
  protected:
    /// Runs the action again and again, each time with a later allocation failing, until none of
    /// its own does.
    /// @return how many of the runs threw std::bad_alloc
    template <class Action> static int failEach(Action action)
    {
        int raised = 0;
        for (int succeed = 0;; ++succeed)
        {
            vclink::test::letAllocationsSucceed(succeed);
            try
            {
                action();
            }
            catch (const std::bad_alloc &)
            {
                ++raised;
            }
            if (!vclink::test::letAllAllocationsSucceed())
                return raised;
        }
    }
};

TEST_F(FailingAllocation, IsRaisedByTheMakingOfAnAdapter)
{
    const upath root = asPath(folder().path());
    const std::shared_ptr<vclink::ApplicationInteractor> interactor = interactor_;
    const auto shares = interactor.use_count();
    const int starts = git_libgit2_init();
    const GitAdapterFactory factory;
    EXPECT_GT(failEach([&] { static_cast<void>(factory.createAdapterFor(root, interactor)); }), 3);
    EXPECT_EQ(interactor.use_count(), shares);
    EXPECT_EQ(git_libgit2_shutdown(), starts - 1);
}

TEST_F(FailingAllocation, IsRaisedByAProbe)
{
    const upath fine = asPath(makeRepository().path());
    const upath missing = asPath(folder() / "missing/with/a/name/that/is/long");
    const GitAdapterFactory factory;
    EXPECT_GT(failEach([&] { factory.isAdapterFor(fine); }), 0);
    EXPECT_GT(failEach([&] { factory.isAdapterFor(missing); }), 1);
}

/// What fails in the walk's callback ends the walk, and waits in the slot. (Boost.Filesystem 1.74
/// compares paths in a function that must not throw, and allocates there, so that no failure can be
/// put into the resolving of paths.)
TEST_F(FailingAllocation, EndsAStatusWalkInItsCallback)
{
    auto repository = makeRepository();
    constexpr std::size_t files = 20;
    for (std::size_t i = 0; i < files; ++i)
        repository.write("a/folder/of/some/depth/file" + std::to_string(i), "x");
    const auto adapter = makeAdapter(repository.path());
    vclink::test::LibGit2Recorder calls;
    int succeed = INT_MAX;
    bool hasFailed = false;
    calls.answer<git_status_foreach_ext>(
        [&](auto real, auto... arguments)
        {
            vclink::test::letAllocationsSucceed(succeed);
            const int code = real(arguments...);
            hasFailed = vclink::test::letAllAllocationsSucceed();
            return code;
        });
    // The logger and the slot come into being at their first use, which is not meant here.
    adapter->getFolderStates(adapter->getRootFolder());
    pendingCallbackException() = nullptr;
    for (succeed = 0, hasFailed = true; hasFailed; ++succeed)
    {
        const std::size_t told = adapter->getFolderStates(adapter->getRootFolder()).size();
        const auto waiting = std::exchange(pendingCallbackException(), nullptr);
        EXPECT_EQ(waiting != nullptr, hasFailed) << succeed;
        EXPECT_EQ(told < files, hasFailed) << succeed;
        if (waiting != nullptr)
        {
            EXPECT_THROW(std::rethrow_exception(waiting), std::bad_alloc);
        }
    }
    EXPECT_GT(succeed, static_cast<int>(files));
}

} // namespace

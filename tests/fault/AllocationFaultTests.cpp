// SPDX-License-Identifier: MIT
#include <algorithm>
#include <array>
#include <cstdint>
#include <exception>
#include <filesystem>
#include <iostream>
#include <string>
#include <utility>

#include <gtest/gtest.h>

#include "FaultFixture.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "support/FailingAllocations.hpp"
#include "support/NothingLeft.hpp"

namespace
{

using vclink::git::pendingCallbackException;

/// Runs an action, and says afterwards how it has ended: the words need allocations of their own.
/// @param allocation how many allocations succeed before one fails
/// @return how the action ended, and whether the allocation was asked for
std::pair<std::string, bool> runWithout(int allocation, const vclink::test::Action &action)
{
    std::exception_ptr raised;
    vclink::test::letAllocationsSucceed(allocation);
    try
    {
        action();
    }
    catch (...)
    {
        raised = std::current_exception();
    }
    const bool hasFailed = vclink::test::letAllAllocationsSucceed();
    const auto end = [&raised]
    {
        if (raised != nullptr)
            std::rethrow_exception(raised);
        return std::string();
    };
    return {vclink::test::outcomeOf(end), hasFailed};
}

bool isTyped(const std::string &outcome)
{
    const std::array<std::string, 3> types{"std::bad_alloc",
                                           "vclink::git::", "foundation::core::except::Exception<"};
    return std::any_of(types.begin(), types.end(),
                       [&outcome](const std::string &type)
                       { return outcome.compare(0, type.size(), type) == 0; });
}

class FailingAllocation : public vclink::test::FaultFixture
{
  protected:
    /// @return whether the operation came as far as the allocation
    bool fail(int allocation)
    {
        SCOPED_TRACE("allocation " + std::to_string(allocation));
        const auto action = trial_.begin();
        std::pair<std::string, bool> end;
        {
            const vclink::test::NothingLeft nothingLeft(environment().temporary());
            end = runWithout(allocation, action);
            // A status walk that ends in its callback is no failure, and the exception waits.
            pendingCallbackException() = nullptr;
            filesLeft_ += removeTemporaryFiles();
        }
        const auto &[outcome, hasFailed] = end;
        const bool isDone = outcome == "done: ";
        EXPECT_TRUE(isDone || isTyped(outcome)) << outcome;
        raised_ += static_cast<int>(hasFailed && !isDone);
        trial_.expectSound();
        trial_.expectWorksAgain(action);
        return hasFailed;
    }

    /// What the removal of a temporary file asks for may fail as well, and the file stays.
    std::uintmax_t removeTemporaryFiles() const
    {
        std::uintmax_t removed = 0;
        for (const auto &file : std::filesystem::directory_iterator(environment().temporary()))
            removed += std::filesystem::remove_all(file);
        return removed;
    }

    /// How many allocations made the operation end with an exception.
    int raised_ = 0;
    std::uintmax_t filesLeft_ = 0;
};

TEST_P(FailingAllocation, ComesOutAndLeavesNothing)
{
    // A thread's slot is made at its first use, which is not a part of the operation.
    pendingCallbackException() = nullptr;
    int allocation = 0;
    while (fail(allocation))
        ++allocation;
    EXPECT_TRUE(raised_ > 0 || allocation == 0);
    // A merge with a command has three files, and the host asks for two allocations to remove one.
    EXPECT_LE(filesLeft_, GetParam().name == "mergeByTool" ? 6U : 0U);
    std::cout << "allocations failed: " << allocation << ", " << raised_ << " came out\n";
}

INSTANTIATE_TEST_SUITE_P(Of, FailingAllocation, testing::ValuesIn(vclink::test::allOperations()),
                         vclink::test::nameOfTest);

} // namespace

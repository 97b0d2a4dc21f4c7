// SPDX-License-Identifier: MIT
#include <algorithm>
#include <array>
#include <iostream>
#include <iterator>
#include <map>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "FaultFixture.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "expectedOutcomes.hpp"
#include "openHandles.hpp"
#include "support/NothingLeft.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/libgit2Release.hpp"

namespace
{

using vclink::test::FaultSite;
using vclink::test::LibGit2Recorder;
using vclink::test::outcomeOf;
using vclink::test::When;

/// A code without a meaning of its own, and those that mean something to the library.
constexpr std::array<int, 6> codes{GIT_ERROR,    GIT_ENOTFOUND,      GIT_EUSER,
                                   GIT_ITEROVER, GIT_EMERGECONFLICT, GIT_PASSTHROUGH};

std::string nameOf(const FaultSite &site)
{
    return site.fault.function + " (" + std::to_string(site.fault.call) + ") " +
           (site.fault.when == When::Before ? "before" : "after") + " with " +
           std::to_string(site.fault.code);
}

bool isRelease(const std::string &call)
{
    const std::string end = "_free";
    return call.size() > end.size() && call.compare(call.size() - end.size(), end.size(), end) == 0;
}

class FailingLibGit2Call : public vclink::test::FaultFixture
{
  protected:
    /// The sites of the calls that give a code, each once, without a fault.
    std::vector<FaultSite> findSites()
    {
        const auto action = trial_.begin();
        const LibGit2Recorder recorder(LibGit2Recorder::InCallbacks::Followed);
        outcomeOf(action);
        std::map<std::string, std::size_t> counts;
        std::vector<FaultSite> sites;
        for (const auto &call : recorder.calls())
        {
            if (call.givesCode)
                sites.push_back({GetParam().name, {call.name, 0, ++counts[call.name]}});
        }
        return sites;
    }

    static auto callOf(const FaultSite &site, std::vector<std::string> &calls)
    {
        auto call = std::find(calls.begin(), calls.end(), site.fault.function);
        for (std::size_t earlier = 1; earlier < site.fault.call; ++earlier)
            call = std::find(std::next(call), calls.end(), site.fault.function);
        return call;
    }

    /// Returns false for a failure that libgit2 has only after the call has done its work, or if
    /// the operation does not look at it.
    static bool canFailBefore(const FaultSite &site)
    {
        const bool letsGoFirst = vclink::test::libgit2_release::closesLockedFile &&
                                 site.fault.function == "git_transaction_commit";
        return !letsGoFirst && !vclink::test::isUnexamined(site.operation, site.fault.function);
    }

    /// Expects that what was released was so before its repository, and that no driver is left.
    static void expectEnded(const std::vector<std::string> &steps)
    {
        const auto repository = std::find(steps.rbegin(), steps.rend(), "git_repository_free");
        if (repository != steps.rend())
        {
            EXPECT_EQ(std::find_if(steps.rbegin(), repository, isRelease), repository);
        }
        EXPECT_EQ(std::count(steps.begin(), steps.end(), "git_merge_driver_register"),
                  std::count(steps.begin(), steps.end(), "git_merge_driver_unregister"));
    }

    void fail(const FaultSite &site)
    {
        SCOPED_TRACE(nameOf(site));
        const auto action = trial_.begin();
        std::string outcome;
        std::vector<std::string> calls;
        std::vector<std::string> steps;
        {
            const vclink::test::NothingLeft nothingLeft(environment().temporary());
            LibGit2Recorder recorder(LibGit2Recorder::InCallbacks::Followed);
            recorder.fail({site.fault});
            outcome = outcomeOf(action);
            EXPECT_EQ(vclink::test::openHandles(recorder), std::vector<std::string>());
            EXPECT_EQ(recorder.starts(), 0);
            calls = recorder.names();
            steps = recorder.steps();
        }
        EXPECT_EQ(outcome, vclink::test::expectedOutcome(site, trial_.normalOutcome()));
        // The codes differ in what comes out, hardly in what is left.
        if (site.fault.code == codes.front() || vclink::test::wantsAllFaults())
        {
            trial_.expectSound();
            expectEnded(steps);
            // A call that fails before libgit2 has done nothing.
            if (site.fault.when == When::Before)
                calls.erase(callOf(site, calls));
            trial_.expectWrittenByThese(calls);
        }
        if (vclink::test::isUnexamined(site.operation, site.fault.function))
        {
            EXPECT_EQ(trial_.gist(), trial_.normalGist());
        }
        trial_.expectWorksAgain(action);
    }
};

TEST_P(FailingLibGit2Call, ComesOutAndLeavesNothing)
{
    const auto sites = findSites();
    std::size_t runs = 0;
    for (FaultSite site : sites)
    {
        for (const auto when : {When::Before, When::After})
        {
            if (when == When::Before && !canFailBefore(site))
                continue;
            for (const int code : codes)
            {
                site.fault.when = when;
                site.fault.code = code;
                fail(site);
                ++runs;
            }
        }
    }
    std::cout << "call sites failed: " << sites.size() << ", in " << runs << " runs\n";
}

class LibGit2Functions : public vclink::test::GitFixture
{
  protected:
    vclink::test::LibGit2Session session_{environment()};
};

TEST_F(LibGit2Functions, AreAllCalledByTheOperations)
{
    std::set<std::string> called;
    for (const auto &operation : vclink::test::allOperations())
    {
        vclink::test::Trial trial(operation, folder() / operation.name, environment());
        const auto action = trial.begin();
        const LibGit2Recorder recorder(LibGit2Recorder::InCallbacks::Followed);
        outcomeOf(action);
        const auto names = recorder.names();
        called.insert(names.begin(), names.end());
    }
    std::vector<std::string> notCalled;
    const auto imported = vclink::test::wrappedFunctions();
    std::set_difference(imported.begin(), imported.end(), called.begin(), called.end(),
                        std::back_inserter(notCalled));
    // No operation asks for the features; a remote that is a path asks for no credentials; how long
    // to wait is read only once a reference is locked.
    EXPECT_THAT(notCalled,
                testing::ElementsAre("git_config_get_int64", "git_credential_ssh_key_from_agent",
                                     "git_libgit2_features"));
    std::cout << "functions of libgit2: " << imported.size() << '\n';
}

INSTANTIATE_TEST_SUITE_P(Of, FailingLibGit2Call, testing::ValuesIn(vclink::test::allOperations()),
                         vclink::test::nameOfTest);

} // namespace

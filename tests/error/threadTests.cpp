// SPDX-License-Identifier: MIT
// What each thread has of its own.
#include <algorithm>
#include <exception>
#include <future>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include <git2.h>
#include <gtest/gtest.h>

#include "error/HermeticLibGit2.hpp"
#include "error/errorUtil/GitErrorPolicy.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "error/logging/ScopeTrace.hpp"
#include "support/LogCapture.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::git
{
namespace
{

using test::HermeticLibGit2;
using test::LogCapture;

struct Tracked
{
    std::shared_ptr<int> content;
};

struct OfThread
{
    int number;
};

/// Runs two copies of an action at once, and gives what they came to.
template <class Action> auto runTwice(Action action)
{
    std::promise<void> start;
    const std::shared_future<void> started = start.get_future().share();
    const auto run = [&action, started](int number)
    {
        started.wait();
        return action(number);
    };
    auto one = std::async(std::launch::async, run, 1);
    auto two = std::async(std::launch::async, run, 2);
    start.set_value();
    return std::make_pair(one.get(), two.get());
}

TEST(Threads, ReleaseWhatIsLeftInTheSlotAtTheirEnd)
{
    std::weak_ptr<int> left;
    std::thread(
        [&left]
        {
            const auto content = std::make_shared<int>(1);
            left = content;
            storeCallbackException(std::make_exception_ptr(Tracked{content}));
        })
        .join();
    EXPECT_TRUE(left.expired());
}

TEST(Threads, BeginWithAnEmptySlotOfTheirOwn)
{
    pendingCallbackException() = std::make_exception_ptr(OfThread{0});
    const std::exception_ptr *const ours = &pendingCallbackException();
    std::thread(
        [ours]
        {
            EXPECT_NE(&pendingCallbackException(), ours);
            EXPECT_EQ(pendingCallbackException(), nullptr);
        })
        .join();
    EXPECT_NE(pendingCallbackException(), nullptr);
    pendingCallbackException() = nullptr;
}

/// Parks an exception, lets libgit2's code for it through the policy, and gives what comes out.
int failOnce(int number)
{
    try
    {
        throw OfThread{number};
    }
    catch (const OfThread &)
    {
        static_cast<void>(parkCallbackException());
    }
    try
    {
        GitErrorPolicy::throwIfError(GitError(GIT_EUSER));
    }
    catch (const OfThread &own)
    {
        return own.number;
    }
    return 0;
}

TEST(Threads, ThatFailAtOnceEachRethrowTheirOwnException)
{
    const HermeticLibGit2 libgit2;
    const auto numbers = runTwice(
        [](int number)
        {
            int matches = 0;
            for (int round = 0; round < 500; ++round)
            {
                matches += failOnce(number) == number ? 1 : 0;
            }
            return matches;
        });
    EXPECT_EQ(numbers, std::make_pair(500, 500));
}

TEST(Threads, ThatFailAtOnceEachTellTheirOwnFailure)
{
    const HermeticLibGit2 libgit2;
    const auto texts = runTwice(
        [](int number)
        {
            const std::string text = "failure of thread " + std::to_string(number);
            int matches = 0;
            for (int round = 0; round < 500; ++round)
            {
                git_error_set_str(GIT_ERROR_OS, text.c_str());
                const GitError error(-number);
                matches += error.getMessage() == ustring(text.begin(), text.end()) ? 1 : 0;
            }
            return matches;
        });
    EXPECT_EQ(texts, std::make_pair(500, 500));
}

TEST(Threads, CountTheirOpenScopesByThemselves)
{
    const LogCapture log(SeverityScopeEntry | SeverityScopeExit);
    const ScopeTrace ours(logger(), "ours", "file", 1);
    const auto depths = runTwice(
        [](int number)
        {
            const int before = logger().scope_depth();
            std::vector<std::unique_ptr<ScopeTrace>> traces;
            for (int scope = 0; scope < number; ++scope)
            {
                traces.push_back(std::make_unique<ScopeTrace>(logger(), "theirs", "file", 1));
            }
            const int within = logger().scope_depth();
            traces.clear();
            return std::vector<int>{before, within, logger().scope_depth()};
        });
    EXPECT_EQ(depths.first, (std::vector<int>{0, 1, 0}));
    EXPECT_EQ(depths.second, (std::vector<int>{0, 2, 0}));
    EXPECT_EQ(logger().scope_depth(), 1);
    EXPECT_EQ(log.messages(SeverityScopeEntry).size(), 4u);
}

TEST(Threads, WriteToOneLoggerAtOnce)
{
    const LogCapture log(SeverityDiagnostic);
    runTwice(
        [](int number)
        {
            for (int round = 0; round < 200; ++round)
            {
                writeRecord(SeverityDiagnostic, "thread ", number, " round ", round);
            }
            return 0;
        });
    const auto messages = log.messages();
    EXPECT_EQ(messages.size(), 400u);
    EXPECT_EQ(std::count(messages.begin(), messages.end(), "thread 1 round 199"), 1);
    EXPECT_EQ(std::count(messages.begin(), messages.end(), "thread 2 round 199"), 1);
}

} // namespace
} // namespace vclink::git

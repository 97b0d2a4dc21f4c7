// SPDX-License-Identifier: MIT
// Commands that run in hosts of different kinds.
#include <array>
#include <atomic>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <filesystem>
#include <future>
#include <string>
#include <thread>
#include <vector>

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include "RunCommandFixture.hpp"
#include "processError.hpp"
#include "support/Command.hpp"
#include "support/LogCapture.hpp"
#include "support/SignalAction.hpp"
#include "support/ThousandDescriptors.hpp"
#include "support/WorkingFolder.hpp"
#include "util/command/runCommand.hpp"

namespace
{

namespace fs = std::filesystem;
using vclink::git::runCommand;
using namespace vclink::test;

using RunCommandHost = RunCommandFixture;

TEST_F(RunCommandHost, ThatIgnoresItsChildrenStartsNothing)
{
    const std::string mark = folder() / "mark";
    const std::string program = scripts_.shell("echo started >" + mark);
    {
        const SignalAction ignored(SIGCHLD, SIG_IGN);
        EXPECT_EQ(run(program).error, std::error_code(ECHILD, std::system_category()));
    }
    {
        const SignalAction notKept(SIGCHLD, SIG_DFL, SA_NOCLDWAIT);
        EXPECT_EQ(run(program).error, std::error_code(ECHILD, std::system_category()));
    }
    EXPECT_FALSE(fs::exists(mark));
    EXPECT_EQ(resultOf(program), 0);
    EXPECT_TRUE(fs::exists(mark));
}

TEST_F(RunCommandHost, ThatBeginsToIgnoreItsChildrenMeanwhileGetsAnError)
{
    for (const int status : {0, 1})
    {
        const std::string gate = scripts_.pipe();
        const std::string program =
            scripts_.shell("read word <" + gate + "; exit " + std::to_string(status));
        const SignalAction usual(SIGCHLD, SIG_DFL);
        std::thread other(
            [&gate]
            {
                // Blocks until the command waits.
                const int end = ::open(gate.c_str(), O_WRONLY | O_CLOEXEC);
                ::signal(SIGCHLD, SIG_IGN);
                ::close(end);
            });
        EXPECT_THROW(static_cast<void>(runCommand(program, {})), boost::process::process_error)
            << status;
        other.join();
    }
}

TEST_F(RunCommandHost, ThatWaitsForEveryChildNeverTurnsAFailureIntoSuccess)
{
    const std::string program = scripts_.shell("exit 1");
    std::atomic<bool> stop{false};
    std::thread waiter(
        [&stop]
        {
            while (!stop)
                ::waitpid(-1, nullptr, WNOHANG);
        });
    int known = 0;
    int unknown = 0;
    for (int i = 0; i < 100; ++i)
    {
        try
        {
            EXPECT_EQ(runCommand(program, {}), 1);
            ++known;
        }
        catch (const boost::process::process_error &error)
        {
            EXPECT_EQ(error.code().value(), ECHILD);
            ++unknown;
        }
    }
    stop = true;
    waiter.join();
    EXPECT_EQ(known + unknown, 100);
}

TEST_F(RunCommandHost, ThatHandlesTheEndOfItsChildrenIsNotDisturbed)
{
    static std::atomic<int> ends{0};
    const SignalAction handled(SIGCHLD, [](int) { ++ends; });
    EXPECT_EQ(resultOf(scripts_.shell("sleep 0.05; exit 3")), 3);
    EXPECT_GE(ends, 1);
}

TEST_F(RunCommandHost, ThatIsInterruptedBySignalsIsNotDisturbed)
{
    static std::atomic<int> signals{0};
    const SignalAction handled(SIGUSR1, [](int) { ++signals; });
    const pthread_t self = ::pthread_self();
    std::atomic<bool> stop{false};
    std::thread sender(
        [&]
        {
            while (!stop)
            {
                ::pthread_kill(self, SIGUSR1);
                std::this_thread::sleep_for(std::chrono::milliseconds(1));
            }
        });
    const int result = resultOf(scripts_.shell("echo x; sleep 0.1; echo; sleep 0.1; exit 3"));
    stop = true;
    sender.join();
    EXPECT_EQ(result, 3);
    EXPECT_GE(signals, 1);
}

/// A shell would wait for its children for ever.
TEST_F(RunCommandHost, ThatBlocksSignalsDoesNotBlockThoseOfTheCommand)
{
    const std::string program =
        scripts_.shell("exec grep -q '^SigBlk:[[:blank:]]*0*$' /proc/self/status");
    EXPECT_EQ(resultOf(program), 0);
    sigset_t all;
    sigset_t before;
    ::sigfillset(&all);
    ASSERT_EQ(::pthread_sigmask(SIG_SETMASK, &all, &before), 0);
    sigset_t during;
    ::pthread_sigmask(SIG_SETMASK, nullptr, &during);
    EXPECT_EQ(resultOf(program), 0);
    sigset_t after;
    ::pthread_sigmask(SIG_SETMASK, &before, &after);
    for (const int signal : {SIGCHLD, SIGINT, SIGTERM, SIGUSR1})
        EXPECT_EQ(::sigismember(&after, signal), ::sigismember(&during, signal)) << signal;
}

TEST_F(RunCommandHost, MayHandleBrokenPipesAndHaveManyDescriptorsOrNoWorkingFolder)
{
    const std::string program = scripts_.shell("echo x; exit 4");
    const auto expectRuns = [&]
    {
        EXPECT_EQ(resultOf(program), 4);
        EXPECT_EQ(run("/nowhere/tool").error.value(), ENOENT);
        EXPECT_EQ(run("no-such-tool-anywhere").error.value(), ENOENT);
    };
    for (auto *const handler : {SIG_DFL, SIG_IGN})
    {
        const SignalAction action(SIGPIPE, handler);
        expectRuns();
    }
    {
        const ThousandDescriptors open;
        expectRuns();
        EXPECT_EQ(outputOf("echo x"), "x");
    }
    const NoWorkingFolder nowhere(folder().path());
    expectRuns();
}

TEST_F(RunCommandHost, MayHaveClosedItsStandardStreams)
{
    const std::string program = scripts_.shell("test -p /proc/$$/fd/1");
    for (const int streams : {1, 2, 3, 7})
    {
        std::array<int, 3> saved{};
        for (int stream = 0; stream < 3; ++stream)
        {
            saved.at(static_cast<std::size_t>(stream)) = ::fcntl(stream, F_DUPFD_CLOEXEC, 3);
            if ((streams & (1 << stream)) != 0)
                ::close(stream);
        }
        int result = -1;
        try
        {
            result = runCommand(program, {});
        }
        catch (const std::exception &)
        {
            result = -2;
        }
        for (int stream = 0; stream < 3; ++stream)
        {
            const int number = saved.at(static_cast<std::size_t>(stream));
            ::dup2(number, stream);
            ::close(number);
        }
        EXPECT_EQ(result, 0) << streams;
    }
}

TEST_F(RunCommandHost, MayStartAnotherCommandMeanwhileThatDoesNotHoldTheOutput)
{
    const NothingLeft check(environment().temporary());
    const std::string gate = scripts_.pipe();
    const std::string slow = scripts_.shell("read word <" + gate + "; exit 2");
    const std::string quick = scripts_.shell("echo x\n" + waitUntilRead() + "\nexit 1");
    std::future<int> slowResult;
    std::atomic<int> end{-1};
    LogCapture log(0x08);
    log.onRecord(
        [&](const LogRecord &record)
        {
            // The quick one has its pipe and is about to start.
            if (record.message != "Command: " + quick)
                return;
            // Not by the library, which would wait for the log that this holds.
            slowResult = std::async(std::launch::async,
                                    [&slow] { return Command({slow}).run().exitStatus; });
            // Blocks until the slow one waits.
            end = ::open(gate.c_str(), O_WRONLY | O_CLOEXEC);
        });
    std::promise<void> done;
    std::thread watchdog(
        [&]
        {
            // The slow one ends only after the quick one, unless that waits for it.
            const auto state = done.get_future().wait_for(std::chrono::seconds(30));
            EXPECT_EQ(state, std::future_status::ready) << "the output was held open";
            ::close(end);
        });
    EXPECT_EQ(runCommand(quick, {}), 1);
    done.set_value();
    watchdog.join();
    EXPECT_EQ(slowResult.get(), 2);
}

TEST_F(RunCommandHost, MayStartCommandsOrFailToOnManyThreads)
{
    const NothingLeft check(environment().temporary());
    const std::string program = scripts_.shell("echo x; exit $1");
    const auto runMany = [&program](int thread)
    {
        int right = 0;
        for (int i = 0; i < 20; ++i)
        {
            right += runCommand(program + ' ' + std::to_string(thread), {}) == thread ? 1 : 0;
            EXPECT_THROW(static_cast<void>(runCommand("/nowhere/tool", {})),
                         boost::process::process_error);
        }
        return right;
    };
    std::vector<std::future<int>> threads;
    for (int thread = 0; thread < 4; ++thread)
        threads.push_back(std::async(std::launch::async, runMany, thread));
    for (auto &thread : threads)
        EXPECT_EQ(thread.get(), 20);
}

} // namespace

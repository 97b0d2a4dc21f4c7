// SPDX-License-Identifier: MIT
// Commands that can't be started, and runs that an exception leaves.
#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <exception>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include "RunCommandFixture.hpp"
#include "processError.hpp"
#include "support/DescriptorLimit.hpp"
#include "support/LogCapture.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/readFile.hpp"
#include "util/command/runCommand.hpp"

namespace
{

using boost::process::process_error;
using vclink::git::runCommand;
using namespace vclink::test;

class RunCommandFailure : public RunCommandFixture
{
  protected:
    int errorOf(const std::string &command) const
    {
        const RunOutcome outcome = run(command);
        EXPECT_TRUE(outcome.error) << command << " gave " << outcome.result;
        return outcome.error.value();
    }
    /// For UndefinedBehaviorSanitizer, which needs descriptors to look at the first object of a
    /// kind, and takes it for a wrong one where none is left.
    void useEveryKindOfObject() const
    {
        EXPECT_EQ(errorOf("/nowhere/tool"), ENOENT);
        EXPECT_EQ(errorOf(""), EINVAL);
        EXPECT_EQ(resultOf("/bin/true"), 0);
    }
    /// Runs a command with no descriptor left, with one, and so on until it succeeds.
    /// @return how often it has not
    static int failuresForWantOfDescriptors();
};

int RunCommandFailure::failuresForWantOfDescriptors()
{
    const int lowestFree = ::open("/dev/null", O_RDONLY | O_CLOEXEC);
    ::close(lowestFree);
    int failures = 0;
    bool hasRun = false;
    while (!hasRun && failures < 100)
    {
        const DescriptorLimit few(lowestFree + failures);
        try
        {
            hasRun = runCommand("/bin/true", {}) == 0;
        }
        catch (const process_error &error)
        {
            EXPECT_EQ(error.code().value(), EMFILE) << failures;
        }
        failures += hasRun ? 0 : 1;
    }
    EXPECT_TRUE(hasRun);
    return failures;
}

TEST_F(RunCommandFailure, OfWhatCannotBeStartedIsItsError)
{
    const std::vector<std::pair<std::string, int>> commands{
        {"/nowhere/tool", ENOENT},
        {"no-such-tool-anywhere x", ENOENT},
        {scripts_.file("#!/bin/sh\n", 0644), EACCES},
        {folder().path(), EACCES},
        {scripts_.file("exit 0\n", 0755), ENOEXEC},
        {scripts_.file("", 0755), ENOEXEC},
        {scripts_.file("#!/nowhere/sh\n", 0755), ENOENT},
        {"/bin/true " + std::string(200'000, 'x'), E2BIG},
        {"", EINVAL},
        {" ", EINVAL},
        {"    ", EINVAL},
        {"\"\"", ENOENT},
        {"\"", EINVAL},
        {"/bin/true \"", EINVAL},
        {" \"", EINVAL},
    };
    for (const auto &[command, error] : commands)
        EXPECT_EQ(errorOf(command), error) << '\'' << command.substr(0, 100) << '\'';
}

TEST_F(RunCommandFailure, OfAnEmptyEnvironmentIsAnError)
{
    const auto runWithoutEnvironment = [](const std::string &command)
    {
        ::clearenv();
        std::array<char *, 1> none{nullptr};
        environ = none.data();
        try
        {
            static_cast<void>(runCommand(command, {}));
        }
        catch (const process_error &error)
        {
            ::_exit(error.code().value());
        }
        ::_exit(0);
    };
    EXPECT_EXIT(runWithoutEnvironment("/bin/true"), testing::ExitedWithCode(EINVAL), "");
    EXPECT_EXIT(runWithoutEnvironment("true"), testing::ExitedWithCode(EINVAL), "");
}

/// A child that has ended and is not waited for.
pid_t makeEndedChild()
{
    const pid_t child = ::fork();
    if (child == 0)
        ::_exit(9);
    siginfo_t info = {};
    EXPECT_EQ(::waitid(P_PID, static_cast<id_t>(child), &info, WEXITED | WNOWAIT), 0);
    return child;
}

TEST_F(RunCommandFailure, LeavesNothingHoweverOftenItHappens)
{
    const NothingLeft check(environment().temporary());
    for (int i = 0; i < 50; ++i)
        EXPECT_THROW(static_cast<void>(runCommand("/nowhere/tool", {})), process_error);
    EXPECT_THROW(static_cast<void>(runCommand("%A%B", {{"%A", ""}, {"%B", " "}})), process_error);
}

TEST_F(RunCommandFailure, LeavesTheOtherChildrenOfTheProcess)
{
    useEveryKindOfObject();
    const pid_t child = makeEndedChild();
    EXPECT_THROW(static_cast<void>(runCommand("/nowhere/tool", {})), process_error);
    EXPECT_EQ(runCommand("/bin/true", {}), 0);
    EXPECT_GE(failuresForWantOfDescriptors(), 3);
    int status = 0;
    EXPECT_EQ(::waitpid(child, &status, WNOHANG), child);
    EXPECT_EQ(WEXITSTATUS(status), 9);
}

/// In a process that has a child and can't make another one.
std::string runWithoutAnotherProcess()
{
    const pid_t child = makeEndedChild();
    const rlimit none{0, 0};
    ::setrlimit(RLIMIT_NPROC, &none);
    try
    {
        static_cast<void>(runCommand("/bin/true", {}));
        return "nothing was raised";
    }
    catch (const process_error &error)
    {
        if (error.code().value() != EAGAIN)
            return error.what();
    }
    return ::waitpid(child, nullptr, WNOHANG) == child ? "" : "the other child is gone";
}

TEST_F(RunCommandFailure, OfTheForkIsAnErrorAndLeavesTheOtherChildren)
{
    EXPECT_EQ(runAsUnprivilegedUser(runWithoutAnotherProcess), "");
}

TEST_F(RunCommandFailure, OfThePipeIsAnErrorWithoutARecord)
{
    useEveryKindOfObject();
    const LogCapture log(0x08);
    std::error_code code;
    try
    {
        const DescriptorLimit none(0);
        static_cast<void>(runCommand("/bin/true", {}));
    }
    catch (const process_error &error)
    {
        code = error.code();
    }
    EXPECT_TRUE(log.messages().empty());
    EXPECT_EQ(code, std::error_code(EMFILE, std::system_category()));
}

/// With standard streams closed, the pipe gets their numbers, and has to move off them.
TEST_F(RunCommandFailure, OfThePipesMoveNamesTheCall)
{
    useEveryKindOfObject();
    const std::array<int, 2> saved{::fcntl(STDIN_FILENO, F_DUPFD_CLOEXEC, 3),
                                   ::fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, 3)};
    std::string text;
    {
        const DescriptorLimit standardStreamsOnly(STDERR_FILENO + 1);
        ::close(STDIN_FILENO);
        ::close(STDOUT_FILENO);
        try
        {
            static_cast<void>(runCommand("/bin/true", {}));
        }
        catch (const process_error &error)
        {
            text = error.what();
        }
        ::dup2(saved[0], STDIN_FILENO);
        ::dup2(saved[1], STDOUT_FILENO);
    }
    for (const int descriptor : saved)
        ::close(descriptor);
    EXPECT_EQ(text, "fcntl(2) failed: Invalid argument");
}

TEST_F(RunCommandFailure, LeavesNothingAtAnyNumberOfDescriptorsLeft)
{
    useEveryKindOfObject();
    const NothingLeft check(environment().temporary());
    EXPECT_GE(failuresForWantOfDescriptors(), 3);
}

TEST_F(RunCommandFailure, EndsACommandThatAnExceptionLeaves)
{
    const std::string identity = scripts_.folder() / "identity";
    // The empty line ends the reading while the command runs.
    const std::string program =
        scripts_.shell("echo $$ >" + identity + "; echo; while :; do sleep 60; done");
    {
        const NothingLeft check(environment().temporary());
        LogCapture log(0x08);
        log.onRecord(
            [](const LogRecord &record)
            {
                if (record.message.compare(0, 8, "Output:\n") == 0)
                    throw std::domain_error("sink");
            });
        EXPECT_THROW(static_cast<void>(runCommand(program, {})), std::domain_error);
    }
    const std::string process = readFile(identity);
    ASSERT_FALSE(process.empty());
    EXPECT_EQ(::kill(std::stoi(process), 0), -1);
    EXPECT_EQ(errno, ESRCH);
}

TEST_F(RunCommandFailure, StartsNothingWhenTheRecordOfTheCommandFails)
{
    const NothingLeft check(environment().temporary());
    const std::string mark = scripts_.folder() / "mark";
    const std::string program = scripts_.shell("echo started >" + mark);
    LogCapture log(0x08);
    log.onRecord([](const LogRecord &) { throw std::domain_error("sink"); });
    EXPECT_THROW(static_cast<void>(runCommand(program, {})), std::domain_error);
    EXPECT_EQ(readFile(mark), "");
}

} // namespace

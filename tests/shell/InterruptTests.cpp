// SPDX-License-Identifier: MIT
#include <csignal>

#include <gmock/gmock.h>
#include <sys/wait.h>

#include "ShellFixture.hpp"
#include "TerminalProcess.hpp"

namespace vclink::test
{
namespace
{

using testing::AllOf;
using testing::EndsWith;
using testing::HasSubstr;
using testing::Not;

constexpr int fileCount = 1000;

/// Real signals, sent when the program has written how far it is. It can't get much further then,
/// as the terminal takes no more before it is read.
class ShellInterrupt : public ShellFixture
{
  protected:
    ShellInterrupt()
    {
        for (int number = 0; number < fileCount; ++number)
            repository_.write(nameOf(number), "");
        repository_.commitAll("many");
        for (int number = 0; number < fileCount; ++number)
            repository_.write(nameOf(number), "edited\n");
    }

    /// Long, so that what is written of each file soon fills the terminal.
    static std::string nameOf(int number)
    {
        return "folder" + std::to_string(number % 10) + "/" + std::string(150, 'x') +
               std::to_string(number);
    }

    /// A shell script that runs the program, as "$0", in the repository.
    TerminalProcess start(const std::string &script) const
    {
        const std::string suppressions =
            "LSAN_OPTIONS=print_suppressions=0:suppressions=" VCLINK_LEAK_SUPPRESSIONS;
        return TerminalProcess(
            {"env", "TERM=xterm", suppressions, "sh", "-c", script, VCLINK_SHELL},
            repository_.path());
    }

    std::size_t countChanges() const
    {
        return split(repository_.git({"status", "--porcelain", "-z"}), '\0').size();
    }

    GitRepository repository_ = makeRepository();
};

TEST_F(ShellInterrupt, CancelsARevertAndLeavesAWorkingCopyToGoOnWith)
{
    TerminalProcess process = start("exec \"$0\" --log progress revert .");
    process.readUntil("Checkout Notify");
    process.interrupt();
    const std::string text = process.readAll();
    const int status = process.wait();
    ASSERT_TRUE(WIFEXITED(status)) << text;
    EXPECT_EQ(WEXITSTATUS(status), 130);
    EXPECT_THAT(text, AllOf(HasSubstr("Cancelling.\n"),
                            EndsWith("vclink-shell: The operation was cancelled.\n")));

    EXPECT_EQ(countChanges(), static_cast<std::size_t>(fileCount));
    EXPECT_EQ(statesIn(repository_.path()).size(), static_cast<std::size_t>(fileCount));
    EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/index.lock"));
    const CommandResult again = runIn(repository_.path(), {"revert", "."});
    EXPECT_EQ(again.exitStatus, 0) << again.errors;
    EXPECT_EQ(countChanges(), 0U);
}

TEST_F(ShellInterrupt, IsToldInTheLanguageThatWasAskedFor)
{
    TerminalProcess process = start("exec \"$0\" --lang de --log progress revert .");
    process.readUntil("Checkout Notify");
    process.interrupt();
    EXPECT_THAT(process.readAll(),
                AllOf(HasSubstr("Wird abgebrochen.\n"),
                      EndsWith("vclink-shell: Der Vorgang wurde abgebrochen.\n")));
    const int status = process.wait();
    ASSERT_TRUE(WIFEXITED(status));
    EXPECT_EQ(WEXITSTATUS(status), 130);
}

TEST_F(ShellInterrupt, ChangesNothingMoreWhenItIsRepeated)
{
    TerminalProcess process = start("exec \"$0\" --log progress revert .");
    process.readUntil("Checkout Notify");
    for (int time = 0; time < 5; ++time)
        process.interrupt();
    const std::string text = process.readAll();
    const int status = process.wait();
    ASSERT_TRUE(WIFEXITED(status)) << text;
    EXPECT_EQ(WEXITSTATUS(status), 130);
    EXPECT_THAT(text, Not(HasSubstr("at once")));
    EXPECT_THAT(text, AllOf(HasSubstr("Cancelling.\n"),
                            EndsWith("vclink-shell: The operation was cancelled.\n")));
}

TEST_F(ShellInterrupt, ComesTooLateOnceFilesAreWritten)
{
    TerminalProcess process = start("exec \"$0\" --log parameter revert .");
    process.readUntil("completed_steps=3 ");
    process.interrupt();
    const std::string text = process.readAll();
    const int status = process.wait();
    ASSERT_TRUE(WIFEXITED(status)) << text;
    EXPECT_EQ(WEXITSTATUS(status), 0);
    EXPECT_THAT(text, AllOf(HasSubstr("Too late to cancel: files are being written.\n"),
                            EndsWith("-xp\nReverted 1000 files.\n")));
    EXPECT_EQ(countChanges(), 0U);
}

TEST_F(ShellInterrupt, OfAnotherKindCancelsToo)
{
    for (const int signal : {SIGTERM, SIGHUP})
    {
        TerminalProcess process = start("exec \"$0\" --log progress revert .");
        process.readUntil("Checkout Notify");
        process.send(signal);
        const std::string text = process.readAll();
        const int status = process.wait();
        ASSERT_TRUE(WIFEXITED(status)) << text;
        EXPECT_EQ(WEXITSTATUS(status), 128 + signal);
        EXPECT_THAT(text, AllOf(HasSubstr("Cancelling.\n"),
                                EndsWith("vclink-shell: The operation was cancelled.\n")));
        EXPECT_EQ(countChanges(), static_cast<std::size_t>(fileCount));
        EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/index.lock"));
    }
}

TEST_F(ShellInterrupt, OfAnotherKindLetsTheProgramEndAsByItWhenItComesTooLate)
{
    TerminalProcess process = start("exec \"$0\" --log parameter revert .");
    process.readUntil("completed_steps=3 ");
    process.send(SIGTERM);
    const std::string text = process.readAll();
    const int status = process.wait();
    ASSERT_TRUE(WIFEXITED(status)) << text;
    EXPECT_EQ(WEXITSTATUS(status), 143);
    EXPECT_THAT(text, AllOf(HasSubstr("Too late to cancel: files are being written.\n"),
                            EndsWith("-xp\nReverted 1000 files.\n")));
    EXPECT_EQ(countChanges(), 0U);
}

TEST_F(ShellInterrupt, IsIgnoredWhereItWasIgnoredBefore)
{
    TerminalProcess process = start("trap '' INT; exec \"$0\" --log progress revert .");
    process.readUntil("Checkout Notify");
    process.interrupt();
    const std::string text = process.readAll();
    const int status = process.wait();
    ASSERT_TRUE(WIFEXITED(status)) << text;
    EXPECT_EQ(WEXITSTATUS(status), 0);
    EXPECT_EQ(countChanges(), 0U);
}

TEST_F(ShellInterrupt, EndsTheProgramBySignalWhereNothingCanBeCancelled)
{
    TerminalProcess process = start("exec \"$0\" status");
    process.readUntil("modified");
    process.interrupt();
    process.readAll();
    const int status = process.wait();
    ASSERT_TRUE(WIFSIGNALED(status));
    EXPECT_EQ(WTERMSIG(status), SIGINT);
}

} // namespace
} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include <csignal>
#include <utility>
#include <vector>

#include <gmock/gmock.h>

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
        editAll();
    }

    /// Long, so that what is written of each file soon fills the terminal.
    static std::string nameOf(int number)
    {
        return "folder" + std::to_string(number % 10) + "/" + std::string(150, 'x') +
               std::to_string(number);
    }

    void editAll() const
    {
        for (int number = 0; number < fileCount; ++number)
            repository_.write(nameOf(number), "edited\n");
    }

    /// A shell script that runs the program, as "$0", in the repository, and is sent these signals
    /// when `sign` has appeared.
    TerminalResult interrupt(const std::string &script, const std::string &sign,
                             const std::vector<int> &signals = {SIGINT}) const
    {
        const std::string suppressions =
            "LSAN_OPTIONS=print_suppressions=0:suppressions=" VCLINK_LEAK_SUPPRESSIONS;
        TerminalProcess process(
            {"env", "TERM=xterm", suppressions, "sh", "-c", script, VCLINK_SHELL},
            repository_.path());
        process.readUntil(sign);
        for (const int signal : signals)
            process.send(signal);
        return process.end();
    }

    std::size_t countChanges() const
    {
        return split(repository_.git({"status", "--porcelain", "-z"}), '\0').size();
    }

    const testing::Matcher<std::string> isCancelled_ =
        AllOf(HasSubstr("Cancelling.\n"), EndsWith("vclink-shell: The operation was cancelled.\n"));
    GitRepository repository_ = makeRepository();
};

TEST_F(ShellInterrupt, CancelsARevertAndLeavesAWorkingCopyToGoOnWith)
{
    const TerminalResult result =
        interrupt("exec \"$0\" --log progress revert .", "Checkout Notify");
    EXPECT_EQ(result.exitStatus, 130);
    EXPECT_THAT(result.text, isCancelled_);

    EXPECT_EQ(countChanges(), static_cast<std::size_t>(fileCount));
    EXPECT_EQ(statesIn(repository_.path()).size(), static_cast<std::size_t>(fileCount));
    EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/index.lock"));
    const CommandResult again = runIn(repository_.path(), {"revert", "."});
    EXPECT_EQ(again.exitStatus, 0) << again.errors;
    EXPECT_EQ(countChanges(), 0U);
}

TEST_F(ShellInterrupt, IsToldInTheLanguageThatWasAskedFor)
{
    const TerminalResult result =
        interrupt("exec \"$0\" --lang de --log progress revert .", "Checkout Notify");
    EXPECT_EQ(result.exitStatus, 130);
    EXPECT_THAT(result.text, AllOf(HasSubstr("Wird abgebrochen.\n"),
                                   EndsWith("vclink-shell: Der Vorgang wurde abgebrochen.\n")));
}

TEST_F(ShellInterrupt, ChangesNothingMoreWhenItIsRepeated)
{
    const TerminalResult result = interrupt("exec \"$0\" --log progress revert .",
                                            "Checkout Notify", std::vector<int>(5, SIGINT));
    EXPECT_EQ(result.exitStatus, 130);
    EXPECT_THAT(result.text, AllOf(Not(HasSubstr("at once")), isCancelled_));
}

/// The program then ends as after the whole operation, except for the status of another signal.
TEST_F(ShellInterrupt, ComesTooLateOnceFilesAreWritten)
{
    for (const auto &[signal, exitStatus] : {std::pair(SIGINT, 0), std::pair(SIGTERM, 143)})
    {
        const TerminalResult result =
            interrupt("exec \"$0\" --log parameter revert .", "completed_steps=3 ", {signal});
        EXPECT_EQ(result.exitStatus, exitStatus);
        EXPECT_THAT(result.text, AllOf(HasSubstr("Too late to cancel: files are being written.\n"),
                                       EndsWith("-xp\nReverted 1000 files.\n")));
        EXPECT_EQ(countChanges(), 0U);
        editAll();
    }
}

TEST_F(ShellInterrupt, OfAnotherKindCancelsToo)
{
    for (const int signal : {SIGTERM, SIGHUP})
    {
        const TerminalResult result =
            interrupt("exec \"$0\" --log progress revert .", "Checkout Notify", {signal});
        EXPECT_EQ(result.exitStatus, 128 + signal);
        EXPECT_THAT(result.text, isCancelled_);
        EXPECT_EQ(countChanges(), static_cast<std::size_t>(fileCount));
        EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/index.lock"));
    }
}

TEST_F(ShellInterrupt, IsIgnoredWhereItWasIgnoredBefore)
{
    const TerminalResult result =
        interrupt("trap '' INT; exec \"$0\" --log progress revert .", "Checkout Notify");
    EXPECT_EQ(result.exitStatus, 0) << result.text;
    EXPECT_EQ(countChanges(), 0U);
}

TEST_F(ShellInterrupt, EndsTheProgramBySignalWhereNothingCanBeCancelled)
{
    EXPECT_EQ(interrupt("exec \"$0\" status", "modified").exitStatus, -SIGINT);
}

} // namespace
} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include <chrono>

#include <gmock/gmock.h>

#include "ChangeFixture.hpp"
#include "runOnTerminal.hpp"

namespace vclink::test
{
namespace
{

using testing::EndsWith;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

const std::string takeLineAway = "\r\33[K";

std::size_t count(const std::string &text, const std::string &part)
{
    std::size_t times = 0;
    for (std::size_t start = text.find(part); start != std::string::npos;
         start = text.find(part, start + part.size()))
        ++times;
    return times;
}

class ShellProgress : public ChangeFixture
{
  protected:
    ShellProgress()
    {
        repository_.write("a", "edited\n");
        repository_.write("b", "edited\n");
    }

    /// What a terminal shows of the program in the repository.
    std::string show(const std::vector<std::string> &arguments,
                     const std::string &terminal = "xterm") const
    {
        std::vector<std::string> words{"env", "TERM=" + terminal, VCLINK_SHELL, "-C",
                                       repository_.path().string()};
        words.insert(words.end(), arguments.begin(), arguments.end());
        const TerminalResult result = runOnTerminal(words);
        EXPECT_EQ(result.exitStatus, 0) << result.text;
        return result.text;
    }
};

TEST_F(ShellProgress, IsNotDrawnIntoAPipeUnlessAskedFor)
{
    succeed({"revert", "--forget", "a"});
    succeed({"--progress", "auto", "revert", "--forget", "b"});
    repository_.write("a", "edited\n");
    succeed({"--progress", "never", "revert", "--forget", "a"});
}

TEST_F(ShellProgress, IsDrawnIntoAPipeWhenAskedForAndTakenAway)
{
    const CommandResult result =
        runIn(repository_.path(), {"--progress", "always", "revert", "--forget", "a"});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(result.errors,
              takeLineAway + "[####################] 100% Checking out a" + takeLineAway);
}

TEST_F(ShellProgress, IsDrawnInTheLanguageThatWasAskedFor)
{
    const auto run = [this](const std::string &language)
    {
        repository_.write("a", "edited\n");
        return runIn(repository_.path(),
                     {"--lang", language, "--progress", "always", "revert", "--forget", "a"})
            .errors;
    };
    EXPECT_THAT(run("de"), HasSubstr("% a wird ausgecheckt" + takeLineAway));
    EXPECT_THAT(run("ja"), HasSubstr("% a を"));
}

TEST_F(ShellProgress, IsDrawnOnATerminalAndFollowedByWhatWasDone)
{
    EXPECT_EQ(show({"revert", "--forget", "a"}), takeLineAway +
                                                     "[####################] 100% Checking out a" +
                                                     takeLineAway + "Reverted 1 file.\n");
}

TEST_F(ShellProgress, IsNotDrawnOnATerminalWhereItIsNotWantedOrCannotBe)
{
    EXPECT_EQ(show({"--progress", "never", "revert", "--forget", "a"}), "Reverted 1 file.\n");
    EXPECT_EQ(show({"revert", "--forget", "b"}, "dumb"), "Reverted 1 file.\n");
}

TEST_F(ShellProgress, IsDrawnNoMoreThanTwentyTimesASecondAndAtTheEnd)
{
    for (int number = 0; number < 1000; ++number)
        repository_.write("many/" + std::to_string(number), "");
    repository_.commitAll("many");
    for (int number = 0; number < 1000; ++number)
        repository_.write("many/" + std::to_string(number), "edited\n");
    const auto start = std::chrono::steady_clock::now();
    const std::string text = show({"--progress", "always", "revert", "--forget", "many"});
    const std::chrono::duration<double> time = std::chrono::steady_clock::now() - start;
    const std::size_t drawn = count(text, "% Checking out ");
    EXPECT_GE(drawn, 1U);
    // The first and the last are drawn in any case.
    EXPECT_LE(static_cast<double>(drawn), time.count() * 20 + 2);
    EXPECT_EQ(text.rfind("] 100% "), text.rfind("% Checking out ") - 5);
    EXPECT_EQ(count(text, takeLineAway), drawn + 1);
    EXPECT_THAT(text, EndsWith(takeLineAway + "Reverted 1000 files.\n"));
}

TEST_F(ShellProgress, IsTakenAwayBeforeAFailureIsTold)
{
    repository_.write("c", std::string(200'000, 'c'));
    repository_.commitAll("large");
    repository_.remove("c");
    repository_.write("b", "another edit\n");
    // No file may become larger than 64 blocks; one that would is an error without its signal.
    const CommandResult result =
        Command({"sh", "-c", "trap '' XFSZ; ulimit -f 64; exec \"$0\" --progress always revert b c",
                 VCLINK_SHELL})
            .in(repository_.path())
            .run();
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_THAT(result.errors, StartsWith(takeLineAway + "["));
    EXPECT_THAT(result.errors, HasSubstr(takeLineAway + "To restore what was discarded: "));
    EXPECT_THAT(result.errors,
                HasSubstr(" -xp\nvclink-shell: Git could not complete the operation: "));
    EXPECT_EQ(repository_.read("b"), "edited\n");
}

TEST_F(ShellProgress, GivesWayToRecordsOfTheLog)
{
    const std::string errors =
        runIn(repository_.path(), {"--progress", "always", "--log", "progress,parameter", "revert",
                                   "--forget", "a", "b"})
            .errors;
    EXPECT_THAT(errors, HasSubstr("Checking out a" + takeLineAway + "[parameter] "));
    EXPECT_THAT(errors, Not(HasSubstr("Checking out a[")));
}

TEST_F(ShellProgress, IsNoConcernOfCommandsThatHaveNone)
{
    repository_.write("new", "");
    EXPECT_EQ(show({"--progress", "always", "add", "new"}), "Added 1 file.\n");
    EXPECT_EQ(show({"add", "folder"}), "There is no new file to add.\n");
    EXPECT_EQ(show({"rm", "folder"}), "Removed 2 files from Git, not from the disk.\n");
    EXPECT_EQ(show({"resolved", "b"}), "It was not in conflict, and is staged as it is.\n");
    repository_.git({"config", "user.name", "A"});
    repository_.git({"config", "user.email", "a@example.org"});
    EXPECT_EQ(show({"commit", "-m", "Work"}), "Committed 5 files.\n");
    EXPECT_EQ(show({"revert", "."}), "There is no change to revert.\n");
    makeConflict();
    EXPECT_EQ(show({"resolved", "a"}), "Marked 1 file as resolved.\n");
}

} // namespace
} // namespace vclink::test

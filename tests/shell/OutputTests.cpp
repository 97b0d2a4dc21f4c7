// SPDX-License-Identifier: MIT
#include <csignal>
#include <filesystem>

#include "ShellFixture.hpp"

namespace vclink::test
{
namespace
{

class ShellOutput : public ShellFixture
{
  protected:
    /// Runs a shell script in a repository with many files, "$0" being the program.
    CommandResult runScript(const std::string &script) const
    {
        const GitRepository repository = makeRepository();
        for (int number = 0; number < 500; ++number)
            repository.write("a/rather/long/name/of/a/file/" + std::string(150, 'x') +
                                 std::to_string(number),
                             "");
        return Command({"sh", "-c", script, VCLINK_SHELL}).in(repository.path()).run();
    }
};

TEST_F(ShellOutput, ThatFillsTheDiskIsAnError)
{
    const std::filesystem::path empty = makeRepository("empty").path();
    for (const std::string arguments : {"status", "status -z", "version", "--help", "probe ."})
    {
        const CommandResult result =
            Command({"sh", "-c", "exec \"$0\" " + arguments + " >/dev/full", VCLINK_SHELL})
                .in(empty)
                .run();
        // What has nothing to write has nothing to complain of.
        EXPECT_EQ(result.exitStatus, arguments.rfind("status", 0) == 0 ? 0 : 1) << arguments;
    }
    const CommandResult result = runScript("exec \"$0\" status >/dev/full");
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.errors,
              "vclink-shell: Standard output can't be written: No space left on device.\n");
}

TEST_F(ShellOutput, ThatIsClosedIsAnError)
{
    const CommandResult result = runScript("exec \"$0\" status >&-");
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.errors,
              "vclink-shell: Standard output can't be written: Bad file descriptor.\n");
}

TEST_F(ShellOutput, IsCompleteWhenTheOtherStandardStreamsAreClosed)
{
    const CommandResult result = runScript("exec \"$0\" status <&- 2>&-");
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(parseRecords(result.output).size(), 500U);
}

TEST_F(ShellOutput, ThatNobodyReadsEndsTheProgramAsAnyFilter)
{
    // "head" ends after a line; the rest is more than a pipe holds.
    const CommandResult result =
        runScript("{ \"$0\" status; echo $? >&2; } | head -n 1 >/dev/null");
    EXPECT_EQ(result.errors, std::to_string(128 + SIGPIPE) + "\n");
}

TEST_F(ShellOutput, ThatNobodyReadsIsAnErrorWhereTheSignalIsIgnored)
{
    const CommandResult result =
        runScript("trap '' PIPE; { \"$0\" status; echo $? >&2; } | head -n 1 >/dev/null");
    EXPECT_EQ(result.errors, "vclink-shell: Standard output can't be written: Broken pipe.\n1\n");
}

} // namespace
} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellFixture.hpp"
#include "runOnTerminal.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;
using testing::Not;

const std::string plainLines = "modified\tedited\nunversioned\tnew\n";
const std::string colouredLines = "\33[33mmodified\33[m\tedited\n\33[36munversioned\33[m\tnew\n";
const std::string counts = "3 files: 1 clean, 1 modified, 1 unversioned\n";

class ShellOnTerminal : public ShellFixture
{
  protected:
    ShellOnTerminal()
    {
        repository_.write("clean", "");
        repository_.write("edited", "");
        repository_.commitAll("begin");
        repository_.write("edited", "more");
        repository_.write("new", "");
    }

    /// What the terminal shows of a script with the program as "$0" and -C for the repository as
    /// "$1" and "$2".
    std::string show(const std::string &script,
                     const std::vector<std::string> &variables = {"TERM=xterm"}) const
    {
        std::vector<std::string> arguments{"env", "-u", "NO_COLOR", "-u", "TERM"};
        arguments.insert(arguments.end(), variables.begin(), variables.end());
        arguments.insert(arguments.end(),
                         {"sh", "-c", script, VCLINK_SHELL, "-C", repository_.path().string()});
        const TerminalResult result = runOnTerminal(arguments);
        EXPECT_EQ(result.exitStatus, 0) << result.text;
        return result.text;
    }

    GitRepository repository_ = makeRepository();
};

TEST_F(ShellOnTerminal, ColoursTheStatesAndCountsThem)
{
    EXPECT_EQ(show("exec \"$0\" \"$@\" status"), colouredLines + counts);
}

TEST_F(ShellOnTerminal, CountsOneFileAsOne)
{
    EXPECT_THAT(show("exec \"$0\" \"$@\" status new"), HasSubstr("\n1 file: 1 unversioned\n"));
}

TEST_F(ShellOnTerminal, CountsWithoutColourWhenOnlyTheErrorsGoThere)
{
    EXPECT_EQ(show("\"$0\" \"$@\" status >\"$2/../output\""), counts);
    EXPECT_EQ(GitRepository(folder().path()).read("output"), plainLines);
}

TEST_F(ShellOnTerminal, ColoursWithoutCountingWhenOnlyTheOutputGoesThere)
{
    EXPECT_EQ(show("exec \"$0\" \"$@\" status 2>/dev/null"), colouredLines);
}

TEST_F(ShellOnTerminal, ShowsNeitherColourNorCountsWhenNothingGoesThere)
{
    EXPECT_EQ(show("\"$0\" \"$@\" status 2>&1 | cat"), plainLines);
}

TEST_F(ShellOnTerminal, LeavesColoursOutForWhoDoesNotWantOrSeeThem)
{
    const std::string script = "exec \"$0\" \"$@\" status";
    EXPECT_EQ(show(script, {"TERM=xterm", "NO_COLOR=1"}), plainLines + counts);
    EXPECT_EQ(show(script, {"TERM=xterm", "NO_COLOR="}), colouredLines + counts);
    EXPECT_EQ(show(script, {"TERM=dumb"}), plainLines + counts);
    EXPECT_EQ(show(script, {}), plainLines + counts);
}

TEST_F(ShellOnTerminal, LeavesColoursOutOfRecordsForPrograms)
{
    EXPECT_THAT(show("exec \"$0\" \"$@\" status -z"), Not(HasSubstr("\33")));
}

TEST_F(ShellOnTerminal, EscapesWhatChangesTheDirectionOfWriting)
{
    const std::string name = "a\xE2\x80\xAE"
                             "txt.exe\xE2\x81\xA6\xE2\x80\x8F";
    repository_.write(name, "");
    const std::string escaped = "\"a\\342\\200\\256txt.exe\\342\\201\\246\\342\\200\\217\"";
    EXPECT_THAT(show("exec \"$0\" \"$@\" status"), HasSubstr(escaped + '\n'));
    EXPECT_THAT(show("cd \"$2\" && ! \"$0\" rm *.exe*"), HasSubstr("  " + escaped + ": it is not"));
    EXPECT_THAT(show("\"$0\" \"$@\" status 2>&1 | cat"), HasSubstr("\t\"" + name + "\"\n"));
    EXPECT_THAT(show("\"$0\" \"$@\" status -z"), HasSubstr("\t" + name));
}

TEST_F(ShellOnTerminal, NamesTheBackEndThatServesAFolder)
{
    EXPECT_EQ(show("exec \"$0\" \"$@\" probe ."), "yes\nserved by the back end \"git\"\n");
}

} // namespace
} // namespace vclink::test

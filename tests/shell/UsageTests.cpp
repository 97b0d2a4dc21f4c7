// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;
using testing::StartsWith;

class ShellUsage : public ShellFixture
{
};

TEST_F(ShellUsage, EndsWithTwoAndAReasonWhenTheArgumentsMakeNoSense)
{
    const struct
    {
        std::vector<std::string> arguments;
        std::string reason;
    } cases[] = {
        {{}, "A command is missing."},
        {{"-C", "."}, "A command is missing."},
        {{"comit"}, "Unknown command 'comit'. Did you mean 'commit'?\nSee \"vclink-shell help\"."},
        {{"checkout", "a"}, "Unknown command 'checkout'. Did you mean 'switch'?"},
        {{"xyzzy"}, "Unknown command 'xyzzy'.\n"},
        {{"help", "statsu"}, "Unknown command 'statsu'. Did you mean 'status'?"},
        {{"[status]"}, "Unknown command '[status]'."},
        {{"--", "status"}, "Unknown command 'status'."},
        {{"--nonsense", "version"}, "Unknown option '--nonsense'."},
        {{"status", "--nonsense"}, "Unknown option '--nonsense'."},
        {{"version", "7"}, "Unexpected argument '7'."},
        {{"probe"}, "FOLDER is missing."},
        {{"probe", "a", "[b]"}, "Unexpected argument '[b]'."},
        {{"status", ""}, "PATH: must not be empty."},
        {{"version", "-C"}, "The option '-C' must be before the command."},
        {{"--forget", "revert", "a"}, "The option '--forget' must follow the command."},
        {{"-C"}, "-C needs a value."},
        {{"--lang"}, "--lang needs a value."},
        {{"--log", "chatter", "version"}, "--log: \"chatter\" is neither a number nor a list"},
        {{"--log", "parameter,", "version"}, "--log: \"parameter,\" is neither"},
        {{"--log", "", "version"}, "--log: \"\" is neither"},
        {{"--log", "0x", "version"}, "--log: \"0x\" is neither"},
        {{"--log", "0xFFFFFFFFF", "version"}, "--log: \"0xFFFFFFFFF\" is neither"},
        {{"--log", "-1", "version"}, "--log: \"-1\" is neither"},
        {{"--progress"}, "--progress needs a value."},
        {{"--progress", "maybe", "version"}, "--progress: \"maybe\" is not auto, always or never."},
        {{"--progress", "", "version"}, "--progress: \"\" is not auto"},
        {{"add"}, "PATH is missing."},
        {{"rm"}, "PATH is missing."},
        {{"revert"}, "PATH is missing."},
        {{"resolved"}, "PATH is missing."},
        {{"add", "-Z"}, "Unknown option '-Z'.\nSee \"vclink-shell help add\"."},
        {{"merge", "--abort"}, "Unknown option '--abort'. Use \"git merge --abort\"."},
        {{"commit", "--mend"}, "Unknown option '--mend'."},
        {{"commit", "--as-si", "-m", "a"}, "Unknown option '--as-si'. Did you mean '--as-is'?"},
        {{"help", "nope"}, "Unknown command 'nope'.\nSee \"vclink-shell help\"."},
        {{"log"},
         "Unknown command 'log'. This program does not do that, git does: use \"git log\"."},
        {{"help", "diff"}, "Unknown command 'diff'. This program does not do that, git does: use "},
        {{"pull"},
         "Unknown command 'pull'. Use \"vclink-shell fetch\", \"vclink-shell merge "
         "REMOTE/BRANCH\"."},
        {{"status", "-s"}, "Unknown option '-s'. Use \"vclink-shell status\"."},
        {{"push", "--tags"},
         "Unknown option '--tags'. This program does not do that, git does: use \"git push "
         "--tags\"."},
        {{"switch", "-c", "a", "b"}, "Unknown option '-c'. Use \"vclink-shell branch NAME\"."},
        {{"add", "a", ""}, "PATH: must not be empty."},
        {{"commit"}, "-m MESSAGE is missing."},
        {{"commit", "-m"}, "-m needs a value."},
        {{"commit", "-m", "a", "-m", "b"}, "-m can be given only once."},
        {{"commit", "-m", "a", "b"}, "Unexpected argument 'b'. Use \"git commit PATH\"."},
        {{"commit", "--as-is"}, "-m MESSAGE is missing."},
        {{"branches", "main"}, "Unexpected argument 'main'."},
        {{"branch"}, "NAME is missing."},
        {{"branch", "a", ""}, "START: must not be empty."},
        {{"branch", "a", "b", "c"}, "Unexpected argument 'c'."},
        {{"branch", "-d"}, "NAME is missing."},
        {{"branch", "-d", ""}, "NAME: must not be empty."},
        {{"branch", "-d", "a", "b"}, "START: is not allowed with -d."},
        {{"switch"}, "NAME is missing."},
        {{"switch", "a", "b"}, "Unexpected argument 'b'."},
        {{"current", "a"}, "Unexpected argument 'a'."},
        {{"rev"}, "NAME is missing."},
        {{"rev", ""}, "NAME: must not be empty."},
        {{"state", "a"}, "Unexpected argument 'a'."},
        {{"merge"}, "NAME is missing."},
        {{"merge", ""}, "NAME: must not be empty."},
        {{"merge", "a", "b"}, "Unexpected argument 'b'. Use \"git merge NAME...\"."},
        {{"merge", "a", "--force"}, "Unknown option '--force'."},
        {{"attr"}, "PATH is missing."},
        {{"attr", "a"}, "NAME is missing."},
        {{"attr", "a", "b", ""}, "NAME: must not be empty."},
        {{"config", "a"}, "Unexpected argument 'a'."},
        {{"clone"}, "SPECIFIER is missing."},
        {{"clone", "", "b"}, "SPECIFIER: must not be empty."},
        {{"clone", "a", ""}, "FOLDER: must not be empty."},
        {{"clone", "a", "b", "c"}, "Unexpected argument 'c'."},
        {{"fetch", ""}, "REMOTE: must not be empty."},
        {{"fetch", "origin", ""}, "REFSPEC: must not be empty."},
        {{"push", "origin", "a", ""}, "REFSPEC: must not be empty."},
        {{"heads", "origin", "main"}, "Unexpected argument 'main'."},
    };
    for (const auto &[arguments, reason] : cases)
    {
        const Command command = shell(arguments);
        const CommandResult result = command.run();
        EXPECT_EQ(result.exitStatus, 2) << command.text();
        EXPECT_EQ(result.output, "") << command.text();
        EXPECT_THAT(result.errors, StartsWith("vclink-shell: " + reason)) << command.text();
    }
}

TEST_F(ShellUsage, ExplainsItselfOnStandardOutput)
{
    for (const std::string option : {"--help", "-h"})
    {
        const CommandResult result = shell({option}).run();
        EXPECT_EQ(result.exitStatus, 0);
        EXPECT_EQ(result.errors, "");
        for (const std::string word : {"status",
                                       "add",
                                       "rm",
                                       "resolved",
                                       "commit",
                                       "revert",
                                       "branches",
                                       "branch",
                                       "switch",
                                       "current",
                                       "rev",
                                       "state",
                                       "merge",
                                       "clone",
                                       "fetch",
                                       "push",
                                       "heads",
                                       "attr",
                                       "config",
                                       "probe",
                                       "version",
                                       "-C FOLDER",
                                       "--log SEVERITIES",
                                       "--lang LOCALE",
                                       "--progress WHEN",
                                       "Exit status: 0 done"})
            EXPECT_THAT(result.output, HasSubstr(word));
    }
}

TEST_F(ShellUsage, ExplainsEveryCommandOnStandardOutput)
{
    for (const std::string command :
         {"status", "add",    "rm",      "resolved", "commit", "revert", "branches",
          "branch", "switch", "current", "rev",      "state",  "merge",  "clone",
          "fetch",  "push",   "heads",   "attr",     "config", "probe",  "version"})
    {
        const CommandResult result = shell({command, "--help"}).run();
        EXPECT_EQ(result.exitStatus, 0);
        EXPECT_EQ(result.errors, "");
        EXPECT_THAT(result.output, HasSubstr("Usage: vclink-shell " + command));
    }
}

TEST_F(ShellUsage, ExplainsACommandByHelpToo)
{
    EXPECT_EQ(shell({"help", "status"}).run().output, shell({"status", "--help"}).run().output);
    EXPECT_EQ(shell({"help"}).run().output, shell({"--help"}).run().output);
}

TEST_F(ShellUsage, SaysWhatIsWrongInTheLanguageThatWasAskedFor)
{
    EXPECT_EQ(shell({"--lang", "de", "comit"}).run().errors,
              "vclink-shell: Unbekannter Befehl 'comit'. Meinten Sie 'commit'?\n"
              "Siehe \"vclink-shell help\".\n");
    EXPECT_THAT(shell({"--lang=ja", "add"}).run().errors, HasSubstr("PATH がありません。"));
    EXPECT_THAT(shell({"--lang", "de", "status", "--help"}).run().output,
                HasSubstr("  modified      geändert, vorgemerkt oder nicht\n"));
}

TEST_F(ShellUsage, ExplainsEveryStateInTheHelpOfStatus)
{
    const CommandResult result = shell({"status", "--help"}).run();
    for (const std::string state :
         {"clean", "modified", "added", "deleted", "missing", "conflict", "unversioned", "unknown"})
        EXPECT_THAT(result.output, HasSubstr("\n  " + state + " "));
}

} // namespace
} // namespace vclink::test

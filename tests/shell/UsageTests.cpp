// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellTest.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;
using testing::StartsWith;

class ShellUsage : public ShellTest
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
        {{"comit"}, "There is no command or option \"comit\"."},
        {{"[status]"}, "There is no command or option \"[status]\"."},
        {{"--", "status"}, "There is no command or option \"status\"."},
        {{"--nonsense", "version"}, "\"--nonsense\" was not expected."},
        {{"status", "--nonsense"}, "\"--nonsense\" was not expected."},
        {{"version", "7"}, "\"7\" was not expected."},
        {{"probe"}, "FOLDER is required."},
        {{"probe", "a", "[b]"}, "\"[b]\" was not expected."},
        {{"status", ""}, "PATH: it may not be empty."},
        {{"version", "-C"}, "\"-C\" was not expected."},
        {{"-C"}, "-C: 1 required FOLDER missing."},
        {{"--lang"}, "--lang: 1 required LOCALE missing."},
        {{"--log", "chatter", "version"}, "--log: \"chatter\" is neither a number nor a list"},
        {{"--log", "parameter,", "version"}, "--log: \"parameter,\" is neither"},
        {{"--log", "", "version"}, "--log: \"\" is neither"},
        {{"--log", "0x", "version"}, "--log: \"0x\" is neither"},
        {{"--log", "0xFFFFFFFFF", "version"}, "--log: \"0xFFFFFFFFF\" is neither"},
        {{"--log", "-1", "version"}, "--log: \"-1\" is neither"},
        {{"--progress"}, "--progress: 1 required WHEN missing."},
        {{"--progress", "maybe", "version"}, "--progress: \"maybe\" is not auto, always or never."},
        {{"--progress", "", "version"}, "--progress: \"\" is not auto"},
        {{"add"}, "PATH is required."},
        {{"rm"}, "PATH is required."},
        {{"revert"}, "PATH is required."},
        {{"resolved"}, "PATH is required."},
        {{"resolved", "a", "b"}, "PATH: At Most 1 required but received 2."},
        {{"add", "a", ""}, "PATH: it may not be empty."},
        {{"commit"}, "-m is required."},
        {{"commit", "-m"}, "-m: 1 required MESSAGE missing."},
        {{"commit", "-m", "a", "-m", "b"}, "-m: At Most 1 required but received 2."},
        {{"commit", "-m", "a", "b"}, "\"b\" was not expected."},
        {{"commit", "--as-is"}, "-m is required."},
        {{"branches", "main"}, "\"main\" was not expected."},
        {{"branch"}, "NAME is required."},
        {{"branch", "a"}, "START is required."},
        {{"branch", "a", ""}, "START: it may not be empty."},
        {{"branch", "a", "b", "c"}, "\"c\" was not expected."},
        {{"branch", "-d"}, "NAME is required."},
        {{"branch", "-d", ""}, "NAME: it may not be empty."},
        {{"branch", "-d", "a", "b"}, "START: it is not for a branch to delete."},
        {{"switch"}, "NAME is required."},
        {{"switch", "a", "b"}, "\"b\" was not expected."},
        {{"current", "a"}, "\"a\" was not expected."},
        {{"rev"}, "NAME is required."},
        {{"rev", ""}, "NAME: it may not be empty."},
        {{"state", "a"}, "\"a\" was not expected."},
        {{"merge"}, "NAME is required."},
        {{"merge", ""}, "NAME: it may not be empty."},
        {{"merge", "a", "b"}, "\"b\" was not expected."},
        {{"merge", "a", "--force"}, "\"--force\" was not expected."},
        {{"attr"}, "PATH is required."},
        {{"attr", "a"}, "NAME is required."},
        {{"attr", "a", "b", ""}, "NAME: it may not be empty."},
        {{"config", "a"}, "\"a\" was not expected."},
        {{"clone"}, "SPECIFIER is required."},
        {{"clone", "a"}, "FOLDER is required."},
        {{"clone", "", "b"}, "SPECIFIER: it may not be empty."},
        {{"clone", "a", ""}, "FOLDER: it may not be empty."},
        {{"clone", "a", "b", "c"}, "\"c\" was not expected."},
        {{"fetch"}, "REMOTE is required."},
        {{"fetch", ""}, "REMOTE: it may not be empty."},
        {{"fetch", "origin", ""}, "REFSPEC: it may not be empty."},
        {{"push"}, "REMOTE is required."},
        {{"push", "origin", "a", ""}, "REFSPEC: it may not be empty."},
        {{"heads"}, "REMOTE is required."},
        {{"heads", "origin", "main"}, "\"main\" was not expected."},
        {{"heads", "-z"}, "REMOTE is required."},
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

TEST_F(ShellUsage, ExplainsEveryStateInTheHelpOfStatus)
{
    const CommandResult result = shell({"status", "--help"}).run();
    for (const std::string state :
         {"clean", "modified", "added", "deleted", "missing", "conflict", "unversioned", "unknown"})
        EXPECT_THAT(result.output, HasSubstr("\n  " + state + " "));
}

} // namespace
} // namespace vclink::test

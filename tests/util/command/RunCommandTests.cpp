// SPDX-License-Identifier: MIT
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "RunCommandFixture.hpp"
#include "support/Descriptors.hpp"
#include "support/LogCapture.hpp"
#include "support/WorkingFolder.hpp"
#include "support/readFile.hpp"

namespace
{

using testing::ElementsAre;
using namespace vclink::test;

using RunCommand = RunCommandFixture;

TEST_F(RunCommand, GivesTheExitStatus)
{
    for (const int status : {0, 1, 2, 13, 126, 127, 128, 255})
        EXPECT_EQ(resultOf(scripts_.shell("exit " + std::to_string(status))), status);
}

TEST_F(RunCommand, GivesTheNumberOfTheSignal)
{
    // None that nohup(1) would have ignored. 13 is also an exit status.
    for (const int signal : {SIGUSR1, SIGKILL, SIGTERM, SIGPIPE})
        EXPECT_EQ(resultOf(scripts_.shell("kill -" + std::to_string(signal) + " $$")), signal);
}

TEST_F(RunCommand, ReplacesThePlaceholdersOfTheTemplate)
{
    const std::string program = scripts_.shell("test \"$*\" = 'o a b a 7 sub/f'");
    EXPECT_EQ(resultOf(program + " %O %A %B %A %L %P",
                       {{"%O", "o"}, {"%A", "a"}, {"%B", "b"}, {"%L", "7"}, {"%P", "sub/f"}}),
              0);
    // A value that holds a blank is split.
    EXPECT_EQ(resultOf(scripts_.shell("test $# = 3 && test \"$2\" = b") + " %A c", {{"%A", "a b"}}),
              0);
}

TEST_F(RunCommand, SplitsTheCommandIntoTheseWords)
{
    const struct
    {
        const char *command;
        std::vector<std::string> words;
    } rows[] = {
        // Unchanged without placeholders.
        {"%T %A 100% %", {"%A", "100%", "%"}},
        // At blanks outside double quotes only.
        {"%T a \"b c\" d", {"a", "b c", "d"}},
        {"  %T   a    b  ", {"a", "b"}},
        {"%T a\tb c", {"a\tb", "c"}},
        {"%T \"a  b", {"\"a  b"}},
        // One pair of quotes around a word is stripped.
        {"%T \"a\" \"\" \"\"b\"\"", {"a", "", "\"b\""}},
        {"%T a\"b c\"d x\"y", {"a\"b c\"d", "x\"y"}},
        {"%T \\\"a\\\"", {"\"a\""}},
        // Other characters of a shell as they are.
        {"%T 'a b' \\x $HOME * ; > out `id` | cat && ~ # end",
         {"'a", "b'", "\\x", "$HOME", "*", ";", ">", "out", "`id`", "|", "cat", "&&", "~", "#",
          "end"}},
        {"%T a b\n", {"a", "b\n"}},
        {"%T \xC3\xA9 \xFF\x01", {"\xC3\xA9", "\xFF\x01"}},
    };
    for (const auto &row : rows)
        EXPECT_EQ(wordsOf(row.command), row.words) << row.command;
}

TEST_F(RunCommand, StartsALauncherInQuotesWhosePathHasABlank)
{
    const std::filesystem::path launcher = folder() / "a b" / "tool";
    std::filesystem::create_directories(launcher.parent_path());
    std::filesystem::copy(scripts_.shell("test \"$*\" = x"), launcher);
    EXPECT_EQ(resultOf("\"" + launcher.string() + "\" x"), 0);
}

TEST_F(RunCommand, RunsInTheWorkingFolderOfTheProcess)
{
    const WorkingFolder there(folder().path());
    EXPECT_EQ(outputOf("pwd"), folder().path().string());
}

TEST_F(RunCommand, HandsTheWholeEnvironmentOver)
{
    ::setenv("VCLINK_TEST_VARIABLE", "a b\"c", 1);
    const std::string out = folder() / "environment";
    EXPECT_EQ(resultOf(scripts_.shell("env -0 | sort -z >" + out)), 0);
    const std::string bytes = readFile(out);
    for (char **variable = environ; *variable != nullptr; ++variable)
    {
        const std::string text = *variable;
        const std::string name = text.substr(0, text.find('='));
        if (name != "_" && name != "PWD" && name != "OLDPWD" && name != "SHLVL")
        {
            EXPECT_NE(bytes.find(text + '\0'), std::string::npos) << text;
        }
    }
}

TEST_F(RunCommand, HandsStandardInputOver)
{
    EXPECT_EQ(outputOf("readlink /proc/self/fd/0"),
              std::filesystem::read_symlink("/proc/self/fd/0").string());
}

TEST_F(RunCommand, GivesTheCommandItsOutputAndNoOtherPipe)
{
    const std::string out = folder() / "descriptors";
    const std::string program = scripts_.shell(
        "for number in /proc/$$/fd/*; do readlink $number; done >" + out + "; exit 0");
    std::set<std::string> before;
    for (const auto &descriptor : openDescriptors())
        before.insert(descriptor.second);
    EXPECT_EQ(resultOf(program), 0);
    std::set<std::string> pipes;
    std::istringstream lines(readFile(out));
    for (std::string line; std::getline(lines, line);)
    {
        if (line.compare(0, 5, "pipe:") == 0 && before.count(line) == 0)
            pipes.insert(line);
    }
    EXPECT_EQ(pipes.size(), 1U);
}

TEST_F(RunCommand, LosesStandardErrorAtEveryLoggingLevel)
{
    EXPECT_EQ(outputOf("echo lost >&2; echo kept"), "kept");
    // The record of the command names the script, not what it prints.
    const std::string program = scripts_.shell("cat >&2 <<END\nlost\nEND\n" + waitUntilRead());
    std::vector<unsigned> masks{0, LogCapture::allSeverities};
    for (unsigned bit = 1; bit != 0; bit <<= 1)
        masks.push_back(bit);
    for (const unsigned mask : masks)
    {
        const LogCapture log(mask);
        testing::internal::CaptureStdout();
        testing::internal::CaptureStderr();
        EXPECT_EQ(resultOf(program), 0);
        EXPECT_EQ(testing::internal::GetCapturedStderr(), "") << mask;
        EXPECT_EQ(testing::internal::GetCapturedStdout(), "") << mask;
        for (const std::string &message : log.messages())
            EXPECT_EQ(message.find("lost"), std::string::npos) << mask << ": " << message;
    }
}

TEST_F(RunCommand, TellsOfTheExpandedCommandAndItsOutput)
{
    const std::string program = scripts_.shell("echo one; echo two\n" + waitUntilRead());
    EXPECT_THAT(recordsOf(program + " \"x\" y"),
                ElementsAre("Command: " + program + " \"x\" y", "Output:\nonetwo"));
    const std::string silent = scripts_.shell("exit 7");
    EXPECT_THAT(recordsOf(silent), ElementsAre("Command: " + silent, "Output:\n"));
    // What cannot be started.
    EXPECT_THAT(recordsOf("/nowhere/tool x"), ElementsAre("Command: /nowhere/tool x"));
    EXPECT_THAT(recordsOf(""), ElementsAre("Command: "));
}

TEST_F(RunCommand, ReadsOutputOfManyPipesFull)
{
    const std::string out =
        outputOf("dd if=/dev/zero bs=1000 count=1000 2>/dev/null | tr '\\0' x; echo");
    EXPECT_EQ(out.size(), 1'000'000U);
}

} // namespace

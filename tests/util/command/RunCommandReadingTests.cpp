// SPDX-License-Identifier: MIT
// How far the output of a command is read.
#include <csignal>
#include <string>
#include <thread>

#include <gtest/gtest.h>

#include "RunCommandFixture.hpp"
#include "support/Command.hpp"
#include "support/readFile.hpp"
#include "util/command/runCommand.hpp"

namespace
{

using RunCommandReading = vclink::test::RunCommandFixture;

TEST_F(RunCommandReading, EndsAtTheFirstEmptyLine)
{
    EXPECT_EQ(outputOf("echo one; echo; echo two"), "one");
    EXPECT_EQ(outputOf("echo; echo two"), "");
}

TEST_F(RunCommandReading, TakesALineOfBlanksForALine)
{
    EXPECT_EQ(outputOf("echo one; echo ' '; echo two"), "one two");
}

TEST_F(RunCommandReading, TakesALastLineWithoutALineFeed)
{
    EXPECT_EQ(outputOf("echo one; printf two; exec >&-"), "onetwo");
}

TEST_F(RunCommandReading, TakesBytesAsTheyAre)
{
    EXPECT_EQ(outputOf("printf 'a\\000b\\377\\r\\n'"), std::string("a\0b\377\r", 5));
}

TEST_F(RunCommandReading, LeavesWhatComesAfterAnEmptyLineInThePipe)
{
    // A pipe holds 64 KiB.
    EXPECT_EQ(resultOf(scripts_.shell(
                  "echo one; echo; dd if=/dev/zero bs=1000 count=60 2>/dev/null; exit 5")),
              5);
}

TEST_F(RunCommandReading, LetsACommandThatFillsThePipeAfterAnEmptyLineBlock)
{
    const std::string process = scripts_.folder() / "process";
    const std::string program = scripts_.shell(
        "echo $$ >" + process + "; echo; exec dd if=/dev/zero bs=1000 count=200 2>/dev/null");
    // Nobody but this ends it.
    const std::string killer =
        scripts_.shell("until grep -q '^Name:.dd' /proc/$1/status && "
                       "grep -q '^State:.S' /proc/$1/status; do :; done; kill -9 $1");
    std::thread helper(
        [&]
        {
            std::string id;
            while ((id = vclink::test::readFile(process)).empty() || id.back() != '\n')
                std::this_thread::yield();
            id.pop_back();
            EXPECT_TRUE(vclink::test::Command({killer, id}).run().succeeded())
                << "it has ended by itself";
        });
    const int result = vclink::git::runCommand(program, {});
    helper.join();
    EXPECT_EQ(result, SIGKILL);
}

TEST_F(RunCommandReading, WaitsForASilentCommandToEnd)
{
    const std::string done = folder() / "done";
    EXPECT_EQ(resultOf(scripts_.shell("sleep 0.3; echo yes >" + done)), 0);
    EXPECT_EQ(vclink::test::readFile(done), "yes\n");
}

TEST_F(RunCommandReading, WaitsForACommandThatHasClosedItsOutput)
{
    const std::string done = folder() / "done";
    EXPECT_EQ(resultOf(scripts_.shell("exec >&-; sleep 0.3; echo yes >" + done + "; exit 4")), 4);
    EXPECT_EQ(vclink::test::readFile(done), "yes\n");
}

TEST_F(RunCommandReading, LastsAsLongAsAGrandchildHoldsTheOutput)
{
    const std::string done = folder() / "done";
    const std::string grandchild = scripts_.shell("sleep 0.3; echo yes >" + done);
    // The command ends only when the reading has begun to wait.
    const std::string program = scripts_.shell(waitUntilRead() + '\n' + grandchild + " & exit 6");
    const int result = vclink::git::runCommand(program, {});
    EXPECT_EQ(result, 6);
    EXPECT_EQ(vclink::test::readFile(done), "yes\n");
}

TEST_F(RunCommandReading, EndsWithTheCommandThoughMoreIsThere)
{
    // Prints when the command has ended, and what waits for its output has not noticed.
    const std::string grandchild =
        scripts_.shell("until grep -q '^State:.Z' /proc/$1/status; do :; done; "
                       "printf 'two\\nthree\\n'");
    EXPECT_EQ(outputOf("echo one\n" + waitUntilRead() + '\n' + grandchild + " $$ &"), "onetwo");
}

TEST_F(RunCommandReading, PlaysNoPartInTheResult)
{
    EXPECT_EQ(resultOf(scripts_.shell("echo error; exit 0")), 0);
    EXPECT_EQ(resultOf(scripts_.shell("echo done; exit 1")), 1);
}

} // namespace

// SPDX-License-Identifier: MIT
#include <chrono>
#include <csignal>
#include <filesystem>
#include <string>
#include <system_error>

#include <gtest/gtest.h>

#include "support/Command.hpp"
#include "support/Descriptors.hpp"
#include "support/TemporaryFolder.hpp"

namespace
{

using vclink::test::Command;
using namespace std::chrono_literals;

TEST(Command, TellsTheStreamsApartTheExitStatusAndTheSignal)
{
    const auto good = Command({"sh", "-c", "echo out; echo err >&2"}).run();
    EXPECT_EQ(good.output, "out\n");
    EXPECT_EQ(good.errors, "err\n");
    EXPECT_TRUE(good.succeeded());
    const auto failed = Command({"sh", "-c", "exit 3"}).run();
    EXPECT_EQ(failed.exitStatus, 3);
    EXPECT_EQ(failed.signal, 0);
    EXPECT_FALSE(failed.succeeded());
    const auto killed = Command({"sh", "-c", "kill -TERM $$"}).run();
    EXPECT_EQ(killed.signal, SIGTERM);
    EXPECT_EQ(killed.exitStatus, -1);
    EXPECT_FALSE(killed.succeeded());
}

TEST(Command, HandsArgumentsInputVariablesAndFolderOverAsTheyAre)
{
    const std::string odd = "a b\"c'$HOME\\\n\xff";
    EXPECT_EQ(Command({"printf", "%s", odd}).run().output, odd);
    std::string bytes;
    for (int index = 0; index < 300'000; ++index)
        bytes.push_back(static_cast<char>(index * 7 % 256));
    EXPECT_EQ(Command({"cat"}).input(bytes).run().output, bytes);
    EXPECT_EQ(Command({"cat"}).run().output, "");
    EXPECT_EQ(Command({"sh", "-c", "echo \"$VCLINK_ONE-${HOME-unset}\""})
                  .environment("VCLINK_ONE", "1")
                  .withoutEnvironment("HOME")
                  .run()
                  .output,
              "1-unset\n");
    const vclink::test::TemporaryFolder folder;
    EXPECT_EQ(Command({"pwd", "-P"}).in(folder.path()).run().output, folder.path().string() + "\n");
}

TEST(Command, KillsWhatTakesTooLongWithItsChildren)
{
    const vclink::test::TemporaryFolder folder;
    const auto start = std::chrono::steady_clock::now();
    const auto result = Command({"sh", "-c", "(sleep 1; touch late) & wait"})
                            .in(folder.path())
                            .timeout(200ms)
                            .run();
    EXPECT_TRUE(result.timedOut);
    EXPECT_EQ(result.signal, SIGKILL);
    EXPECT_LT(std::chrono::steady_clock::now() - start, 1s);
    Command({"sleep", "1.2"}).run();
    EXPECT_FALSE(std::filesystem::exists(folder / "late"));
}

TEST(Command, DoesNotWaitForAChildThatTheProgramLeavesBehind)
{
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(Command({"sh", "-c", "sleep 3 & echo done"}).run().output, "done\n");
    EXPECT_LT(std::chrono::steady_clock::now() - start, 3s);
}

TEST(Command, RaisesWhenTheProgramOrTheFolderIsMissingAndLeavesNoDescriptorOpen)
{
    const vclink::test::NoDescriptorLeak check;
    EXPECT_TRUE(Command({"true"}).run().succeeded());
    EXPECT_THROW(Command({"vclink-no-such-program"}).run(), std::system_error);
    EXPECT_THROW(Command({"true"}).in("/nonexistent").run(), std::system_error);
}

} // namespace

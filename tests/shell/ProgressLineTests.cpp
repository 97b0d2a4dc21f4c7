// SPDX-License-Identifier: MIT
#include <atomic>
#include <chrono>
#include <iostream>
#include <string>
#include <thread>

#include <gtest/gtest.h>

#include "examples/shell/ProgressLine.hpp"
#include "examples/shell/TerminalProgressReporter.hpp"
#include "support/text.hpp"

namespace vclink::test
{
namespace
{

const std::string takeLineAway = "\r\33[K";

class ProgressLine : public testing::Test
{
  protected:
    /// What is written to standard error, which is a file here, so that a line has 79 columns.
    template <class Action> static std::string written(Action action)
    {
        testing::internal::CaptureStderr();
        action();
        return testing::internal::GetCapturedStderr();
    }
};

TEST_F(ProgressLine, HasABarTheShareAndTheMessage)
{
    const struct
    {
        double fraction;
        std::string shown;
    } cases[] = {
        {0.0, "[--------------------]   0% file"},   {0.049, "[--------------------]   4% file"},
        {0.05, "[#-------------------]   5% file"},  {0.5, "[##########----------]  50% file"},
        {0.999, "[###################-]  99% file"}, {1.0, "[####################] 100% file"},
        {-1.0, "[--------------------]   0% file"},  {7.0, "[####################] 100% file"},
    };
    for (const auto &[fraction, shown] : cases)
        EXPECT_EQ(shell::composeProgress(fraction, u"file", 79), shown);
}

TEST_F(ProgressLine, CutsTheBeginningOfAMessageThatIsTooLong)
{
    const std::string bar = "[##########----------]  50% ";
    EXPECT_EQ(shell::composeProgress(0.5, u"0123456789", 38), bar + "0123456789");
    EXPECT_EQ(shell::composeProgress(0.5, u"0123456789", 37), bar + "...456789");
    EXPECT_EQ(shell::composeProgress(0.5, u"0123456789", 31), bar + "...");
    EXPECT_EQ(shell::composeProgress(0.5, u"0123456789", 30), bar);
    EXPECT_EQ(shell::composeProgress(0.5, u"0123456789", 28), bar);
}

TEST_F(ProgressLine, LeavesTheBarOutWhereThereIsNoRoom)
{
    EXPECT_EQ(shell::composeProgress(0.5, u"0123456789", 14), "50% 0123456789");
    EXPECT_EQ(shell::composeProgress(0.5, u"0123456789", 13), "50% ...456789");
    EXPECT_EQ(shell::composeProgress(0.5, u"0123456789", 4), "50% ");
    EXPECT_EQ(shell::composeProgress(0.5, u"0123456789", 3), "...");
    EXPECT_EQ(shell::composeProgress(0.5, u"0123456789", 0), "");
}

TEST_F(ProgressLine, ReckonsWithCharactersThatTakeTwoColumns)
{
    const std::string bar = "[##########----------]  50% ";
    EXPECT_EQ(shell::composeProgress(0.5, u"日本語日本語", 40), bar + "日本語日本語");
    EXPECT_EQ(shell::composeProgress(0.5, u"日本語日本語", 39), bar + "...語日本語");
    EXPECT_EQ(shell::composeProgress(0.5, u"日本語日本語", 38), bar + "...日本語");
}

TEST_F(ProgressLine, NeverCutsACharacterInTwo)
{
    const std::string bar = "[##########----------]  50% ";
    for (std::size_t columns = 28; columns < 60; ++columns)
    {
        const std::string line = shell::composeProgress(0.5, u"🌍🌍🌍🌍🌍🌍🌍🌍", columns);
        std::string rest = line.substr(line.find_last_of(". ") + 1);
        EXPECT_EQ(rest.size() % 4, 0U) << columns;
        EXPECT_EQ(asUtf8(asUtf16(rest)), rest) << columns;
    }
}

TEST_F(ProgressLine, StaysOnItsLineWhateverTheMessageHolds)
{
    EXPECT_EQ(shell::composeProgress(0, u"a\nb\t\33[2J", 79),
              "[--------------------]   0% a\\nb\\t\\033[2J");
}

TEST_F(ProgressLine, IsTakenAwayAtItsEnd)
{
    const std::string text = written(
        []
        {
            shell::ProgressLine line(true);
            line.draw(0.5, u"file");
        });
    EXPECT_EQ(text, takeLineAway + "[##########----------]  50% file" + takeLineAway);
}

TEST_F(ProgressLine, IsTakenAwayOnlyOnceAndOnlyWhenItIsThere)
{
    const std::string text = written(
        []
        {
            shell::ProgressLine line(true);
            line.clear();
            line.draw(0.5, u"file");
            line.clear();
            line.clear();
        });
    EXPECT_EQ(text, takeLineAway + "[##########----------]  50% file" + takeLineAway);
}

TEST_F(ProgressLine, IsNotDrawnIntoWhatIsWrittenInItsPlace)
{
    const std::string told = "It is told.\n";
    std::string text = written(
        [&told]
        {
            shell::ProgressLine line(true);
            std::atomic<int> drawn{0};
            std::atomic<bool> isOver{false};
            std::thread drawing(
                [&]
                {
                    for (; !isOver; ++drawn)
                        line.draw(0.5, u"file");
                });
            while (drawn == 0)
                std::this_thread::yield();
            for (int time = 0; time < 20; ++time)
                line.clearFor(
                    [&told]
                    {
                        for (const char letter : told)
                        {
                            std::cerr << letter << std::flush;
                            std::this_thread::yield();
                        }
                    });
            isOver = true;
            drawing.join();
        });
    int times = 0;
    for (auto at = text.find(told); at != std::string::npos; at = text.find(told, at + 1))
    {
        const std::string before = text.substr(0, at);
        const auto endsWith = [&before](const std::string &end)
        { return before.size() >= end.size() && before.substr(before.size() - end.size()) == end; };
        EXPECT_TRUE(endsWith(takeLineAway) || endsWith("\n")) << before;
        ++times;
    }
    EXPECT_EQ(times, 20);
}

TEST_F(ProgressLine, IsNeverDrawnWhereItIsNotShown)
{
    EXPECT_EQ(written(
                  []
                  {
                      shell::ProgressLine line(false);
                      line.draw(0.5, u"file");
                      line.clear();
                  }),
              "");
}

TEST_F(ProgressLine, IsDrawnByTheReporterAtMostTwentyTimesASecond)
{
    using Clock = std::chrono::steady_clock;
    shell::Activity activity;
    int reports = 0;
    const auto start = Clock::now();
    const std::string text = written(
        [&]
        {
            shell::ProgressLine line(true);
            shell::TerminalProgressReporter reporter(line, activity);
            while (Clock::now() - start < std::chrono::milliseconds(300))
            {
                reporter.setProgress(0.25);
                reporter.setProgressMessage(u"file");
                ++reports;
            }
        });
    const std::chrono::duration<double> time = Clock::now() - start;
    const std::string drawing = takeLineAway + "[#####---------------]  25% file";
    ASSERT_EQ((text.size() - takeLineAway.size()) % drawing.size(), 0U) << text;
    const std::size_t drawn = text.size() / drawing.size();
    EXPECT_GE(drawn, 1U);
    EXPECT_LE(static_cast<double>(drawn), time.count() * 20 + 1);
    EXPECT_GT(reports, 100);
}

shell::Activity::Clock::time_point timeOfActivity{};

TEST_F(ProgressLine, TellsTheActivityOfEveryReport)
{
    using namespace std::chrono_literals;
    shell::Activity activity([] { return timeOfActivity; });
    shell::ProgressLine line(false);
    shell::TerminalProgressReporter reporter(line, activity);
    timeOfActivity += 5s;
    EXPECT_EQ(activity.quiet(), 5s);
    reporter.setProgress(0);
    EXPECT_EQ(activity.quiet(), 0s);
    timeOfActivity += 2s;
    reporter.setProgressMessage(u"file");
    EXPECT_EQ(activity.quiet(), 0s);
}

} // namespace
} // namespace vclink::test

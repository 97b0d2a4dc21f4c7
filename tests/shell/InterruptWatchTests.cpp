// SPDX-License-Identifier: MIT
#include <array>
#include <atomic>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include <fcntl.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include "examples/shell/InterruptWatch.hpp"
#include "support/Descriptors.hpp"
#include "vclink/PollableTerminator.hpp"

namespace vclink::test
{
namespace
{

using namespace std::chrono_literals;

void (*handlerOf(int signal))(int)
{
    struct sigaction action = {};
    ::sigaction(signal, nullptr, &action);
    return action.sa_handler;
}

void (*handlerOfInterrupt())(int)
{
    return handlerOf(SIGINT);
}

const std::array<int, 3> watched{SIGINT, SIGTERM, SIGHUP};

/// A handler that is not the default.
void otherHandler(int /*signal*/)
{
}

/// Waits until `isTrue`, but not for ever.
template <class Condition> bool waitUntil(Condition isTrue)
{
    const auto end = std::chrono::steady_clock::now() + 30s;
    while (!isTrue())
    {
        if (std::chrono::steady_clock::now() > end)
            return false;
        std::this_thread::yield();
    }
    return true;
}

std::atomic<shell::Activity::Clock::rep> ticks{0};
/// Whether the clock, which the watch reads before it gives up, stops until its end has begun.
std::atomic<bool> standsUntilRestored{false};

shell::Activity::Clock::time_point readTicks()
{
    if (standsUntilRestored)
        waitUntil([] { return handlerOfInterrupt() == otherHandler; });
    return shell::Activity::Clock::time_point(shell::Activity::Clock::duration(ticks.load()));
}

void pass(std::chrono::milliseconds time)
{
    ticks += std::chrono::duration_cast<shell::Activity::Clock::duration>(time).count();
}

TEST(Pipe, HoldsNoWriterUpWhenItIsFull)
{
    const shell::Pipe pipe;
    const std::vector<char> block(65'536);
    ssize_t written = 0;
    for (int time = 0; time < 1000 && written >= 0; ++time)
        written = ::write(pipe.writeEnd(), block.data(), block.size());
    EXPECT_EQ(written, -1);
    EXPECT_EQ(errno, EAGAIN);
}

TEST(Pipe, IsNotInherited)
{
    const shell::Pipe pipe;
    EXPECT_EQ(::fcntl(pipe.readEnd(), F_GETFD), FD_CLOEXEC);
    EXPECT_EQ(::fcntl(pipe.writeEnd(), F_GETFD), FD_CLOEXEC);
}

class InterruptWatch : public testing::Test
{
  protected:
    InterruptWatch()
    {
        for (std::size_t index = 0; index < watched.size(); ++index)
        {
            ::sigaction(watched[index], nullptr, &previous_[index]);
            std::signal(watched[index], SIG_DFL);
        }
    }
    ~InterruptWatch() override
    {
        standsUntilRestored = false;
        for (std::size_t index = 0; index < watched.size(); ++index)
            ::sigaction(watched[index], &previous_[index], nullptr);
    }

    /// Watches while `action` runs; all signals have been answered after that.
    template <class Action> void watch(Action action)
    {
        shell::InterruptWatch watch(terminator_, activity_,
                                    [this](const std::string &reason)
                                    {
                                        reason_ = reason;
                                        handlerThen_ = handlerOfInterrupt();
                                        ++givenUp_;
                                    });
        action(watch);
    }
    /// Presses Ctrl-C, and waits until it is answered. Only the first can be seen from outside.
    void pressFirst(const shell::InterruptWatch &watch, int signal = SIGINT)
    {
        std::raise(signal);
        EXPECT_TRUE(waitUntil([this] { return poller_.checkAndResetCancelledState(); }));
        EXPECT_EQ(watch.askedBy(), signal);
    }

    Terminator terminator_;
    PollableTerminator poller_{terminator_};
    shell::Activity activity_{&readTicks};
    std::atomic<int> givenUp_{0};
    std::string reason_;
    void (*handlerThen_)(int) = SIG_ERR;

  private:
    std::array<struct sigaction, watched.size()> previous_{};
};

TEST_F(InterruptWatch, AsksOnTheTerminatorAtTheFirst)
{
    for (const int signal : watched)
    {
        watch(
            [this, signal](const shell::InterruptWatch &watch)
            {
                EXPECT_EQ(watch.askedBy(), 0);
                pressFirst(watch, signal);
            });
        EXPECT_EQ(givenUp_, 0);
    }
}

TEST_F(InterruptWatch, NamesTheSignalThatWantsTheProcessToEndBeforeCtrlC)
{
    for (const auto &[first, second] : {std::pair(SIGINT, SIGTERM), std::pair(SIGTERM, SIGINT)})
    {
        shell::InterruptWatch watch(terminator_, activity_, [](const std::string &) {});
        pressFirst(watch, first);
        std::raise(second);
        watch.end();
        EXPECT_EQ(watch.askedBy(), SIGTERM);
    }
}

TEST_F(InterruptWatch, HasAnsweredAtItsEndWhateverCameBefore)
{
    for (int time = 0; time < 200; ++time)
    {
        shell::InterruptWatch watch(terminator_, activity_, [](const std::string &) {});
        std::raise(SIGTERM);
        watch.end();
        ASSERT_EQ(watch.askedBy(), SIGTERM);
    }
}

TEST_F(InterruptWatch, AsksOnlyOnce)
{
    watch(
        [this](const shell::InterruptWatch &watch)
        {
            pressFirst(watch);
            for (int time = 0; time < 10; ++time)
                std::raise(SIGINT);
        });
    EXPECT_FALSE(poller_.checkAndResetCancelledState());
    EXPECT_EQ(givenUp_, 0);
}

TEST_F(InterruptWatch, RestoresTheDefaultWhenNothingWasHeardForThreeSeconds)
{
    std::signal(SIGINT, otherHandler);
    std::signal(SIGHUP, SIG_IGN);
    watch(
        [this](const shell::InterruptWatch &watch)
        {
            pressFirst(watch);
            pass(3s);
            std::raise(SIGINT);
            ASSERT_TRUE(waitUntil([this] { return givenUp_ == 1; }));
            EXPECT_EQ(handlerThen_, SIG_DFL);
            EXPECT_EQ(handlerOf(SIGTERM), SIG_DFL);
            EXPECT_EQ(handlerOf(SIGHUP), SIG_IGN);
            EXPECT_EQ(reason_, "The operation makes no progress.");
        });
    EXPECT_EQ(handlerOfInterrupt(), otherHandler);
}

TEST_F(InterruptWatch, RestoresWhatStoodBeforeWhereTheLastIsAnsweredAtItsEnd)
{
    std::signal(SIGINT, otherHandler);
    watch(
        [this](const shell::InterruptWatch &watch)
        {
            pressFirst(watch);
            pass(3s);
            standsUntilRestored = true;
            std::raise(SIGINT);
        });
    EXPECT_EQ(givenUp_, 1);
    EXPECT_EQ(handlerThen_, SIG_DFL);
    EXPECT_EQ(handlerOfInterrupt(), otherHandler);
}

std::atomic<bool> otherSignalCame{false};

TEST_F(InterruptWatch, GoesOnAfterAnotherSignal)
{
    struct sigaction action = {};
    struct sigaction before = {};
    action.sa_handler = [](int /*signal*/) { otherSignalCame = true; };
    ::sigaction(SIGUSR1, &action, &before);
    watch(
        [this](const shell::InterruptWatch &watch)
        {
            // Only the watch's own thread is left to take it.
            sigset_t other;
            sigset_t mask;
            ::sigemptyset(&other);
            ::sigaddset(&other, SIGUSR1);
            ::pthread_sigmask(SIG_BLOCK, &other, &mask);
            // More than one, as the first may come before it reads.
            for (int time = 0; time < 20; ++time)
            {
                otherSignalCame = false;
                ASSERT_TRUE(waitUntil(
                    []
                    {
                        ::kill(::getpid(), SIGUSR1);
                        return otherSignalCame.load();
                    }));
            }
            ::pthread_sigmask(SIG_SETMASK, &mask, nullptr);
            pressFirst(watch);
        });
    ::sigaction(SIGUSR1, &before, nullptr);
}

TEST_F(InterruptWatch, ChangesNothingBeforeThreeSecondsAreOver)
{
    watch(
        [this](const shell::InterruptWatch &watch)
        {
            // Quiet before the first, which counts from there.
            pass(10s);
            pressFirst(watch);
            pass(2999ms);
            std::raise(SIGINT);
        });
    EXPECT_EQ(givenUp_, 0);
}

TEST_F(InterruptWatch, ChangesNothingWhileTheBackEndIsHeardOf)
{
    watch(
        [this](const shell::InterruptWatch &watch)
        {
            pressFirst(watch);
            for (int time = 0; time < 5; ++time)
            {
                pass(2s);
                activity_.note();
                std::raise(SIGINT);
            }
        });
    EXPECT_EQ(givenUp_, 0);
}

TEST_F(InterruptWatch, RestoresWhatStoodBeforeAtItsEnd)
{
    for (const int signal : watched)
    {
        for (void (*const handler)(int) : {SIG_DFL, otherHandler})
        {
            std::signal(signal, handler);
            watch([&](const shell::InterruptWatch &) { EXPECT_NE(handlerOf(signal), handler); });
            EXPECT_EQ(handlerOf(signal), handler);
        }
    }
}

TEST_F(InterruptWatch, LeavesASignalIgnoredWhereItWasAndTakesTheOthers)
{
    std::signal(SIGINT, SIG_IGN);
    watch(
        [this](const shell::InterruptWatch &watch)
        {
            std::raise(SIGINT);
            EXPECT_EQ(handlerOfInterrupt(), SIG_IGN);
            EXPECT_EQ(watch.askedBy(), 0);
            pressFirst(watch, SIGHUP);
        });
    EXPECT_EQ(handlerOfInterrupt(), SIG_IGN);
    EXPECT_FALSE(poller_.checkAndResetCancelledState());
}

TEST_F(InterruptWatch, BlocksNoSignalWhereItIsMade)
{
    watch(
        [](const shell::InterruptWatch &)
        {
            sigset_t blocked;
            ::pthread_sigmask(SIG_SETMASK, nullptr, &blocked);
            for (const int signal : watched)
                EXPECT_EQ(::sigismember(&blocked, signal), 0);
        });
}

TEST_F(InterruptWatch, LeavesNoDescriptorOpen)
{
    const auto before = openDescriptors();
    watch([](const shell::InterruptWatch &) {});
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace
} // namespace vclink::test

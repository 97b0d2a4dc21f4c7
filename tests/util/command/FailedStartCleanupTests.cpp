// SPDX-License-Identifier: MIT
#include <array>
#include <csignal>
#include <cstdlib>
#include <future>
#include <optional>
#include <thread>
#include <vector>

#include <fcntl.h>
#include <gtest/gtest.h>
#include <poll.h>
#include <sys/wait.h>
#include <unistd.h>

#include "support/DescriptorLimit.hpp"
#include "support/NothingLeft.hpp"
#include "util/command/FailedStartCleanup.hpp"

namespace
{

using vclink::git::FailedStartCleanup;
using namespace vclink::test;

/// The two ends of a pipe, closed at the end unless they are closed already.
class FailedStartCleanupTest : public testing::Test
{
  protected:
    FailedStartCleanupTest()
    {
        EXPECT_EQ(::pipe2(ends_.data(), O_CLOEXEC), 0);
    }
    ~FailedStartCleanupTest() override
    {
        for (const int end : ends_)
        {
            if (isOpen(end))
                ::close(end);
        }
        EXPECT_FALSE(hasChildren());
    }
    static bool isOpen(int descriptor)
    {
        return ::fcntl(descriptor, F_GETFD) >= 0;
    }
    int source() const
    {
        return ends_[0];
    }
    int sink() const
    {
        return ends_[1];
    }
    /// A child that ends at once.
    static pid_t makeChild(int status)
    {
        const pid_t child = ::fork();
        if (child == 0)
            ::_exit(status);
        return child;
    }
    /// Waits until a child has ended, and leaves it.
    static void awaitEnd(pid_t child)
    {
        siginfo_t info = {};
        EXPECT_EQ(::waitid(P_PID, static_cast<id_t>(child), &info, WEXITED | WNOWAIT), 0);
    }

  private:
    std::array<int, 2> ends_{-1, -1};
};

TEST_F(FailedStartCleanupTest, ClosesTheWritingEndWhenNothingHasStarted)
{
    {
        const FailedStartCleanup guard(source(), sink());
        EXPECT_TRUE(isOpen(sink()));
    }
    EXPECT_FALSE(isOpen(sink()));
    EXPECT_TRUE(isOpen(source()));
}

TEST_F(FailedStartCleanupTest, LeavesAnEndThatIsClosedOrANumberThatIsAnotherFilesOrPipesByThen)
{
    const auto expectLeaves = [](const auto &change)
    {
        std::array<int, 2> ends{-1, -1};
        EXPECT_EQ(::pipe2(ends.data(), O_CLOEXEC), 0);
        std::optional<FailedStartCleanup> guard(std::in_place, ends[0], ends[1]);
        ::close(ends[1]);
        change(ends[1]);
        const bool wasOpen = isOpen(ends[1]);
        guard.reset();
        EXPECT_EQ(isOpen(ends[1]), wasOpen);
        EXPECT_TRUE(isOpen(ends[0]));
        ::close(ends[0]);
        ::close(ends[1]);
    };
    expectLeaves([](int) {});
    expectLeaves([](int writing)
                 { EXPECT_EQ(::open("/dev/null", O_RDONLY | O_CLOEXEC), writing); });
    std::array<int, 2> other{-1, -1};
    expectLeaves(
        [&other](int writing)
        {
            EXPECT_EQ(::pipe2(other.data(), O_CLOEXEC), 0);
            EXPECT_EQ(other[0], writing);
        });
    EXPECT_TRUE(isOpen(other[1]));
    ::close(other[1]);
}

TEST_F(FailedStartCleanupTest, WaitsForTheChildThatCouldNotBecomeTheCommandHoweverLate)
{
    for (const int milliseconds : {0, 20})
    {
        {
            const FailedStartCleanup guard(source(), sink());
            const pid_t child = ::fork();
            if (child == 0)
            {
                ::poll(nullptr, 0, milliseconds);
                ::_exit(EXIT_FAILURE);
            }
            EXPECT_TRUE(hasChildren());
        }
        EXPECT_FALSE(hasChildren());
    }
}

TEST_F(FailedStartCleanupTest, LeavesChildrenThatCouldNotBeListedBefore)
{
    const pid_t earlier = makeChild(EXIT_FAILURE);
    awaitEnd(earlier);
    const int reading = source();
    const int writing = sink();
    {
        std::optional<DescriptorLimit> none(0);
        const FailedStartCleanup guard(reading, writing);
        none.reset();
    }
    EXPECT_EQ(::waitpid(earlier, nullptr, WNOHANG), earlier);
}

TEST_F(FailedStartCleanupTest, LeavesChildrenThatCannotBeListedAfterwards)
{
    pid_t child = 0;
    std::optional<DescriptorLimit> none;
    {
        const FailedStartCleanup guard(source(), sink());
        child = makeChild(EXIT_FAILURE);
        none.emplace(0);
    }
    none.reset();
    EXPECT_EQ(::waitpid(child, nullptr, 0), child);
}

TEST_F(FailedStartCleanupTest, LeavesAnyNumberOfChildrenThatWereThereBefore)
{
    std::vector<pid_t> earlier;
    // Their list is longer than one reading of it.
    for (int i = 0; i < 100; ++i)
    {
        earlier.push_back(makeChild(EXIT_FAILURE));
        awaitEnd(earlier.back());
    }
    pid_t last = 0;
    {
        const FailedStartCleanup guard(source(), sink());
        last = makeChild(EXIT_FAILURE);
    }
    EXPECT_EQ(::waitpid(last, nullptr, WNOHANG), -1);
    int status = 0;
    for (const pid_t child : earlier)
        EXPECT_EQ(::waitpid(child, &status, WNOHANG), child);
    EXPECT_EQ(WEXITSTATUS(status), EXIT_FAILURE);
}

TEST_F(FailedStartCleanupTest, LeavesAChildThatEndsInAnotherWay)
{
    pid_t other = 0;
    {
        const FailedStartCleanup guard(source(), sink());
        other = makeChild(0);
    }
    EXPECT_EQ(::waitpid(other, nullptr, 0), other);
}

TEST_F(FailedStartCleanupTest, LeavesTheChildrenOfOtherThreads)
{
    std::promise<pid_t> made;
    std::promise<void> done;
    std::thread other;
    pid_t foreign = 0;
    {
        const FailedStartCleanup guard(source(), sink());
        // A thread that goes on living keeps its children.
        other = std::thread(
            [&made, &done]
            {
                const pid_t child = makeChild(EXIT_FAILURE);
                awaitEnd(child);
                made.set_value(child);
                done.get_future().wait();
            });
        foreign = made.get_future().get();
        makeChild(EXIT_FAILURE);
    }
    EXPECT_EQ(::waitpid(foreign, nullptr, WNOHANG), foreign);
    EXPECT_FALSE(hasChildren());
    done.set_value();
    other.join();
}

TEST_F(FailedStartCleanupTest, LeavesChildrenThatItCannotTellFromOneAnother)
{
    std::array<pid_t, 2> children{};
    {
        const FailedStartCleanup guard(source(), sink());
        for (pid_t &child : children)
            child = makeChild(EXIT_FAILURE);
    }
    for (const pid_t child : children)
        EXPECT_EQ(::waitpid(child, nullptr, 0), child);
}

TEST_F(FailedStartCleanupTest, WaitsForAStartedChildThatWasKilled)
{
    {
        FailedStartCleanup guard(source(), sink());
        const pid_t child = ::fork();
        if (child == 0)
        {
            for (;;)
                ::pause();
        }
        guard.hasStarted(child);
        ::kill(child, SIGKILL);
    }
    EXPECT_FALSE(hasChildren());
    EXPECT_TRUE(isOpen(sink()));
}

TEST_F(FailedStartCleanupTest, LeavesEverythingWhenTheCommandHasEnded)
{
    pid_t child = 0;
    {
        FailedStartCleanup guard(source(), sink());
        child = makeChild(EXIT_FAILURE);
        guard.hasStarted(child);
        guard.hasEnded();
    }
    EXPECT_TRUE(isOpen(sink()));
    EXPECT_EQ(::waitpid(child, nullptr, 0), child);
}

TEST_F(FailedStartCleanupTest, IsContentWhenTheStatusOfTheChildIsGone)
{
    FailedStartCleanup guard(source(), sink());
    const pid_t child = makeChild(0);
    guard.hasStarted(child);
    EXPECT_EQ(::waitpid(child, nullptr, 0), child);
}

} // namespace

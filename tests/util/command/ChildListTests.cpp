// SPDX-License-Identifier: MIT
// The list of a thread's children, where the system opens it and then can't read it.
#include <array>
#include <cerrno>
#include <cstdlib>

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include "support/NothingLeft.hpp"
#include "support/interposition.hpp"
#include "util/command/FailedStartCleanup.hpp"

namespace
{

/// What the next calls of read(2) fail with, and how many.
int readError = 0;
int failingReads = 0;

} // namespace

extern "C" ssize_t read(int descriptor, void *buffer, size_t size)
{
    static auto *const realRead = vclink::test::findNext<ssize_t(int, void *, size_t)>("read");
    if (failingReads == 0)
        return realRead(descriptor, buffer, size);
    --failingReads;
    errno = readError;
    return -1;
}

namespace
{

using vclink::git::FailedStartCleanup;
using vclink::test::hasChildren;

/// A child that has ended like one that could not become the command, and the ends of a pipe.
class ChildList : public testing::Test
{
  protected:
    ChildList()
    {
        EXPECT_EQ(::pipe2(ends_.data(), O_CLOEXEC), 0);
    }
    ~ChildList() override
    {
        ::close(ends_[0]);
        EXPECT_FALSE(hasChildren());
    }
    /// Makes a child while a guard is there whose readings of the list fail as told.
    /// @return the child
    pid_t guardAChild(int failuresBefore, int failuresAfterwards, int error)
    {
        readError = error;
        failingReads = failuresBefore;
        const FailedStartCleanup guard(ends_[0], ends_[1]);
        EXPECT_EQ(failingReads, 0);
        const pid_t child = ::fork();
        if (child == 0)
            ::_exit(EXIT_FAILURE);
        siginfo_t info = {};
        EXPECT_EQ(::waitid(P_PID, static_cast<id_t>(child), &info, WEXITED | WNOWAIT), 0);
        failingReads = failuresAfterwards;
        return child;
    }

  private:
    std::array<int, 2> ends_{-1, -1};
};

TEST_F(ChildList, ThatCannotBeReadBeforeLeavesTheChild)
{
    const pid_t child = guardAChild(1, 0, EIO);
    EXPECT_EQ(::waitpid(child, nullptr, 0), child);
}

TEST_F(ChildList, ThatCannotBeReadAfterwardsLeavesTheChild)
{
    const pid_t child = guardAChild(0, 1, EIO);
    EXPECT_EQ(::waitpid(child, nullptr, 0), child);
}

TEST_F(ChildList, IsReadAgainWhereASignalBrokeIn)
{
    guardAChild(2, 3, EINTR);
    EXPECT_EQ(failingReads, 0);
    EXPECT_FALSE(hasChildren());
}

} // namespace

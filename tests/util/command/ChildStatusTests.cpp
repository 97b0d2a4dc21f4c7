// SPDX-License-Identifier: MIT
#include <array>
#include <cerrno>
#include <csignal>
#include <system_error>

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include "support/NothingLeft.hpp"
#include "support/SignalAction.hpp"
#include "util/command/ChildStatus.hpp"

namespace
{

using vclink::git::ChildStatus;
using vclink::git::isChildStatusKept;
using namespace vclink::test;

/// A child that ends when it is told to, and is waited for at the latest at the end.
class Child
{
  public:
    /// @param end is run in the child, once it is let go
    template <class End> explicit Child(End end)
    {
        EXPECT_EQ(::pipe(ends_.data()), 0);
        process_ = ::fork();
        if (process_ == 0)
        {
            ::close(ends_[1]);
            char byte = 0;
            const auto count = ::read(ends_[0], &byte, 1);
            end();
            ::_exit(count == 0 ? 0 : 1);
        }
        ::close(ends_[0]);
    }
    Child(const Child &) = delete;
    Child &operator=(const Child &) = delete;
    ~Child()
    {
        letGo();
        ::waitpid(process_, nullptr, 0);
        EXPECT_FALSE(hasChildren());
    }
    void letGo()
    {
        if (ends_[1] >= 0)
            ::close(ends_[1]);
        ends_[1] = -1;
    }
    /// Takes its status, as any code of the process may.
    int take() const
    {
        int status = 0;
        return ::waitpid(process_, &status, 0) == process_ ? status : -1;
    }
    pid_t process() const noexcept
    {
        return process_;
    }

  private:
    std::array<int, 2> ends_{-1, -1};
    pid_t process_ = -1;
};

auto exitWith(int status)
{
    return [status] { ::_exit(status); };
}

/// The status of a child that is let go, told without an error.
int waitFor(Child &child)
{
    child.letGo();
    std::error_code error;
    const int status = ChildStatus(child.process()).wait(error);
    EXPECT_FALSE(error) << error.message();
    return status;
}

TEST(ChildStatus, IsTheExitStatus)
{
    for (const int status : {0, 1, 2, 127, 255})
    {
        Child child(exitWith(status));
        EXPECT_EQ(waitFor(child), status);
    }
}

TEST(ChildStatus, IsTheNumberOfTheSignal)
{
    for (const int signal : {SIGKILL, SIGTERM, SIGPIPE})
    {
        Child child(
            [signal]
            {
                ::signal(signal, SIG_DFL);
                ::raise(signal);
            });
        EXPECT_EQ(waitFor(child), signal);
    }
}

TEST(ChildStatus, TellsWhetherTheChildRunsAndLeavesItToItsOwner)
{
    Child child(exitWith(3));
    ChildStatus status(child.process());
    std::error_code error;
    EXPECT_TRUE(status.isRunning(error));
    EXPECT_TRUE(status.isRunning(error));
    child.letGo();
    EXPECT_EQ(status.wait(error), 3);
    EXPECT_FALSE(status.isRunning(error));
    const int taken = child.take();
    EXPECT_TRUE(WIFEXITED(taken));
    EXPECT_EQ(WEXITSTATUS(taken), 3);
    // It stays known.
    EXPECT_EQ(status.wait(error), 3);
    EXPECT_FALSE(status.isRunning(error));
    EXPECT_FALSE(error);
}

TEST(ChildStatus, IsAnErrorWhenAnotherHasTakenIt)
{
    Child child(exitWith(0));
    child.letGo();
    child.take();
    ChildStatus status(child.process());
    std::error_code error;
    EXPECT_FALSE(status.isRunning(error));
    EXPECT_EQ(error, std::error_code(ECHILD, std::system_category()));
    error.clear();
    EXPECT_NE(status.wait(error), 0);
    EXPECT_EQ(error, std::error_code(ECHILD, std::system_category()));
}

TEST(ChildStatus, IsAnErrorWhenTheSystemThrowsItAway)
{
    const SignalAction ignored(SIGCHLD, SIG_IGN);
    Child child(exitWith(0));
    child.letGo();
    std::error_code error;
    EXPECT_NE(ChildStatus(child.process()).wait(error), 0);
    EXPECT_EQ(error, std::error_code(ECHILD, std::system_category()));
}

TEST(ChildStatus, IsNotToldOfAStoppedChild)
{
    Child child([] { ::raise(SIGSTOP); });
    ChildStatus status(child.process());
    child.letGo();
    EXPECT_EQ(::waitpid(child.process(), nullptr, WUNTRACED), child.process());
    std::error_code error;
    EXPECT_TRUE(status.isRunning(error));
    ::kill(child.process(), SIGCONT);
    EXPECT_EQ(status.wait(error), 0);
    EXPECT_FALSE(error);
}

TEST(IsChildStatusKept, IsSoByDefaultAndWithAHandler)
{
    const SignalAction usual(SIGCHLD, SIG_DFL);
    EXPECT_TRUE(isChildStatusKept());
    const SignalAction handled(SIGCHLD, [](int) {});
    EXPECT_TRUE(isChildStatusKept());
    const SignalAction notStopped(SIGCHLD, SIG_DFL, SA_NOCLDSTOP);
    EXPECT_TRUE(isChildStatusKept());
}

TEST(IsChildStatusKept, IsNotSoWhenTheProcessIgnoresItsChildren)
{
    {
        const SignalAction ignored(SIGCHLD, SIG_IGN);
        EXPECT_FALSE(isChildStatusKept());
    }
    {
        const SignalAction notKept(SIGCHLD, SIG_DFL, SA_NOCLDWAIT);
        EXPECT_FALSE(isChildStatusKept());
    }
    {
        const SignalAction notKept(
            SIGCHLD, [](int) {}, SA_NOCLDWAIT);
        EXPECT_FALSE(isChildStatusKept());
    }
    EXPECT_TRUE(isChildStatusKept());
}

} // namespace

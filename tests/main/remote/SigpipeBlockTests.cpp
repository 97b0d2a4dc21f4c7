// SPDX-License-Identifier: MIT
#include "main/remote/SigpipeBlock.hpp"

#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <future>
#include <system_error>
#include <thread>

#include <gtest/gtest.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include "support/Descriptor.hpp"
#include "support/SignalAction.hpp"

namespace vclink::git
{
namespace
{

using test::Descriptor;

/// A connection over loopback that the other side has reset, like a server that ends with unread
/// data.
class ResetConnection
{
  public:
    ResetConnection()
    {
        auto *const generic = reinterpret_cast<sockaddr *>(&address_);
        address_.sin_family = AF_INET;
        address_.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        check(::bind(listener_.get(), generic, length_));
        check(::listen(listener_.get(), 1));
        check(::getsockname(listener_.get(), generic, &length_));
        check(::connect(client_.get(), generic, length_));
        const auto accepted =
            Descriptor::checked(::accept(listener_.get(), nullptr, nullptr), "accept");
        const linger reset = {1, 0};
        check(::setsockopt(accepted.get(), SOL_SOCKET, SO_LINGER, &reset, sizeof(reset)));
    }

    /// Writes until the connection is known to be broken.
    /// @return the last error
    int writeUntilBroken() const
    {
        pollfd end{client_.get(), POLLIN, 0};
        ::poll(&end, 1, 30'000);
        int error = 0;
        for (int attempt = 0; attempt < 10 && error != EPIPE; ++attempt)
            error = ::write(client_.get(), "x", 1) < 0 ? errno : 0;
        return error;
    }

  private:
    static void check(int result)
    {
        if (result < 0)
            throw std::system_error(errno, std::generic_category());
    }

    sockaddr_in address_ = {};
    socklen_t length_ = sizeof(address_);
    Descriptor listener_{::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)};
    Descriptor client_{::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)};
};

bool isBlocked(int signal)
{
    sigset_t mask;
    sigemptyset(&mask);
    pthread_sigmask(SIG_BLOCK, nullptr, &mask);
    return sigismember(&mask, signal) == 1;
}

bool isPending()
{
    sigset_t pending;
    sigemptyset(&pending);
    sigpending(&pending);
    return sigismember(&pending, SIGPIPE) == 1;
}

void change(int how)
{
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGPIPE);
    pthread_sigmask(how, &signals, nullptr);
}

/// Blocks SIGPIPE for the calling thread, and takes away what is pending at its end.
class BlockedSigpipe
{
  public:
    BlockedSigpipe()
    {
        change(SIG_BLOCK);
    }
    BlockedSigpipe(const BlockedSigpipe &) = delete;
    BlockedSigpipe &operator=(const BlockedSigpipe &) = delete;
    ~BlockedSigpipe()
    {
        const test::SignalAction ignored(SIGPIPE, SIG_IGN);
        change(SIG_UNBLOCK);
    }
};

/// Ends the process with 0 if a broken connection did no more than fail.
[[noreturn]] void breakConnection(bool isGuarded)
{
    ::signal(SIGPIPE, SIG_DFL);
    const ResetConnection connection;
    int error = 0;
    if (isGuarded)
    {
        const SigpipeBlock guard;
        error = connection.writeUntilBroken();
    }
    else
    {
        error = connection.writeUntilBroken();
    }
    std::_Exit(error == EPIPE && !isBlocked(SIGPIPE) && !isPending() ? 0 : 1);
}

void breakGuardedConnection()
{
    const SigpipeBlock guard;
    const ResetConnection connection;
    EXPECT_EQ(connection.writeUntilBroken(), EPIPE);
}

/// Sets every bit where the variables of the next call will be.
[[gnu::noinline]] void leaveBitsOnTheStack()
{
    std::array<volatile unsigned char, 4096> bytes;
    for (auto &byte : bytes)
        byte = 0xFF;
}

TEST(SigpipeBlockDeathTest, LetsABrokenConnectionFailWithoutEndingTheProcess)
{
    EXPECT_EXIT(breakConnection(true), testing::ExitedWithCode(0), "");
    EXPECT_EXIT(breakConnection(false), testing::KilledBySignal(SIGPIPE), "")
        << "nothing was to be guarded against";
}

TEST(SigpipeBlock, BlocksThisSignalAloneForItsLifeAndLeavesTheErrorNumber)
{
    ASSERT_FALSE(isBlocked(SIGPIPE));
    leaveBitsOnTheStack();
    {
        const SigpipeBlock guard;
        for (int signal = 1; signal < 32; ++signal)
            EXPECT_EQ(isBlocked(signal), signal == SIGPIPE) << signal;
        errno = EXDEV;
    }
    EXPECT_EQ(errno, EXDEV);
    EXPECT_FALSE(isBlocked(SIGPIPE));
}

TEST(SigpipeBlock, LeavesASignalBlockedAndPendingThatWasSoAndTakesAwayOneThatCameInBetween)
{
    const BlockedSigpipe blocked;
    {
        const SigpipeBlock guard;
        ::raise(SIGPIPE);
        ASSERT_TRUE(isPending());
    }
    EXPECT_TRUE(isBlocked(SIGPIPE));
    EXPECT_FALSE(isPending());
    ::raise(SIGPIPE);
    breakGuardedConnection();
    EXPECT_TRUE(isPending());
}

int handled = 0;
void countSignal(int /*number*/)
{
    ++handled;
}

TEST(SigpipeBlock, LeavesTheHostsHandlerAloneAndAsleep)
{
    handled = 0;
    const test::SignalAction counting(SIGPIPE, countSignal);
    breakGuardedConnection();
    EXPECT_EQ(handled, 0);
    ::raise(SIGPIPE);
    EXPECT_EQ(handled, 1);
}

TEST(SigpipeBlock, LeavesASignalIgnoredThatWasIgnored)
{
    const test::SignalAction ignored(SIGPIPE, SIG_IGN);
    breakGuardedConnection();
    EXPECT_FALSE(isPending());
    EXPECT_EQ(::raise(SIGPIPE), 0);
}

TEST(SigpipeBlock, Nests)
{
    const test::SignalAction counting(SIGPIPE, countSignal);
    handled = 0;
    {
        const SigpipeBlock outer;
        {
            const SigpipeBlock inner;
            ::raise(SIGPIPE);
        }
        EXPECT_TRUE(isBlocked(SIGPIPE));
        EXPECT_FALSE(isPending());
        ::raise(SIGPIPE);
    }
    EXPECT_EQ(handled, 0);
    EXPECT_FALSE(isBlocked(SIGPIPE));
}

TEST(SigpipeBlock, IsForItsThreadOnly)
{
    std::promise<bool> blockedThere;
    std::promise<void> seen;
    std::thread other(
        [&]
        {
            const SigpipeBlock guard;
            blockedThere.set_value(isBlocked(SIGPIPE));
            seen.get_future().wait();
        });
    EXPECT_TRUE(blockedThere.get_future().get());
    EXPECT_FALSE(isBlocked(SIGPIPE));
    seen.set_value();
    other.join();
}

} // namespace
} // namespace vclink::git

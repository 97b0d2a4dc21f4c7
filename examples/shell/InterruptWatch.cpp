// SPDX-License-Identifier: MIT
#include "InterruptWatch.hpp"

#include <cerrno>
#include <chrono>
#include <exception>
#include <utility>

#include <unistd.h>

#include "vclink_host/cancellation.hpp"

namespace vclink::shell
{
namespace
{

constexpr std::chrono::seconds patience{3};

// A signal's handler is told nothing but the signal's number.
std::atomic<int> handlersPipe{-1};
static_assert(std::atomic<int>::is_always_lock_free);

extern "C" void handOver(int /*signal*/)
{
    const int error = errno;
    const char word = 'i';
    // A pipe that is full has been told often enough.
    static_cast<void>(::write(handlersPipe.load(), &word, sizeof word) == 1);
    errno = error;
}

/// Keeps the signal from threads that are started meanwhile.
class HeldBack
{
  public:
    HeldBack()
    {
        sigset_t interrupt;
        ::sigemptyset(&interrupt);
        ::sigaddset(&interrupt, SIGINT);
        ::pthread_sigmask(SIG_BLOCK, &interrupt, &previous_);
    }
    HeldBack(const HeldBack &) = delete;
    HeldBack &operator=(const HeldBack &) = delete;
    ~HeldBack()
    {
        ::pthread_sigmask(SIG_SETMASK, &previous_, nullptr);
    }

  private:
    sigset_t previous_;
};

} // namespace

InterruptWatch::InterruptWatch(Terminator &terminator, Activity &activity,
                               std::function<void(const std::string &)> tellGivenUp)
    : terminator_(terminator), activity_(activity), tellGivenUp_(std::move(tellGivenUp))
{
    ::sigaction(SIGINT, nullptr, &previous_);
    if (previous_.sa_handler == SIG_IGN)
    {
        return;
    }
    {
        const HeldBack heldBack;
        listener_ = std::thread([this] { listen(); });
    }
    handlersPipe.store(pipe_.writeEnd());
    struct sigaction action = {};
    action.sa_handler = handOver;
    action.sa_flags = SA_RESTART;
    ::sigemptyset(&action.sa_mask);
    ::sigaction(SIGINT, &action, nullptr);
}

InterruptWatch::~InterruptWatch()
{
    if (!listener_.joinable())
    {
        return;
    }
    ::sigaction(SIGINT, &previous_, nullptr);
    pipe_.closeWriteEnd();
    listener_.join();
    // What was still in the pipe may have made the listener restore the default.
    ::sigaction(SIGINT, &previous_, nullptr);
}

bool InterruptWatch::wasAsked() const noexcept
{
    return asked_.load();
}

void InterruptWatch::listen()
{
    char word = 0;
    for (ssize_t count = -1; count != 0;)
    {
        count = ::read(pipe_.readEnd(), &word, sizeof word);
        if (count == 1)
        {
            answer();
        }
        else if (count < 0 && errno != EINTR)
        {
            return;
        }
    }
}

void InterruptWatch::answer()
{
    if (!asked_.exchange(true))
    {
        // The three seconds begin here at the earliest.
        activity_.note();
        ask();
        return;
    }
    if (activity_.quiet() >= patience)
    {
        giveUp("Nothing was heard of the operation for a while.");
    }
}

void InterruptWatch::ask()
{
    try
    {
        vclink_host::requestCancellation(terminator_);
    }
    catch (const std::exception &failure)
    {
        giveUp(std::string("The operation can't be asked to stop: ") + failure.what() + '.');
    }
}

void InterruptWatch::giveUp(const std::string &reason)
{
    ::signal(SIGINT, SIG_DFL);
    tellGivenUp_(reason);
}

} // namespace vclink::shell

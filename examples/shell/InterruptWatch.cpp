// SPDX-License-Identifier: MIT
#include "InterruptWatch.hpp"

#include <cerrno>
#include <chrono>
#include <exception>
#include <utility>

#include <unistd.h>

#include "texts.hpp"
#include "vclink_host/cancellation.hpp"

namespace vclink::shell
{
namespace
{

constexpr std::chrono::seconds patience{3};

// A signal's handler is told nothing but the signal's number.
std::atomic<int> handlersPipe{-1};
static_assert(std::atomic<int>::is_always_lock_free);

extern "C" void handOver(int signal)
{
    const int error = errno;
    const char word = static_cast<char>(signal);
    // A pipe that is full has been told often enough.
    static_cast<void>(::write(handlersPipe.load(), &word, sizeof word) == 1);
    errno = error;
}

/// Blocks the signals for threads that are started while it lives.
class HeldBack
{
  public:
    template <class Signals> explicit HeldBack(const Signals &signals)
    {
        sigset_t set;
        ::sigemptyset(&set);
        for (const int signal : signals)
        {
            ::sigaddset(&set, signal);
        }
        ::pthread_sigmask(SIG_BLOCK, &set, &previous_);
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
                               std::function<void(const std::string &)> tellGivenUp,
                               std::function<void()> tellAsked)
    : terminator_(terminator), activity_(activity), tellGivenUp_(std::move(tellGivenUp)),
      tellAsked_(std::move(tellAsked))
{
    for (std::size_t index = 0; index < signals.size(); ++index)
    {
        ::sigaction(signals[index], nullptr, &previous_[index]);
    }
    {
        const HeldBack heldBack(signals);
        listener_ = std::thread([this] { listen(); });
    }
    handlersPipe.store(pipe_.writeEnd());
    struct sigaction handing = {};
    handing.sa_handler = handOver;
    handing.sa_flags = SA_RESTART;
    ::sigemptyset(&handing.sa_mask);
    take(handing);
}

InterruptWatch::~InterruptWatch()
{
    end();
}

void InterruptWatch::end() noexcept
{
    if (!listener_.joinable())
    {
        return;
    }
    restore();
    pipe_.closeWriteEnd();
    listener_.join();
    // What was still in the pipe may have made the listener restore the defaults.
    restore();
}

int InterruptWatch::askedBy() const noexcept
{
    return askedBy_.load();
}

void InterruptWatch::take(const struct sigaction &action) noexcept
{
    for (std::size_t index = 0; index < signals.size(); ++index)
    {
        if (previous_[index].sa_handler != SIG_IGN)
        {
            ::sigaction(signals[index], &action, nullptr);
        }
    }
}

void InterruptWatch::restore() noexcept
{
    for (std::size_t index = 0; index < signals.size(); ++index)
    {
        ::sigaction(signals[index], &previous_[index], nullptr);
    }
}

void InterruptWatch::listen()
{
    char word = 0;
    for (ssize_t count = -1; count != 0;)
    {
        count = ::read(pipe_.readEnd(), &word, sizeof word);
        if (count == 1)
        {
            answer(word);
        }
        else if (count < 0 && errno != EINTR)
        {
            return;
        }
    }
}

void InterruptWatch::answer(int signal)
{
    const bool isFirst = askedBy_.load() == 0;
    if (isFirst || signal != SIGINT)
    {
        askedBy_.store(signal);
    }
    if (isFirst)
    {
        // The three seconds begin here at the earliest.
        activity_.note();
        ask();
        tellAsked_();
        return;
    }
    if (activity_.quiet() >= patience)
    {
        giveUp(say("The operation makes no progress."));
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
        giveUp(say("The operation can't be asked to stop: %1%.", failure.what()));
    }
}

void InterruptWatch::giveUp(const std::string &reason)
{
    struct sigaction byDefault = {};
    byDefault.sa_handler = SIG_DFL;
    take(byDefault);
    tellGivenUp_(reason);
}

} // namespace vclink::shell

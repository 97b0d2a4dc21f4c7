// SPDX-License-Identifier: MIT
#pragma once

#include <csignal>

namespace vclink::test
{

/// Sets what the process does on a signal, until its end.
class SignalAction
{
  public:
    SignalAction(int signal, void (*handler)(int), int flags = 0) noexcept : signal_(signal)
    {
        struct sigaction action = {};
        action.sa_handler = handler;
        action.sa_flags = flags;
        ::sigaction(signal_, &action, &before_);
    }
    SignalAction(const SignalAction &) = delete;
    SignalAction &operator=(const SignalAction &) = delete;
    ~SignalAction()
    {
        ::sigaction(signal_, &before_, nullptr);
    }

  private:
    int signal_;
    struct sigaction before_ = {};
};

} // namespace vclink::test

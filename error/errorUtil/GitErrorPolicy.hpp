// SPDX-License-Identifier: MIT
#pragma once

#include <boost/outcome/bad_access.hpp>
// Brings boost/outcome/policy/base.hpp, which does not compile alone from Boost 1.76 on.
#include <boost/outcome/basic_result.hpp>

#include "vclink/git/GitError.hpp"

namespace vclink::git
{

/// What a GitResult does when it is asked for what it does not hold. No state.
class GitErrorPolicy : public boost::outcome_v2::policy::base
{
  public:
    /// Returns only for code 0. For GIT_EUSER the exception that waits in the thread's slot is
    /// taken out and thrown again; without one, and for any other code, a LibGit2Exception is
    /// thrown. To be called on the thread on which the libgit2 call failed.
    static void throwIfError(const GitError &error);

    /// Called by Boost.Outcome before it hands out a value: throws the failure if there is one.
    /// @throws boost::outcome_v2::bad_result_access "no value" when there is neither
    template <class Impl> static constexpr void wide_value_check(Impl &&self)
    {
        if (base::_has_value(self))
        {
            return;
        }
        if (base::_has_error(self))
        {
            throwIfError(base::_error(self));
            return;
        }
        raiseNoValue();
    }

    /// Called by Boost.Outcome before it hands out an error.
    /// @throws boost::outcome_v2::bad_result_access "no error" when there is none
    template <class Impl> static constexpr void wide_error_check(Impl &&self)
    {
        if (!base::_has_error(self))
        {
            raiseNoError();
        }
    }

  private:
    [[noreturn]] static void raiseNoValue();
    [[noreturn]] static void raiseNoError();
};

} // namespace vclink::git

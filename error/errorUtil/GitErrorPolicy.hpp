// SPDX-License-Identifier: MIT
#pragma once

#include <boost/outcome/bad_access.hpp>
// Includes boost/outcome/policy/base.hpp, which does not compile alone since Boost 1.76.
#include <boost/outcome/basic_result.hpp>

#include "vclink/git/GitError.hpp"

namespace vclink::git
{

/// Decides what happens if code asks a GitResult for a value or an error that it does not have. Has
/// no state.
class GitErrorPolicy : public boost::outcome_v2::policy::base
{
  public:
    /// Returns only for code 0. For GIT_EUSER throws the exception in the thread's slot and empties
    /// the slot. Without such an exception, and for any other code, throws a LibGit2Exception. Must
    /// be called on the thread on which the libgit2 call failed.
    static void throwIfError(const GitError &error);

    /// Boost.Outcome calls it before it returns a value. Throws the failure if there is one.
    /// @throws boost::outcome_v2::bad_result_access "no value" if there is neither
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

    /// Boost.Outcome calls it before it returns an error.
    /// @throws boost::outcome_v2::bad_result_access "no error" if there is none
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

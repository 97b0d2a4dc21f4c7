// SPDX-License-Identifier: MIT
#pragma once

#include <boost/outcome/basic_result.hpp>

#include "error/errorUtil/GitDeleters.hpp"
#include "error/errorUtil/GitErrorPolicy.hpp"
#include "vclink/git/GitError.hpp"

namespace vclink::git
{

/// What a libgit2 call gave: a value, or the failure. Asking for the value of a failure throws it;
/// see GitErrorPolicy.
template <class T> using GitResult = boost::outcome_v2::basic_result<T, GitError, GitErrorPolicy>;

/// The result of a libgit2 call that gives nothing but its code. To be called with the call itself
/// as the argument, so that nothing comes between the two.
/// @throws std::bad_alloc
inline GitResult<void> makeResult(int code)
{
    if (code != 0)
    {
        return GitError(code);
    }
    return boost::outcome_v2::success();
}

/// Calls a libgit2 function whose first argument is the address of a handle, and owns the handle
/// from then on. On a failure the error is read before a handle that libgit2 left is released,
/// since the release may replace libgit2's error record.
/// @throws std::bad_alloc
template <class Handle, class Function, class... Arguments>
GitResult<OwnedHandle<Handle>> acquire(Function function, Arguments... arguments)
{
    Handle *raw = nullptr;
    const int code = function(&raw, arguments...);
    OwnedHandle<Handle> handle(raw);
    if (code != 0)
    {
        return GitError(code);
    }
    return handle;
}

} // namespace vclink::git

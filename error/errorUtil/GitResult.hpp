// SPDX-License-Identifier: MIT
#pragma once

#include <boost/outcome/basic_result.hpp>

#include "error/errorUtil/GitErrorPolicy.hpp"
#include "error/errorUtil/OwnedHandle.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "vclink/git/GitError.hpp"

namespace vclink::git
{

/// What a libgit2 call gave: a value, or the failure. Asking for the value of a failure throws it;
/// see GitErrorPolicy.
template <class T> using GitResult = boost::outcome_v2::basic_result<T, GitError, GitErrorPolicy>;

/// The result of a libgit2 call that gives nothing but its code. To be called with the call itself
/// as the argument, so that nothing comes between the two. call() is for all functions that can
/// leave a text.
/// @throws std::bad_alloc
inline GitResult<void> makeResult(int code)
{
    if (code != 0)
    {
        return GitError(code);
    }
    return boost::outcome_v2::success();
}

/// Calls a libgit2 function that gives nothing but its code. libgit2 fails without a text in
/// places, and leaves a text where it goes on from a failure of its own. Its record is emptied
/// before the call, so that the error never has the text of an earlier one.
/// @throws std::bad_alloc
template <class Function, class... Arguments>
GitResult<void> call(Function function, Arguments... arguments)
{
    git_error_clear();
    return makeResult(function(arguments...));
}

/// For a result that has no value: throws its failure, if it is one.
inline void check(const GitResult<void> &result)
{
    result.value();
}

/// call() of a function that must succeed.
/// @throws what GitErrorPolicy throws for a failure, std::bad_alloc
template <class Function, class First, class... Arguments>
void check(Function function, First first, Arguments... arguments)
{
    check(call(function, first, arguments...));
}

/// As call(), for a function whose first argument is the address of a handle; owns the handle from
/// then on. On a failure the error is read before a handle that libgit2 left is released,
/// since the release may replace libgit2's error record.
/// @throws std::bad_alloc
template <class Handle, class Function, class... Arguments>
GitResult<OwnedHandle<Handle>> acquire(Function function, Arguments... arguments)
{
    Handle *raw = nullptr;
    git_error_clear();
    const int code = function(&raw, arguments...);
    OwnedHandle<Handle> handle(raw);
    if (code != 0)
    {
        return GitError(code);
    }
    return handle;
}

} // namespace vclink::git

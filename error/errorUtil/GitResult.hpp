// SPDX-License-Identifier: MIT
#pragma once

#include <boost/outcome/basic_result.hpp>

#include "error/errorUtil/GitErrorPolicy.hpp"
#include "error/errorUtil/OwnedHandle.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "vclink/git/GitError.hpp"

namespace vclink::git
{

/// The result of a libgit2 call: a value, or the failure. Reading the value of a failure throws it;
/// see GitErrorPolicy.
template <class T> using GitResult = boost::outcome_v2::basic_result<T, GitError, GitErrorPolicy>;

/// Returns the result of a libgit2 call that returns only a code. Pass the call itself as the
/// argument, so that nothing runs between the two. Use call() for all functions that can set a
/// text.
/// @throws std::bad_alloc
inline GitResult<void> makeResult(int code)
{
    if (code != 0)
    {
        return GitError(code);
    }
    return boost::outcome_v2::success();
}

/// Calls a libgit2 function that returns only a code. Clears libgit2's error record before the
/// call, so that the error never has the text of an earlier one: libgit2 sometimes fails without a
/// text, and keeps the text of a failure that it ignores.
/// @throws std::bad_alloc
template <class Function, class... Arguments>
GitResult<void> call(Function function, Arguments... arguments)
{
    git_error_clear();
    return makeResult(function(arguments...));
}

/// Throws the failure of a result without a value, if it is one.
inline void check(const GitResult<void> &result)
{
    result.value();
}

/// call() for a function that must succeed.
/// @throws what GitErrorPolicy throws for a failure, and std::bad_alloc
template <class Function, class First, class... Arguments>
void check(Function function, First first, Arguments... arguments)
{
    check(call(function, first, arguments...));
}

/// As call(), for a function whose first argument is the address of a handle. Owns the handle
/// immediately. On a failure, reads the error before it releases a handle that libgit2 left,
/// because the release may replace libgit2's error record.
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

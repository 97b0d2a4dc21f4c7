// SPDX-License-Identifier: MIT
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>
#include <vector>

#include <git2.h>
#include <git2/sys/commit.h>
#include <git2/sys/config.h>
#include <git2/sys/filter.h>
#include <git2/sys/index.h>
#include <git2/sys/merge.h>
#include <git2/sys/odb_backend.h>
#include <git2/sys/path.h>
#include <git2/sys/refs.h>
#include <git2/sys/repository.h>
#include <git2/sys/stream.h>
#include <git2/sys/transport.h>

#include "Passing.hpp"

namespace
{

using vclink::test::LibGit2Fault;
using vclink::test::When;
using vclink::test::detail::Hooks;
using vclink::test::detail::Passing;

/// What a function gives out through its first argument for the caller to release.
template <class First> const void *givenOut(First /*first*/)
{
    return nullptr;
}
template <class Handle> const void *givenOut(Handle **first)
{
    // libgit2's own things are const there, and the owner of credentials is libgit2.
    constexpr bool isOwned = !std::is_const_v<Handle> && !std::is_pointer_v<Handle> &&
                             !std::is_same_v<Handle, git_credential>;
    return isOwned && first != nullptr ? *first : nullptr;
}

const void *givenOut()
{
    return nullptr;
}
template <class First, class Second, class... Others>
const void *givenOut(First first, Second /*second*/, Others... /*others*/)
{
    return givenOut(first);
}

/// What a function releases.
template <class Handle> const void *takenBack(Handle *handle)
{
    return handle;
}
template <class... Arguments> const void *takenBack(Arguments... /*arguments*/)
{
    return nullptr;
}

bool isRelease(std::string_view function)
{
    constexpr std::string_view ending = "_free";
    // Empties a record of the caller's own.
    constexpr std::string_view other = "git_merge_file_result_free";
    return function != other && function.size() > ending.size() &&
           function.substr(function.size() - ending.size()) == ending;
}

/// The replacement of a function of libgit2.
template <class Function> struct Shim;
template <class Result, class... Arguments> struct Shim<Result(Arguments...)>
{
    using Real = Result (*)(Arguments...);
    using Hook = typename Hooks<Result(Arguments...)>::Hook;
    using Answer = typename Hooks<Result(Arguments...)>::Answer;
    static constexpr bool givesCode = std::is_same_v<Result, int>;

    /// The same function with another body for each of the functions of one type.
    template <Real Body, const char *const *Name> static Result call(Arguments... arguments)
    {
        const Passing passing(*Name);
        if (!passing.isFollowed())
            return Body(arguments...);
        const bool releases = std::is_void_v<Result> && isRelease(*Name);
        passing.note(givesCode, releases, releases ? takenBack(arguments...) : nullptr);
        passing.tell<Hook>(arguments...);
        if constexpr (givesCode)
            return callForCode(passing, Body, arguments...);
        else
            return answer(passing, Body, arguments...);
    }

  private:
    static int callForCode(const Passing &passing, Real real, Arguments... arguments)
    {
        const std::optional<LibGit2Fault> fault = passing.fault();
        int code = 0;
        if (!fault || fault->when == When::After)
        {
            code = answer(passing, real, arguments...);
            passing.takeBackFromCallbacks();
            const void *const handle = givenOut(arguments...);
            if (handle != nullptr)
                passing.giveOut(handle);
        }
        if (fault)
        {
            Passing::setError();
            return fault->code;
        }
        if (code >= 0)
            passing.leaveText();
        return code;
    }
    /// The test's answer, or libgit2's.
    static Result answer(const Passing &passing, Real real, Arguments... arguments)
    {
        const auto instead = passing.answer<Answer>();
        return instead != nullptr ? (*instead)(real, arguments...) : real(arguments...);
    }
};

} // namespace

// The linker leads the callers of a function to "__wrap_" with its name, and keeps the function
// itself as "__real_" with it. A function can't be defined without its arguments being written out;
// its address can be answered by one that has none.
#define VCLINK_SHIM(function)                                                                      \
    extern "C"                                                                                     \
    {                                                                                              \
        extern decltype(function) real_##function __asm__("__real_" #function);                    \
        static constexpr const char *name_##function = #function;                                  \
        __attribute__((used, no_sanitize("address", "undefined", "thread"))) decltype(function) *  \
            resolve_##function()                                                                   \
        {                                                                                          \
            return &Shim<decltype(function)>::call<&real_##function, &name_##function>;            \
        }                                                                                          \
        extern decltype(function) wrapped_##function __asm__("__wrap_" #function)                  \
            __attribute__((ifunc("resolve_" #function)));                                          \
    }
#include "libgit2Imports.inc"
#undef VCLINK_SHIM

std::vector<std::string> vclink::test::wrappedFunctions()
{
#define VCLINK_SHIM(function) #function,
    return {
#include "libgit2Imports.inc"
    };
#undef VCLINK_SHIM
}

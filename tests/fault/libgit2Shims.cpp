// SPDX-License-Identifier: MIT
#include <string>
#include <string_view>
#include <type_traits>
#include <vector>

#include <git2.h>
#include <git2/sys/merge.h>

#include "LibGit2Faults.hpp"

namespace
{

using vclink::test::LibGit2Faults;

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

bool isRelease(std::string_view function)
{
    constexpr std::string_view ending = "_free";
    return function.size() > ending.size() &&
           function.substr(function.size() - ending.size()) == ending;
}

template <class Handle> void takeBack(const char *function, Handle *handle)
{
    if (handle != nullptr && isRelease(function))
        LibGit2Faults::takeBack(function, handle);
}
template <class... Arguments> void takeBack(const char * /*function*/, Arguments... /*arguments*/)
{
}

/// What stands for a function of libgit2.
template <class Function> struct Shim;
template <class Result, class... Arguments> struct Shim<Result(Arguments...)>
{
    static constexpr bool givesCode = std::is_same_v<Result, int>;

    /// The same function with another body for each of the functions of one type.
    template <Result (*Real)(Arguments...), const char *const *Name>
    static Result call(Arguments... arguments)
    {
        const LibGit2Faults::Call call = LibGit2Faults::begin(*Name, givesCode);
        if constexpr (std::is_void_v<Result>)
        {
            if (call.isNoted)
                takeBack(*Name, arguments...);
            Real(arguments...);
        }
        else if constexpr (givesCode)
        {
            return callForCode<Real>(call, *Name, arguments...);
        }
        else
        {
            return Real(arguments...);
        }
    }

  private:
    template <Result (*Real)(Arguments...)>
    static Result callForCode(const LibGit2Faults::Call &call, const char *name,
                              Arguments... arguments)
    {
        if (call.failsBefore)
        {
            LibGit2Faults::fail();
            return call.code;
        }
        const int code = Real(arguments...);
        const void *const handle = call.isNoted ? givenOut(arguments...) : nullptr;
        if (handle != nullptr)
            LibGit2Faults::giveOut(name, handle);
        if (!call.failsAfter)
            return code;
        LibGit2Faults::fail();
        return call.code;
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

// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <tuple>
#include <type_traits>
#include <utility>

#include "error/errorUtil/callbackException.hpp"
#include "error/logging/ScopeTrace.hpp"

/// The bridge from libgit2's plain callbacks to member functions, which may throw: no exception
/// ever crosses libgit2's frames.
namespace vclink::git
{
namespace detail
{

template <class MemberFunctionPointer> struct MemberFunction;

template <class Object, class Result, class... Arguments>
struct MemberFunction<Result (Object::*)(Arguments...)>
{
    using ObjectType = Object;
    using ResultType = Result;
};

/// Calls a member function with all arguments but the last, on the object that the last points at.
template <auto MemberFunctionPointer, class... Args, std::size_t... Leading>
auto callMember(const std::tuple<Args...> &arguments, std::index_sequence<Leading...>)
{
    using Object = typename MemberFunction<decltype(MemberFunctionPointer)>::ObjectType;
    auto *const object = static_cast<Object *>(std::get<sizeof...(Leading)>(arguments));
    return (object->*MemberFunctionPointer)(std::get<Leading>(arguments)...);
}

/// Makes the plain function that stands for a member function in a record of libgit2: a lambda
/// without captures. Its arguments are those of the callback's type, the last of them the payload,
/// the address of the object. An exception of a member function with a result is parked in the
/// thread's slot, and libgit2 gets the code that makes it stop; one of a member function without a
/// result is reported to the log and gone, since libgit2 takes no code from it. An exception out of
/// the tracing or the reporting ends the process.
/// @param signature carries the callback's argument types; its values are not read
template <auto MemberFunctionPointer, class... Args>
constexpr auto makeCallbackImpl([[maybe_unused]] std::tuple<Args...> signature)
{
    using Result = typename MemberFunction<decltype(MemberFunctionPointer)>::ResultType;
    return [](Args... args) noexcept -> Result
    {
        const ScopeTrace trace(logger(), __PRETTY_FUNCTION__, "options/Callbacks", 93);
        try
        {
            return callMember<MemberFunctionPointer>(
                std::tuple<Args...>(args...), std::make_index_sequence<sizeof...(Args) - 1>());
        }
        catch (...)
        {
            if constexpr (std::is_void_v<Result>)
            {
                reportCallbackException();
            }
            else
            {
                return parkCallbackException();
            }
        }
    };
}

template <class Callback> struct CallbackSignature;

template <class Result, class... Args> struct CallbackSignature<Result (*)(Args...)>
{
    using Arguments = std::tuple<Args...>;
};

} // namespace detail

/// The function of libgit2's type Callback that stands for a member function. See
/// detail::makeCallbackImpl.
template <auto MemberFunctionPointer, class Callback> constexpr Callback makeCallback()
{
    using Arguments = typename detail::CallbackSignature<Callback>::Arguments;
    return detail::makeCallbackImpl<MemberFunctionPointer>(Arguments());
}

} // namespace vclink::git

// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <tuple>
#include <type_traits>
#include <utility>

#include "error/errorUtil/callbackException.hpp"
#include "error/logging/ScopeTrace.hpp"

/// The bridge from libgit2's plain callbacks to member functions, which can throw. No exception
/// crosses libgit2's frames.
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

/// Calls a member function of the object that the last argument points to, with all other
/// arguments.
template <auto MemberFunctionPointer, class... Args, std::size_t... Leading>
auto callMember(const std::tuple<Args...> &arguments, std::index_sequence<Leading...>)
{
    using Object = typename MemberFunction<decltype(MemberFunctionPointer)>::ObjectType;
    auto *const object = static_cast<Object *>(std::get<sizeof...(Leading)>(arguments));
    return (object->*MemberFunctionPointer)(std::get<Leading>(arguments)...);
}

/// Returns a plain function for a record of libgit2 that calls a member function: a lambda without
/// captures. Its arguments are those of the callback's type; the last is the payload, the address
/// of the object.
/// If a member function with a result throws, the exception is stored in the thread's slot, and
/// libgit2 receives the code that makes it stop. If a member function without a result throws, the
/// exception is logged and ignored, because libgit2 accepts no code from it. An exception from the
/// tracing or the logging ends the process.
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

/// Returns a function of libgit2's type Callback that calls a member function. See
/// detail::makeCallbackImpl.
template <auto MemberFunctionPointer, class Callback> constexpr Callback makeCallback()
{
    using Arguments = typename detail::CallbackSignature<Callback>::Arguments;
    return detail::makeCallbackImpl<MemberFunctionPointer>(Arguments());
}

} // namespace vclink::git

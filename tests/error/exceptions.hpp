// SPDX-License-Identifier: MIT
#pragma once

#include <exception>
#include <memory>
#include <typeinfo>
#include <vector>

#include <gtest/gtest.h>

#include "computils/exception/StackTraceRecordingException.hpp"
#include "foundation/core/except/IUserException.hpp"

namespace vclink::test
{

inline std::vector<const void *>
framesOf(const computils::exception::StackTraceRecordingException &exception)
{
    std::vector<const void *> frames;
    for (std::size_t index = 0; index < exception.getStackTrace().size(); ++index)
        frames.push_back(exception.getStackTrace().frame(index));
    return frames;
}

/// Expects that what `raise` throws is caught as each of these classes.
template <class... Classes, class Raise> void expectCaughtAs(const Raise &raise)
{
    const auto expectOne = [&raise](const auto *object)
    { EXPECT_THROW(raise(), std::remove_pointer_t<decltype(object)>); };
    (expectOne(static_cast<Classes *>(nullptr)), ...);
}

/// Expects that an exception is cloned to the heap and rethrown as a copy, of its own class, by its
/// host's bases, and hands each copy to `expectSame` together with the exception.
template <class Exception, class Expect>
void expectCopies(const Exception &original, const Expect &expectSame)
{
    const auto expectCopy = [&](const auto &copy)
    {
        ASSERT_EQ(typeid(copy), typeid(Exception));
        const auto &same = dynamic_cast<const Exception &>(copy);
        ASSERT_NE(&same, &original);
        expectSame(same);
        EXPECT_EQ(framesOf(same), framesOf(original));
    };
    const foundation::core::except::IUserException &user = original;
    const boost::exception_detail::clone_base &base = original;
    const std::unique_ptr<const boost::exception_detail::clone_base> clone(base.clone());
    expectCopy(*clone);
    try
    {
        user.rethrow();
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const foundation::core::except::IUserException &copy)
    {
        expectCopy(copy);
    }
}

} // namespace vclink::test

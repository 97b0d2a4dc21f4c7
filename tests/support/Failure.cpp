// SPDX-License-Identifier: MIT
#include "support/Failure.hpp"

#include <ostream>
#include <tuple>
#include <typeinfo>

#include <gtest/gtest.h>

#include "support/text.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::test
{

bool operator==(const Failure &left, const Failure &right)
{
    return std::tie(left.code, left.errorClass, left.text) ==
           std::tie(right.code, right.errorClass, right.text);
}

std::ostream &operator<<(std::ostream &stream, const Failure &failure)
{
    return stream << "code " << failure.code << ", class " << failure.errorClass << ": "
                  << failure.text;
}

std::string printed(const Failure &failure)
{
    return testing::PrintToString(failure);
}

Failure failureOf(const std::function<void()> &action)
{
    const std::optional<Failure> failure = failureIfAny(action);
    EXPECT_TRUE(failure) << "no exception";
    return failure.value_or(Failure());
}

std::optional<Failure> failureIfAny(const std::function<void()> &action)
{
    try
    {
        action();
        return {};
    }
    catch (const git::LibGit2Exception &exception)
    {
        const vclink::exception::SourceControlException &base = exception;
        EXPECT_EQ(typeid(base), typeid(git::LibGit2Exception));
        const git::GitError &error = exception.getError();
        Failure failure{error.getCode(), error.getErrorClass(), asUtf8(error.getMessage())};
        EXPECT_NE(asUtf8(exception.GetUnicodeMessageTxt()).find(failure.text), std::string::npos);
        return failure;
    }
}

} // namespace vclink::test

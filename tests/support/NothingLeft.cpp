// SPDX-License-Identifier: MIT
#include "support/NothingLeft.hpp"

#include <cerrno>
#include <utility>

#include <gtest/gtest.h>
#include <sys/wait.h>

#include "error/errorUtil/callbackException.hpp"

namespace vclink::test
{

bool hasChildren()
{
    siginfo_t info = {};
    return ::waitid(P_ALL, 0, &info, WEXITED | WNOHANG | WNOWAIT) == 0 || errno != ECHILD;
}

NothingLeft::NothingLeft(std::filesystem::path temporary) : temporary_(std::move(temporary))
{
}

NothingLeft::~NothingLeft()
{
    EXPECT_FALSE(hasChildren()) << "a child process is left";
    EXPECT_TRUE(std::filesystem::is_empty(temporary_)) << "a temporary file is left";
    EXPECT_EQ(git::pendingCallbackException(), nullptr) << "the thread's slot is not empty";
}

} // namespace vclink::test

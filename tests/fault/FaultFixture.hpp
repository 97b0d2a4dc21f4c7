// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <gtest/gtest.h>

#include "Operation.hpp"
#include "Trial.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"

namespace vclink::test
{

/// Base of the fixtures whose tests let an operation fail; each test has the operation's name.
class FaultFixture : public GitFixture, public testing::WithParamInterface<Operation>
{
  protected:
    LibGit2Session session_{environment()};
    Trial trial_{GetParam(), folder() / "trial", environment()};
};

/// Names the tests after their operations.
std::string nameOfTest(const testing::TestParamInfo<Operation> &test);

} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include "FaultFixture.hpp"

namespace vclink::test
{

std::string nameOfTest(const testing::TestParamInfo<Operation> &test)
{
    return test.param.name;
}

} // namespace vclink::test

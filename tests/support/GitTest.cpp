// SPDX-License-Identifier: MIT
#include "support/GitTest.hpp"

namespace vclink::test
{

GitTest::~GitTest() = default;

GitRepository GitTest::makeRepository(const std::string &name) const
{
    return GitRepository::init(folder_ / name);
}

} // namespace vclink::test

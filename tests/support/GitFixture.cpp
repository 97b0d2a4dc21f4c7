// SPDX-License-Identifier: MIT
#include "GitFixture.hpp"

namespace vclink::test
{

GitFixture::~GitFixture() = default;

GitRepository GitFixture::makeRepository(const std::string &name) const
{
    return GitRepository::init(folder_ / name);
}

} // namespace vclink::test

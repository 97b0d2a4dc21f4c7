// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "instrumentation/planted/planted.hpp"

namespace
{

TEST(LinkedCopy, OfAnInlineFunctionIsTheOneOfTheLayers)
{
    EXPECT_GT(vclink::planted::useAll(1), 'a');
    EXPECT_EQ(vclink::planted::isOptimised(), VCLINK_LAYERS_ARE_OPTIMISED);
}

} // namespace

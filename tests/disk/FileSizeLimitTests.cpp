// SPDX-License-Identifier: MIT
#include <string>

#include <gtest/gtest.h>

#include "DiskFixture.hpp"
#include "support/FileSizeLimit.hpp"

namespace
{

using vclink::test::Action;
using vclink::test::FileSizeLimit;

class FileSizeLimited : public vclink::test::DiskFixture
{
};

TEST_P(FileSizeLimited, FailsWithATypeAndLosesNothing)
{
    prepare(folder() / "trial");
    // Nothing; what a reference takes; what a small object takes; more than an index does.
    for (const rlim_t bytes : {0U, 41U, 120U, 500U})
    {
        SCOPED_TRACE(std::to_string(bytes) + " bytes");
        tryOnce(
            [bytes](const Action &action)
            {
                const FileSizeLimit limit(bytes);
                return vclink::test::outcomeOf(action);
            });
    }
}

INSTANTIATE_TEST_SUITE_P(Of, FileSizeLimited,
                         testing::ValuesIn(vclink::test::operationsThatWrite()),
                         vclink::test::nameOfOperation);

} // namespace

// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "vclink/util/generateFileReport.hpp"

using vclink::util::generateFileReport;

TEST(StandInFileReport, HasOnePathALineInTheOrderOfTheList)
{
    EXPECT_EQ(generateFileReport({upath(u"/b"), upath(u"/a"), upath(u"/c d")}), u"/b\n/a\n/c d");
    EXPECT_EQ(generateFileReport({upath(u"/b")}), u"/b");
    EXPECT_EQ(generateFileReport({}), u"");
}

// SPDX-License-Identifier: MIT
// The rules, applied to this repository.
#include <set>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "rules.hpp"

namespace
{

using namespace vclink::test;
using testing::IsEmpty;
using testing::IsSupersetOf;

class Repository : public testing::Test
{
  protected:
    const SourceTree tree =
        readSourceTree(VCLINK_SOURCE_FOLDER, {"host", "include", "error", "util", "options", "main",
                                              "examples", "tests", "bench", "fuzz"});
};

TEST_F(Repository, IsSeenWithAllItsLayers)
{
    std::set<std::string> layers;
    for (const auto &entry : tree)
        layers.insert(layerOf(entry.first));
    EXPECT_THAT(layers, IsSupersetOf({"host", "include", "error", "util", "options", "main",
                                      "examples", "tests"}));
}

TEST_F(Repository, KeepsTheOrderOfItsLayers)
{
    EXPECT_THAT(findBrokenLayers(tree), IsEmpty());
}

TEST_F(Repository, KeepsTheOrderOfItsRooms)
{
    EXPECT_THAT(findBrokenRooms(tree), IsEmpty());
}

TEST_F(Repository, NeedsEachArrowBetweenItsRooms)
{
    EXPECT_THAT(findUnusedArrows(tree), IsEmpty());
}

TEST_F(Repository, ExportsHeadersThatShowNoLibraryBelow)
{
    EXPECT_THAT(findForeignIncludesOfExportedHeaders(tree), IsEmpty());
}

TEST_F(Repository, BuildsItsLibraryWithoutTheHostsControls)
{
    EXPECT_THAT(findUseOfHostControls(tree), IsEmpty());
}

TEST_F(Repository, KeepsEachHeavyLibraryInOneSourceFile)
{
    EXPECT_THAT(findSpreadHeavyLibraries(tree), IsEmpty());
}

TEST_F(Repository, BeginsEveryHeaderWithItsLicenceAndPragma)
{
    EXPECT_THAT(findHeadersWithoutProlog(tree), IsEmpty());
}

TEST_F(Repository, WritesSourcePositionsOfTheLibraryAsText)
{
    EXPECT_THAT(findLineMacros(tree), IsEmpty());
}

TEST_F(Repository, LetsNoCommandInheritAFileThatTheLibraryReads)
{
    EXPECT_THAT(findFileStreams(tree), IsEmpty());
}

TEST_F(Repository, HasNoLongFile)
{
    EXPECT_THAT(findLongFiles(tree), IsEmpty());
}

} // namespace

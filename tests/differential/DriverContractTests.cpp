// SPDX-License-Identifier: MIT
// Merges through a configured command, by git and by the library, on twin working copies.
#include <filesystem>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "DriverContract.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"

namespace
{

using namespace vclink::test;

class DriverContract : public GitFixture, public testing::WithParamInterface<DriverCase>
{
  protected:
    LibGit2Session session_{environment()};
};

TEST_P(DriverContract, HoldsByTheLibraryAsByGit)
{
    const GitRepository byGit = makeRepositoryOf(GetParam(), folder().path(), environment());
    const GitRepository byLibrary = byGit.copyTo(folder() / "library");
    const DriverOutcome git = mergeByGit(byGit);
    const DriverOutcome library = mergeByLibrary(byLibrary);
    expectOutcomes(GetParam(), git, library);
    EXPECT_TRUE(std::filesystem::is_empty(environment().temporary()));
}

std::string nameOf(const testing::TestParamInfo<DriverCase> &info)
{
    return info.param.name;
}

INSTANTIATE_TEST_SUITE_P(Placeholders, DriverContract, testing::ValuesIn(placeholderCases()),
                         nameOf);
INSTANTIATE_TEST_SUITE_P(Commands, DriverContract, testing::ValuesIn(commandCases()), nameOf);
INSTANTIATE_TEST_SUITE_P(Results, DriverContract, testing::ValuesIn(resultCases()), nameOf);
INSTANTIATE_TEST_SUITE_P(Sides, DriverContract, testing::ValuesIn(sideCases()), nameOf);
INSTANTIATE_TEST_SUITE_P(Configuration, DriverContract, testing::ValuesIn(configurationCases()),
                         nameOf);
INSTANTIATE_TEST_SUITE_P(Attributes, DriverContract, testing::ValuesIn(attributeCases()), nameOf);

} // namespace

// SPDX-License-Identifier: MIT
#include <string>
#include <utility>

#include <git2.h>
#include <git2/sys/merge.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/LogCapture.hpp"
#include "util/GitMergeDriverLookup.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::test::LogCapture;

class RegisterMergeDrivers : public vclink::test::GitFixture
{
  protected:
    vclink::test::LibGit2Session session_{environment()};
};

TEST_F(RegisterMergeDrivers, RegistersOneDriverUnderTheWildcardWithoutAWord)
{
    EXPECT_EQ(git_merge_driver_lookup("*"), nullptr);
    const LogCapture log;
    git::GitMergeDriverLookup lookup = git::registerMergeDrivers();
    EXPECT_THAT(log.messages(), IsEmpty());
    ASSERT_EQ(lookup.size(), 1U);
    EXPECT_EQ(lookup.begin()->first, "*");
    const git_merge_driver &driver = lookup.at("*");
    EXPECT_EQ(git_merge_driver_lookup("*"), &driver);
    EXPECT_EQ(driver.version, 1U);
    EXPECT_EQ(driver.initialize, nullptr);
    EXPECT_EQ(driver.shutdown, nullptr);
    EXPECT_EQ(driver.apply, &git::wildcardApplyEntry);
    git::unregisterMergeDrivers(lookup);
    EXPECT_EQ(git_merge_driver_lookup("*"), nullptr);
    // The lookup stays as it is.
    EXPECT_EQ(lookup.size(), 1U);
    EXPECT_EQ(lookup.at("*").apply, &git::wildcardApplyEntry);
}

TEST_F(RegisterMergeDrivers, KeepsTheRecordsAddressWhenTheLookupIsMoved)
{
    git::GitMergeDriverLookup lookup = git::registerMergeDrivers();
    const git_merge_driver *const address = &lookup.at("*");
    git::GitMergeDriverLookup assigned;
    assigned = std::move(lookup);
    EXPECT_EQ(&assigned.at("*"), address);
    git::GitMergeDriverLookup constructed(std::move(assigned));
    EXPECT_EQ(&constructed.at("*"), address);
    EXPECT_EQ(git_merge_driver_lookup("*"), address);
    git::unregisterMergeDrivers(constructed);
}

TEST_F(RegisterMergeDrivers, LeavesTheFirstRegistrationAndEndsEachWithAnyLookup)
{
    git::GitMergeDriverLookup first = git::registerMergeDrivers();
    git::GitMergeDriverLookup second = git::registerMergeDrivers();
    EXPECT_EQ(second.size(), 1U);
    EXPECT_EQ(git_merge_driver_lookup("*"), &first.at("*"));
    git::unregisterMergeDrivers(second);
    EXPECT_EQ(git_merge_driver_lookup("*"), nullptr);
    git::unregisterMergeDrivers(first);
    EXPECT_EQ(git_merge_driver_lookup("*"), nullptr);
}

TEST_F(RegisterMergeDrivers, TellsOfEachDriverAtTheEndInTheOrderOfTheirNames)
{
    git::GitMergeDriverLookup lookup;
    for (const char *name : {"b", "*", "a"})
        lookup[name] = {};
    const LogCapture log;
    git::unregisterMergeDrivers(lookup);
    EXPECT_THAT(log.messages(),
                ElementsAre("Unregister merge driver: *", "Unregister merge driver: a",
                            "Unregister merge driver: b"));
    EXPECT_EQ(log.records().at(0).severity, 0x08U);
}

} // namespace

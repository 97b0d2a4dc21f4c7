// SPDX-License-Identifier: MIT
#include <array>

#include <git2.h>
#include <gtest/gtest.h>

#include "main/files/mapStatusFlags.hpp"
#include "vclink/FileState.hpp"

namespace
{

using vclink::FileState;
using vclink::git::mapStatusFlags;

struct Step
{
    unsigned bits;
    int state;
};

/// The first step any of whose bits is set decides.
constexpr std::array steps{Step{0x8000, 3}, Step{0x0001, 5}, Step{0x0102, 4},
                           Step{0x0004, 6}, Step{0x0080, 0}, Step{0x0200, 7}};

int expectedState(unsigned flags)
{
    for (const Step &step : steps)
    {
        if ((flags & step.bits) != 0)
            return step.state;
    }
    return flags == 0 ? 1 : 2;
}

TEST(MapStatusFlags, FollowsTheOrderOfItsTestsForEveryWord)
{
    for (unsigned flags = 0; flags <= 0xFFFF; ++flags)
        ASSERT_EQ(mapStatusFlags(flags), expectedState(flags)) << std::hex << "0x" << flags;
}

TEST(MapStatusFlags, GivesEachOfLibGit2sBitsItsState)
{
    EXPECT_EQ(mapStatusFlags(GIT_STATUS_CURRENT), FileState::Clean);
    EXPECT_EQ(mapStatusFlags(GIT_STATUS_CONFLICTED), FileState::InConflict);
    EXPECT_EQ(mapStatusFlags(GIT_STATUS_INDEX_NEW), FileState::Added);
    EXPECT_EQ(mapStatusFlags(GIT_STATUS_INDEX_MODIFIED), FileState::Modified);
    EXPECT_EQ(mapStatusFlags(GIT_STATUS_WT_MODIFIED), FileState::Modified);
    EXPECT_EQ(mapStatusFlags(GIT_STATUS_INDEX_DELETED), FileState::Deleted);
    EXPECT_EQ(mapStatusFlags(GIT_STATUS_WT_NEW), FileState::Unversioned);
    EXPECT_EQ(mapStatusFlags(GIT_STATUS_WT_DELETED), FileState::Missing);
    for (const unsigned bit :
         {GIT_STATUS_INDEX_RENAMED, GIT_STATUS_INDEX_TYPECHANGE, GIT_STATUS_WT_TYPECHANGE,
          GIT_STATUS_WT_RENAMED, GIT_STATUS_WT_UNREADABLE, GIT_STATUS_IGNORED})
        EXPECT_EQ(mapStatusFlags(bit), FileState::Unknown) << bit;
}

TEST(MapStatusFlags, GivesTheNumbersThatTheHostKnows)
{
    EXPECT_EQ(FileState::Unversioned, 0);
    EXPECT_EQ(FileState::Clean, 1);
    EXPECT_EQ(FileState::Unknown, 2);
    EXPECT_EQ(FileState::InConflict, 3);
    EXPECT_EQ(FileState::Modified, 4);
    EXPECT_EQ(FileState::Added, 5);
    EXPECT_EQ(FileState::Deleted, 6);
    EXPECT_EQ(FileState::Missing, 7);
}

} // namespace

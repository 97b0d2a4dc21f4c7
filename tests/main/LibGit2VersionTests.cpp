// SPDX-License-Identifier: MIT
#include <cstdio>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/libgit2Features.hpp"
#include "vclink/git/LibGit2Version.hpp"

namespace
{

using vclink::git::LibGit2Version;

TEST(LibGit2Version, HasTheNumbersOfTheLinkedLibrary)
{
    int major = 0;
    int minor = 0;
    int revision = 0;
    git_libgit2_version(&major, &minor, &revision);
    const LibGit2Version version;
    EXPECT_EQ(version.getMajor(), major);
    EXPECT_EQ(version.getMinor(), minor);
    EXPECT_EQ(version.getRevision(), revision);
    EXPECT_GE(version.getMajor(), 1);
}

TEST(LibGit2Version, IsWrittenAsThreeNumbersWithDotsBetweenThem)
{
    const LibGit2Version version;
    EXPECT_THAT(version.toString(), testing::MatchesRegex("[0-9]+\\.[0-9]+\\.[0-9]+"));
    char expected[64];
    std::snprintf(expected, sizeof(expected), "%d.%d.%d", version.getMajor(), version.getMinor(),
                  version.getRevision());
    EXPECT_EQ(version.toString(), expected);
}

TEST(LibGit2Version, NeedsNoGuardAndStartsNothing)
{
    const int before = git_libgit2_init();
    git_libgit2_shutdown();
    const LibGit2Version version;
    EXPECT_NE(version.toString(), "");
    EXPECT_EQ(git_libgit2_init(), before);
    git_libgit2_shutdown();
}

TEST(LibGit2Features, AreTheFourBitsThatTheLinkedLibraryHas)
{
    EXPECT_EQ(vclink::git::libgit2Features(), git_libgit2_features() & 15);
}

} // namespace

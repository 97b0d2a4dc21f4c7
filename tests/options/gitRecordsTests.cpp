// SPDX-License-Identifier: MIT
#include "error/errorUtil/libgit2Errors.hpp"
#include "options/gitRecords.hpp"

#include <cstring>
#include <memory>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/HermeticLibGit2.hpp"
#include "options/bytesOf.hpp"
#include "support/TestInteractor.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::git
{
namespace
{

using test::bytesOf;
using test::HermeticLibGit2;
using test::TestInteractor;
using testing::Each;

std::vector<unsigned char> bytesBeforeInit;
unsigned versionGiven = 0;

/// Stands for libgit2's init function: notes what it is given and sets one field.
int noteAndInit(git_merge_options *record, unsigned version)
{
    bytesBeforeInit = bytesOf(*record);
    versionGiven = version;
    record->target_limit = 77;
    return 0;
}

int failToInit(git_merge_options *record, unsigned /*version*/)
{
    record->target_limit = 77;
    git_error_set_str(GIT_ERROR_INVALID, "invalid version 9");
    return -1;
}

TEST(InitGitRecord, GivesAZeroedRecordToLibGit2)
{
    const git_merge_options record = initGitRecord(&noteAndInit, 3u);
    EXPECT_EQ(bytesBeforeInit.size(), sizeof(record));
    EXPECT_THAT(bytesBeforeInit, Each(0));
    EXPECT_EQ(versionGiven, 3u);
    EXPECT_EQ(record.target_limit, 77u);
}

TEST(InitGitRecord, RaisesTheFailureOfLibGit2)
{
    const HermeticLibGit2 libgit2;
    try
    {
        static_cast<void>(initGitRecord(&failToInit, 9u));
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const LibGit2Exception &exception)
    {
        EXPECT_EQ(exception.getError().getCode(), -1);
        EXPECT_EQ(exception.getError().getErrorClass(), GIT_ERROR_INVALID);
        EXPECT_EQ(exception.getError().getMessage(), u"invalid version 9");
    }
}

TEST(InitGitRecord, RaisesWhenLibGit2DoesNotKnowTheVersion)
{
    const HermeticLibGit2 libgit2;
    EXPECT_THROW(initGitRecord(git_proxy_options_init, 999u), LibGit2Exception);
}

TEST(ToGitProxyOptions, GivesTheRecordThatLibGit2Makes)
{
    git_proxy_options expected;
    std::memset(&expected, 0, sizeof(expected));
    ASSERT_EQ(git_proxy_options_init(&expected, 1), 0);
    ProxyCallbacks callbacks;
    const git_proxy_options record = toGitProxyOptions(ProxyOptions(), callbacks);
    EXPECT_EQ(bytesOf(record), bytesOf(expected));
    EXPECT_EQ(record.version, 1u);
    EXPECT_EQ(record.type, GIT_PROXY_NONE);
    EXPECT_EQ(record.url, nullptr);
    EXPECT_EQ(record.payload, nullptr);
}

TEST(ToGitProxyOptions, GivesTheSameRecordWhateverItsArguments)
{
    const auto callbacks = makeDefaultGitCallbacks(std::make_shared<TestInteractor>());
    const auto first = bytesOf(toGitProxyOptions(ProxyOptions(), callbacks->proxyCallbacks()));
    for (int round = 0; round < 3; ++round)
    {
        const ProxyOptions options;
        ProxyCallbacks other;
        EXPECT_EQ(bytesOf(toGitProxyOptions(options, other)), first);
    }
}

TEST(ToGitMergeOptions, GivesTheRecordThatLibGit2Makes)
{
    git_merge_options expected;
    std::memset(&expected, 0, sizeof(expected));
    ASSERT_EQ(git_merge_options_init(&expected, 1), 0);
    const git_merge_options record = toGitMergeOptions(MergeOptions());
    EXPECT_EQ(bytesOf(record), bytesOf(expected));
    EXPECT_EQ(record.version, 1u);
}

} // namespace
} // namespace vclink::git

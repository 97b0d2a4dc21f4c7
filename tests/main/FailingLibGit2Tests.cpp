// SPDX-License-Identifier: MIT
#include <climits>
#include <memory>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "LibGit2Calls.hpp"
#include "main/libgit2Features.hpp"
#include "support/GitTest.hpp"
#include "support/LibGit2Session.hpp"
#include "support/TestInteractor.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/LibGit2Guard.hpp"
#include "vclink/git/LibGit2Version.hpp"

namespace
{

using testing::ElementsAre;
using vclink::git::GitAdapterFactory;
using vclink::git::LibGit2Guard;
using vclink::git::LibGit2Version;
using vclink::test::asPath;
using vclink::test::LibGit2Calls;

class FailingLibGit2 : public vclink::test::GitTest
{
};

TEST_F(FailingLibGit2, GoesUnnoticedByAGuard)
{
    // The guard registers its driver all the same, which a libgit2 that never ends would keep.
    const vclink::test::LibGit2Session session(environment());
    LibGit2Calls calls;
    calls.onInit = [] { return -1; };
    calls.onShutdown = [] { return -1; };
    {
        const LibGit2Guard guard;
    }
    EXPECT_THAT(calls.names, ElementsAre("git_libgit2_init", "git_libgit2_shutdown"));
}

TEST_F(FailingLibGit2, LeavesTheVersionsNumbersAtMinusOne)
{
    LibGit2Calls calls;
    calls.onVersion = [](int *, int *, int *) { return -1; };
    const LibGit2Version version;
    EXPECT_EQ(version.getMajor(), -1);
    EXPECT_EQ(version.getMinor(), -1);
    EXPECT_EQ(version.getRevision(), -1);
    EXPECT_EQ(version.toString(), "-1.-1.-1");
}

TEST_F(FailingLibGit2, GivesAVersionOfAnyLengthItsText)
{
    LibGit2Calls calls;
    calls.onVersion = [](int *major, int *minor, int *revision)
    {
        *major = INT_MAX;
        *minor = INT_MIN;
        *revision = 7;
        return 0;
    };
    EXPECT_EQ(LibGit2Version().toString(), "2147483647.-2147483648.7");
    EXPECT_THAT(calls.names, ElementsAre("git_libgit2_version"));
}

TEST_F(FailingLibGit2, GivesItsFourFeaturesAndNoOthers)
{
    LibGit2Calls calls;
    for (int feature = 1; feature < 0x100; feature <<= 1)
    {
        calls.onFeatures = [feature] { return feature; };
        EXPECT_EQ(vclink::git::libgit2Features(), feature <= 8 ? feature : 0) << feature;
    }
    calls.onFeatures = [] { return -1; };
    EXPECT_EQ(vclink::git::libgit2Features(), 15);
}

TEST_F(FailingLibGit2, IsStartedAndEndedAroundAProbe)
{
    const auto repository = makeRepository();
    LibGit2Calls calls;
    EXPECT_TRUE(GitAdapterFactory().isAdapterFor(asPath(repository.path())));
    EXPECT_THAT(calls.names, ElementsAre("git_libgit2_init", "git_repository_open_ext(nullptr)",
                                         "git_libgit2_shutdown"));
}

TEST_F(FailingLibGit2, IsProbedWithoutASearch)
{
    LibGit2Calls calls;
    calls.onOpen = [](const char *, unsigned flags, const char *ceilings)
    {
        EXPECT_EQ(flags, 1U);
        EXPECT_EQ(ceilings, nullptr);
    };
    EXPECT_FALSE(GitAdapterFactory().isAdapterFor(asPath(folder().path())));
}

TEST_F(FailingLibGit2, IsStartedByAnAdapterThatOpensNothing)
{
    const auto interactor = std::make_shared<vclink::test::TestInteractor>();
    LibGit2Calls calls;
    auto adapter = GitAdapterFactory().createAdapterFor(asPath(folder().path()), interactor);
    EXPECT_THAT(calls.names, ElementsAre("git_libgit2_init"));
    adapter->getRootFolder();
    adapter->getFileStates({});
    adapter.reset();
    EXPECT_THAT(calls.names, ElementsAre("git_libgit2_init", "git_libgit2_shutdown"));
}

} // namespace

// SPDX-License-Identifier: MIT
#include <climits>
#include <memory>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/libgit2Features.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/TestInteractor.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
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
using namespace vclink::test;

using FailingLibGit2 = GitFixture;

TEST_F(FailingLibGit2, GoesUnnoticedByAGuard)
{
    // The guard registers its driver all the same, which a libgit2 that never ends would keep.
    const LibGit2Session session(environment());
    LibGit2Recorder calls;
    calls.answer<git_libgit2_init>([](auto...) { return -1; });
    calls.answer<git_libgit2_shutdown>([](auto...) { return -1; });
    {
        const LibGit2Guard guard;
    }
    EXPECT_THAT(calls.steps(), ElementsAre("git_libgit2_init", "git_merge_driver_register",
                                           "git_merge_driver_unregister", "git_libgit2_shutdown"));
}

TEST_F(FailingLibGit2, GivesAVersionOfAnyLengthItsTextAndMinusOneWhereItFails)
{
    LibGit2Recorder calls;
    calls.answer<git_libgit2_version>(
        [](auto, int *major, int *minor, int *revision)
        {
            *major = INT_MAX;
            *minor = INT_MIN;
            *revision = 7;
            return 0;
        });
    EXPECT_EQ(LibGit2Version().toString(), "2147483647.-2147483648.7");
    EXPECT_THAT(calls.steps(), ElementsAre("git_libgit2_version"));
    calls.answer<git_libgit2_version>([](auto...) { return -1; });
    const LibGit2Version version;
    EXPECT_EQ(version.getMajor(), -1);
    EXPECT_EQ(version.getMinor(), -1);
    EXPECT_EQ(version.getRevision(), -1);
    EXPECT_EQ(version.toString(), "-1.-1.-1");
}

TEST_F(FailingLibGit2, GivesItsFourFeaturesAndNoOthers)
{
    LibGit2Recorder calls;
    for (int feature = 1; feature < 0x100; feature <<= 1)
    {
        calls.answer<git_libgit2_features>([feature](auto...) { return feature; });
        EXPECT_EQ(vclink::git::libgit2Features(), feature <= 8 ? feature : 0) << feature;
    }
    calls.answer<git_libgit2_features>([](auto...) { return -1; });
    EXPECT_EQ(vclink::git::libgit2Features(), 15);
}

TEST_F(FailingLibGit2, IsStartedAndEndedAroundAProbe)
{
    const auto repository = makeRepository();
    LibGit2Recorder calls;
    calls.on<git_repository_open_ext>(
        [](git_repository **out, const char *, unsigned flags, const char *ceilings)
        {
            EXPECT_EQ(out, nullptr);
            EXPECT_EQ(flags, 1U) << "no search";
            EXPECT_EQ(ceilings, nullptr);
        });
    EXPECT_TRUE(GitAdapterFactory().isAdapterFor(asPath(repository.path())));
    EXPECT_THAT(calls.steps(), ElementsAre("git_libgit2_init", "git_merge_driver_register",
                                           "git_repository_open_ext", "git_merge_driver_unregister",
                                           "git_libgit2_shutdown"));
}

TEST_F(FailingLibGit2, IsStartedByAnAdapterThatOpensNothing)
{
    const auto interactor = std::make_shared<TestInteractor>();
    LibGit2Recorder calls;
    auto adapter = GitAdapterFactory().createAdapterFor(asPath(folder().path()), interactor);
    EXPECT_THAT(calls.steps(), ElementsAre("git_libgit2_init", "git_merge_driver_register"));
    adapter->getRootFolder();
    adapter->getFileStates({});
    adapter.reset();
    EXPECT_THAT(calls.steps(), ElementsAre("git_libgit2_init", "git_merge_driver_register",
                                           "git_merge_driver_unregister", "git_libgit2_shutdown"));
}

} // namespace

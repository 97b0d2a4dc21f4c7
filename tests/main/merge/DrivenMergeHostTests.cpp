// SPDX-License-Identifier: MIT
// Merges with a command, from adapter to merge commit, in hosts of different kinds.
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <thread>

#include <gtest/gtest.h>

#include "DrivenMergeFixture.hpp"
#include "support/SignalAction.hpp"
#include "support/ThousandDescriptors.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/WorkingFolder.hpp"

namespace
{

namespace fs = std::filesystem;
using namespace vclink::test;

class DrivenMergeHost : public DrivenMergeFixture
{
  protected:
    DrivenMergeHost()
    {
        defineJoining();
    }
    /// What a host does: an adapter and a branch manager for this merge.
    void mergeAnew() const
    {
        const NothingLeft check(environment().temporary());
        const auto adapter = makeAdapter(repository_.path());
        vclink::git::BranchManager::create(*adapter)->merge("topic");
    }
};

TEST_F(DrivenMergeHost, MayIgnoreOrTakeASignalOfABrokenPipe)
{
    for (auto *const handler : {SIG_DFL, SIG_IGN})
    {
        const SignalAction action(SIGPIPE, handler);
        mergeAnew();
        expectJoined();
    }
}

TEST_F(DrivenMergeHost, MayHandleTheEndOfItsChildren)
{
    const SignalAction handled(SIGCHLD, [](int) {});
    mergeAnew();
    expectJoined();
}

TEST_F(DrivenMergeHost, MayHaveAThousandDescriptorsOpen)
{
    {
        const ThousandDescriptors open;
        mergeAnew();
    }
    expectJoined();
}

TEST_F(DrivenMergeHost, MayHaveNoWorkingFolderAnyMore)
{
    {
        const NoWorkingFolder nowhere(folder().path());
        EXPECT_NO_THROW(mergeAnew());
    }
    expectJoined();
}

TEST_F(DrivenMergeHost, MayMergeOnAnyThread)
{
    std::thread([this] { mergeAnew(); }).join();
    expectJoined();
}

TEST_F(DrivenMergeHost, MayHaveABlankInItsTemporaryFolderForACommandThatQuotes)
{
    const fs::path temporary = folder() / "a b";
    fs::create_directory(temporary);
    ::setenv("TMPDIR", temporary.c_str(), 1);
    define(scripts_.shell("cat \"$1\" \"$3\" >>\"$2\"") + " \"%O\" \"%A\" \"%B\"");
    mergeAnew();
    EXPECT_TRUE(fs::is_empty(temporary));
    expectJoined();
}

TEST_F(DrivenMergeHost, WithABlankInItsTemporaryFolderSplitsTheNames)
{
    const fs::path temporary = folder() / "a b";
    fs::create_directory(temporary);
    ::setenv("TMPDIR", temporary.c_str(), 1);
    defineScript("test $# = 6 && exit 1");
    expectConflicts("topic");
    EXPECT_TRUE(fs::is_empty(temporary));
}

TEST_F(DrivenMergeHost, WithoutAWritableTemporaryFolderRunsTheCommandOnNothing)
{
    const fs::path temporary = folder() / "locked";
    fs::create_directory(temporary);
    ::setenv("TMPDIR", temporary.c_str(), 1);
    defineScript("for f; do test -e \"$f\" && exit 1; done; exit 0");
    giveToUnprivilegedUser(folder().path());
    fs::permissions(temporary, fs::perms(0555));
    const std::string answer = runAsUnprivilegedUser(
        [this]() -> std::string
        {
            mergeAnew();
            const std::string merged = repository_.git({"cat-file", "blob", "HEAD:file"});
            return merged.empty() ? std::string() : "merged to " + merged;
        });
    EXPECT_EQ(answer, "");
}

} // namespace

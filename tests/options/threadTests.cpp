// SPDX-License-Identifier: MIT
// What happens on two threads at once.
#include <chrono>
#include <future>
#include <string>
#include <thread>

#include <git2.h>
#include <gtest/gtest.h>

#include "error/errorUtil/GitResult.hpp"
#include "options/Callbacks.hpp"
#include "options/CancellationPoller.hpp"
#include "options/gitRecords.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/TestInteractor.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::git
{
namespace
{

struct OfThread
{
    int number;
};

struct Walker
{
    int status(const char * /*path*/, unsigned /*flags*/)
    {
        throw OfThread{number};
    }
    int number;
};

/// Lets walks fail, and counts those that end with the exception of this very thread.
int failingWalks(const std::string &path, int number)
{
    const OwnedHandle<git_repository> repository =
        acquire<git_repository>(git_repository_open, path.c_str()).value();
    int matches = 0;
    for (int round = 0; round < 50; ++round)
    {
        Walker walker{number};
        git_status_options record = initGitRecord(git_status_options_init, 1u);
        record.flags = GIT_STATUS_OPT_INCLUDE_UNTRACKED;
        try
        {
            makeResult(git_status_foreach_ext(repository.get(), &record,
                                              makeCallback<&Walker::status, git_status_cb>(),
                                              &walker))
                .value();
        }
        catch (const OfThread &own)
        {
            matches += own.number == number ? 1 : 0;
        }
    }
    return matches;
}

class OptionThreads : public test::GitFixture
{
};

TEST_F(OptionThreads, ThatFailInLibGit2AtOnceEachGetTheirOwnException)
{
    const test::LibGit2Session session(environment());
    const test::GitRepository copy = makeRepository();
    copy.write("untracked", "text");
    const auto run = [&copy](int number) { return failingWalks(copy.path(), number); };
    auto one = std::async(std::launch::async, run, 1);
    auto two = std::async(std::launch::async, run, 2);
    EXPECT_EQ(one.get(), 50);
    EXPECT_EQ(two.get(), 50);
}

TEST_F(OptionThreads, SeeARequestThatComesWhileTheyPoll)
{
    test::TestInteractor interactor;
    CancellationPoller poller(interactor);
    std::thread asking([&interactor] { interactor.cancel(); });
    const auto pollUntilSeen = [&poller]
    {
        const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(30);
        while (std::chrono::steady_clock::now() < deadline)
        {
            poller.throwIfCancelled();
        }
    };
    EXPECT_THROW(pollUntilSeen(), vclink::util::exception::CancelledOperationException);
    EXPECT_NO_THROW(poller.throwIfCancelled());
    asking.join();
}

} // namespace
} // namespace vclink::git

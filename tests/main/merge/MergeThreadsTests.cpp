// SPDX-License-Identifier: MIT
// Merges with a command on two threads at once, as a host may run them: guards begin and end
// between merges, never during one.
#include <array>
#include <future>
#include <memory>
#include <optional>
#include <string>
#include <system_error>

#include <gtest/gtest.h>
#include <pthread.h>

#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/Scripts.hpp"
#include "support/TestInteractor.hpp"
#include "support/text.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace
{

using vclink::git::BranchManager;
using vclink::git::GitAdapterFactory;
using vclink::git::LibGit2Guard;
using namespace vclink::test;

constexpr int mergeRounds = 10;

/// Where two threads wait for each other.
class Meeting
{
  public:
    Meeting()
    {
        const int error = ::pthread_barrier_init(&barrier_, nullptr, 2);
        if (error != 0)
            throw std::system_error(error, std::generic_category(), "pthread_barrier_init");
    }
    Meeting(const Meeting &) = delete;
    Meeting &operator=(const Meeting &) = delete;
    ~Meeting()
    {
        ::pthread_barrier_destroy(&barrier_);
    }

    /// @return true on one of the two
    bool wait()
    {
        return ::pthread_barrier_wait(&barrier_) != 0;
    }

  private:
    pthread_barrier_t barrier_{};
};

class MergeThreads : public GitFixture
{
  protected:
    MergeThreads()
    {
        const std::string joining = scripts_.shell("cat \"$1\" \"$3\" >>\"$2\"") + " %O %A %B";
        for (auto &repository : repositories_)
        {
            repository.identify("Test Person", "person@example.com");
            repository.git({"config", "merge.tool.driver", joining});
            repository.write(".gitattributes", "file merge=tool\n");
            repository.write("file", "base\n");
            repository.commitAll("base");
            repository.git({"checkout", "--quiet", "-b", "topic"});
            repository.write("file", "theirs\n");
            repository.commitAll("theirs");
            repository.git({"checkout", "--quiet", "main"});
            repository.write("file", "ours\n");
            repository.commitAll("ours");
        }
    }

    /// Merges on two threads at once, after each has begun guards of its own and before each ends
    /// them, beside the other in both.
    /// @return how each merge ended, "" for well
    std::array<std::string, 2> mergeInBoth()
    {
        // libgit2 is started by the threads. If it ends before a thread that has used it, it does
        // not release what it keeps for that thread.
        std::optional<LibGit2Session> session;
        Meeting meeting;
        const auto work = [&](std::size_t number)
        {
            std::optional<LibGit2Guard> guard(std::in_place);
            auto adapter = GitAdapterFactory().createAdapterFor(
                asPath(repositories_[number].path()), interactors_[number]);
            if (meeting.wait())
                session.emplace(environment());
            if (isCancelled_[number])
                interactors_[number]->cancel();
            meeting.wait();
            std::string end = endOfMerge(*adapter);
            meeting.wait();
            adapter.reset();
            guard.reset();
            return end;
        };
        auto other = std::async(std::launch::async, work, 1U);
        std::string one = work(0);
        return {one, other.get()};
    }
    static std::string endOfMerge(vclink::CMAdapter &adapter)
    {
        try
        {
            BranchManager::create(adapter)->merge("topic");
            return "";
        }
        catch (const vclink::git::GitException &exception)
        {
            return exception.what();
        }
        catch (...)
        {
            // The other thread waits for this one.
            return "an exception of another class";
        }
    }
    /// Expects what the command has made of the sides; then goes back before the merge.
    static void expectJoined(const GitRepository &repository)
    {
        EXPECT_EQ(repository.git({"cat-file", "blob", "HEAD:file"}), "ours\nbase\ntheirs\n");
        EXPECT_EQ(repository.git({"status", "--porcelain"}), "");
        repository.git({"reset", "--quiet", "--hard", "HEAD^"});
    }

    Scripts scripts_{folder() / "scripts"};
    std::array<GitRepository, 2> repositories_{makeRepository("one"), makeRepository("two")};
    std::array<std::shared_ptr<TestInteractor>, 2> interactors_{std::make_shared<TestInteractor>(),
                                                                std::make_shared<TestInteractor>()};
    /// Whether the thread's merge is cancelled before its first file is written.
    std::array<bool, 2> isCancelled_{};
};

TEST_F(MergeThreads, RunTheirCommandsAtOnceWhileTheGuardsOfBothStand)
{
    for (int round = 0; round < mergeRounds; ++round)
    {
        EXPECT_EQ(mergeInBoth(), (std::array<std::string, 2>{}));
        for (auto &repository : repositories_)
            expectJoined(repository);
    }
}

TEST_F(MergeThreads, FailEachForItselfWithAnExceptionFromWithinLibGit2)
{
    const std::string beginning = "\"topic\" could not be merged into the current branch.\n";
    isCancelled_ = {true, false};
    repositories_[1].git({"config", "merge.tool.driver", "no-such-command %A"});
    for (int round = 0; round < mergeRounds; ++round)
    {
        EXPECT_EQ(mergeInBoth(), (std::array<std::string, 2>{
                                     beginning + "The operation was cancelled.",
                                     beginning + "execve failed: No such file or directory"}));
        for (auto &repository : repositories_)
            repository.git({"reset", "--quiet", "--hard"});
    }
}

} // namespace

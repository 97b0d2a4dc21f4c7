// SPDX-License-Identifier: MIT
#include <algorithm>
#include <chrono>
#include <filesystem>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/merge/MergeFixture.hpp"
#include "vclink/git/BranchParameters.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

namespace fs = std::filesystem;
using std::chrono::milliseconds;
using vclink::git::BranchParameters;
using namespace vclink::test;
using Steady = std::chrono::steady_clock;

/// An operation that changes a reference, and the lock that it meets.
struct ReferenceChange
{
    std::string name;
    std::string lock;
    std::function<void(vclink::git::GitAdapter &, vclink::git::BranchManager &)> run;
};

void PrintTo(const ReferenceChange &change, std::ostream *stream)
{
    *stream << change.name;
}

const std::vector<ReferenceChange> &referenceChanges()
{
    static const std::vector<ReferenceChange> all{
        {"switchBranch", "HEAD.lock",
         [](auto &, auto &branches) { branches.switchBranch("topic"); }},
        {"fastForward", "refs/heads/main.lock",
         [](auto &, auto &branches) { branches.merge("topic"); }},
        {"threeWayMerge", "refs/heads/main.lock",
         [](auto &, auto &branches) { branches.merge("apart"); }},
        {"commit", "refs/heads/main.lock",
         [](auto &adapter, auto &) { adapter.commit(upath(), u"message"); }},
        {"createBranch", "refs/heads/new.lock",
         [](auto &, auto &branches) { branches.createBranch(BranchParameters("new", "main")); }},
        {"deleteBranch", "refs/heads/loose.lock",
         [](auto &, auto &branches) { branches.deleteBranch("loose"); }},
        {"deleteBranchBesidePacking", "packed-refs.lock",
         [](auto &, auto &branches) { branches.deleteBranch("loose"); }},
        {"deletePackedBranch", "packed-refs.lock",
         [](auto &, auto &branches) { branches.deleteBranch("packed"); }}};
    return all;
}

class LockedReference : public MergeFixture, public testing::WithParamInterface<ReferenceChange>
{
  protected:
    LockedReference()
    {
        makeBranch("apart", writes("apart", "x"));
        repository_.commitAll(writes("later", "x"), "later");
        makeAhead();
        repository_.git({"branch", "packed"});
        repository_.git({"pack-refs", "--all"});
        repository_.git({"branch", "loose"});
        repository_.git({"config", "branch.packed.description", "kept"});
        repository_.git({"config", "branch.loose.description", "kept"});
    }

    void setTimeout(const std::string &value) const
    {
        repository_.git({"config", "core.filesRefLockTimeout", value});
    }
    void run() const
    {
        GetParam().run(*adapter_, branches());
    }
    std::string lock() const
    {
        return ".git/" + GetParam().lock;
    }
    /// What the operation fails with; 0 for a success.
    int codeOf() const
    {
        try
        {
            run();
            return 0;
        }
        catch (const vclink::git::LibGit2Exception &exception)
        {
            return exception.getError().getCode();
        }
        catch (const vclink::git::GitException &)
        {
            // What a merge makes of everything.
            return GIT_ELOCKED;
        }
    }
    std::vector<std::string> reflogOf(const std::string &reference) const
    {
        return split(repository_.tryGit({"reflog", "show", reference}).output);
    }
};

TEST_P(LockedReference, IsWaitedFor)
{
    setTimeout("20000");
    const auto twin = makeTwin();
    const auto before = reflogOf("HEAD").size();
    repository_.write(lock(), "");
    std::thread other(
        [this]
        {
            std::this_thread::sleep_for(milliseconds(50));
            fs::remove(repository_ / lock());
        });
    const auto begin = Steady::now();
    EXPECT_EQ(codeOf(), 0);
    other.join();
    EXPECT_GE(Steady::now() - begin, milliseconds(50));
    // The same as without a lock: every reference, and one line in the reflog at most.
    const auto adapter = makeAdapter(twin.path());
    const auto manager = vclink::git::BranchManager::create(*adapter);
    GetParam().run(*adapter, *manager);
    EXPECT_EQ(repository_.git({"for-each-ref", "--format=%(refname) %(tree)"}),
              twin.git({"for-each-ref", "--format=%(refname) %(tree)"}));
    EXPECT_EQ(repository_.read(".git/HEAD"), twin.read(".git/HEAD"));
    EXPECT_LE(reflogOf("HEAD").size(), before + 1);
    EXPECT_EQ(reflogOf("HEAD").size(), split(twin.git({"reflog", "show", "HEAD"})).size());
}

TEST_P(LockedReference, FailsOnceTheTimeIsOver)
{
    repository_.write(lock(), "of another process");
    const std::string references = repository_.git({"for-each-ref"});
    const std::string head = repository_.read(".git/HEAD");
    const std::string configuration = repository_.read(".git/config");
    const auto files = workingTreeOf(repository_);
    // A lock that is held for 500 ms makes it fail. A try takes longer if the machine is busy.
    Steady::duration shortest = Steady::duration::max();
    for (int tries = 0; tries < 5 && shortest >= milliseconds(500); ++tries)
    {
        const auto begin = Steady::now();
        EXPECT_EQ(codeOf(), GIT_ELOCKED);
        shortest = std::min(shortest, Steady::now() - begin);
    }
    EXPECT_GE(shortest, milliseconds(100));
    EXPECT_LT(shortest, milliseconds(500));
    EXPECT_EQ(repository_.read(lock()), "of another process");
    EXPECT_EQ(repository_.git({"for-each-ref"}), references);
    EXPECT_EQ(repository_.read(".git/HEAD"), head);
    EXPECT_EQ(repository_.read(".git/config"), configuration);
    EXPECT_EQ(workingTreeOf(repository_), files);
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
    EXPECT_FALSE(fs::exists(repository_ / ".git/index.lock"));
    repository_.remove(lock());
    EXPECT_EQ(codeOf(), 0);
}

TEST_P(LockedReference, FailsAtOnceWhereGitWouldNotWait)
{
    setTimeout("0");
    repository_.write(lock(), "");
    const auto begin = Steady::now();
    EXPECT_EQ(codeOf(), GIT_ELOCKED);
    setTimeout("1500");
    const auto between = Steady::now();
    EXPECT_EQ(codeOf(), GIT_ELOCKED);
    EXPECT_GE(Steady::now() - between, milliseconds(1500));
    EXPECT_LT(between - begin, milliseconds(1500));
}

INSTANTIATE_TEST_SUITE_P(Of, LockedReference, testing::ValuesIn(referenceChanges()),
                         [](const auto &test) { return test.param.name; });

/// A lock that is taken while files are being written.
class LateLock : public MergeFixture
{
  protected:
    LateLock()
    {
        makeAhead();
        repository_.git({"config", "core.filesRefLockTimeout", "20000"});
        interactor_->progress.onCall = [this](std::size_t call)
        {
            if (call == 1)
                repository_.write(lock_, "");
            else if (!other_.joinable())
                other_ = std::thread(
                    [this]
                    {
                        std::this_thread::sleep_for(milliseconds(50));
                        fs::remove(repository_ / lock_);
                    });
        };
    }
    ~LateLock() override
    {
        if (other_.joinable())
            other_.join();
    }

    std::string lock_;
    std::thread other_;
};

TEST_F(LateLock, OfHeadIsWaitedFor)
{
    lock_ = ".git/HEAD.lock";
    branches().switchBranch("topic");
    EXPECT_EQ(currentBranch(), "refs/heads/topic");
    EXPECT_TRUE(other_.joinable());
    EXPECT_THAT(status(), testing::IsEmpty());
}

TEST_F(LateLock, OfTheBranchIsWaitedFor)
{
    lock_ = ".git/refs/heads/main.lock";
    merge("topic");
    EXPECT_EQ(idOf("main"), idOf("topic"));
    EXPECT_TRUE(other_.joinable());
    EXPECT_THAT(status(), testing::IsEmpty());
}

} // namespace

// SPDX-License-Identifier: MIT
#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <iostream>
#include <iterator>
#include <map>
#include <random>
#include <set>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/wait.h>

#include "FailingFiles.hpp"
#include "FaultFixture.hpp"
#include "differential/expectedStates.hpp"
#include "differential/moves.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "openHandles.hpp"
#include "support/NothingLeft.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/strings.hpp"

namespace
{

using vclink::test::FailingFiles;
using vclink::test::GitRepository;
using vclink::test::Operation;
using vclink::test::outcomeOf;

constexpr std::array<int, 4> errors{EIO, ENOSPC, EACCES, EMFILE};
/// How many of an operation's calls fail with each of these in a test run.
constexpr std::size_t share = 6;
constexpr unsigned seed = 20260;

std::vector<Operation> writingOperations()
{
    std::vector<Operation> operations;
    const auto &all = vclink::test::allOperations();
    std::copy_if(all.begin(), all.end(), std::back_inserter(operations),
                 [](const Operation &operation) { return operation.writes; });
    return operations;
}

/// Which calls are to fail: all, or a share that differs from error to error.
std::vector<int> chooseCalls(int count, int error)
{
    std::vector<int> calls;
    for (int call = 1; call <= count; ++call)
        calls.push_back(call);
    if (vclink::test::wantsAllFaults())
        return calls;
    std::vector<int> chosen;
    std::sample(calls.begin(), calls.end(), std::back_inserter(chosen), share,
                std::minstd_rand(seed + static_cast<unsigned>(error)));
    return chosen;
}

/// Expects the library to see the working copy as git does; a repository in it is git's affair.
void expectStatesOfGit(const vclink::test::Trial &trial)
{
    const GitRepository &repository = trial.repository();
    const auto report = readGitReport(repository, vclink::test::runGitStatus(repository));
    const auto blobs = readBlobs(repository, moveCandidates(report));
    const auto isFile = [](const std::string &path) { return path.back() != '/'; };
    vclink::test::States states = vclink::test::statesOfAll(trial.adapter());
    for (auto entry = states.begin(); entry != states.end();)
        entry = isFile(entry->first) ? std::next(entry) : states.erase(entry);
    EXPECT_EQ(states, expectedStates(report, blobs, isFile));
}

/// Whether a failing operation may do something else without reporting it.
bool mayDoOtherwise(const std::string &operation)
{
    const std::array<std::string, 5> operations{
        // A status walk ends where it fails, and the files behind are not known then.
        "addFiles", "removeFiles", "revert",
        // Without an analysis the branches are merged in full; a name that can't be looked up
        // changes the message.
        "merge",
        // libgit2 keeps to itself that it could not move the remote-tracking branch.
        "push"};
    return std::any_of(operations.begin(), operations.end(),
                       [&operation](const std::string &name)
                       { return operation.compare(0, name.size(), name) == 0; });
}

class FailingFileCall : public vclink::test::FaultFixture
{
  protected:
    int countCalls()
    {
        const auto action = trial_.begin();
        const FailingFiles counting;
        outcomeOf(action);
        return counting.calls();
    }

    void fail(int call, int error)
    {
        const auto action = trial_.begin();
        std::string outcome;
        std::string function;
        {
            const vclink::test::NothingLeft nothingLeft(environment().temporary());
            {
                using vclink::test::LibGit2Recorder;
                const LibGit2Recorder recorder(LibGit2Recorder::InCallbacks::Followed);
                const FailingFiles failing(call, error);
                outcome = outcomeOf(action);
                function = failing.failed();
                EXPECT_EQ(vclink::test::openHandles(recorder), std::vector<std::string>());
            }
            trial_.closeWhatLibGit2Leaves();
            if (GetParam().name == "mergeByTool")
                reapTool();
        }
        SCOPED_TRACE("call " + std::to_string(call) + ", " + function + ": " +
                     std::strerror(error) + ": " + outcome);
        const bool isNormal = outcome == trial_.normalOutcome();
        const bool isTolerant = mayDoOtherwise(GetParam().name);
        ++ends_[isNormal ? "as if nothing had failed" : "with an exception"];
        if (isNormal && !isTolerant)
        {
            EXPECT_EQ(trial_.gist(), trial_.normalGist());
        }
        trial_.expectSound();
        // git says of a sparse checkout, and of a folder that it can't enter, what it likes.
        if (GetParam().name != "commitSparse" && GetParam().name != "commitUnreadable")
            expectStatesOfGit(trial_);
        trial_.expectWorksAgain(action);
    }

    /// Boost.Process does not say which child it has made where it can't read whether the command
    /// has started; what can't be told from somebody else's child is left.
    void reapTool()
    {
        while (vclink::test::hasChildren())
        {
            ASSERT_GT(::waitpid(-1, nullptr, 0), 0);
            ++toolsLeft_;
        }
    }

    std::map<std::string, int> ends_;
    std::size_t toolsLeft_ = 0;
};

TEST_P(FailingFileCall, LeavesTheRepositoryInOrder)
{
    const int count = countCalls();
    for (const int error : errors)
    {
        for (const int call : chooseCalls(count, error))
            fail(call, error);
    }
    EXPECT_LE(toolsLeft_, 3 * errors.size());
    std::cout << "calls of the file system: " << count;
    for (const auto &[end, runs] : ends_)
        std::cout << "; " << runs << " runs ended " << end;
    std::cout << '\n';
}

/// A commit of the content of the index, the working tree and the files of a merge.
class CommitOverFailingCall : public FailingFileCall
{
  protected:
    /// The tree and the parents of the commit at HEAD.
    std::string committed() const
    {
        return trial_.repository().git({"log", "-1", "--format=%T %P"});
    }
};

/// libgit2 takes what it can't look at for what is not there.
TEST_P(CommitOverFailingCall, FailsOrHoldsEveryFileAndParent)
{
    trial_.begin()();
    const std::string expected = committed();
    const int count = countCalls();
    trial_.begin();
    const std::string before = committed();
    for (int call = 1; call <= count; ++call)
    {
        const auto action = trial_.begin();
        std::string function;
        std::string outcome;
        {
            const FailingFiles failing(call, EIO);
            outcome = outcomeOf(action);
            function = failing.failed();
        }
        SCOPED_TRACE("call " + std::to_string(call) + ", " + function + ": " + outcome);
        const std::string after = committed();
        EXPECT_TRUE(after == expected || after == before) << after;
        if (outcome == trial_.normalOutcome())
        {
            EXPECT_EQ(trial_.gist(), trial_.normalGist());
        }
    }
}

/// A checkout in a working copy with edited files.
class CheckoutOverFailingCall : public FailingFileCall
{
  protected:
    using Edit = std::string (*)(const std::string &);

    static std::string lengthen(const std::string &content)
    {
        return content + "mine\n";
    }
    static std::string keepSize(const std::string &content)
    {
        return std::string(content.size(), 'm');
    }

    std::vector<std::string> everyFile() const
    {
        return vclink::test::split(trial_.repository().git({"ls-files"}));
    }

    /// @return what the files hold then
    std::map<std::string, std::string> editEach(const std::vector<std::string> &names,
                                                Edit edit) const
    {
        const GitRepository &repository = trial_.repository();
        std::map<std::string, std::string> edited;
        for (const std::string &name : names)
        {
            edited[name] = edit(repository.read(name));
            repository.write(name, edited[name]);
        }
        return edited;
    }

    /// Lets each call fail in turn, until there is none left.
    void failEach(const std::vector<std::string> &names, Edit edit)
    {
        std::string function = "the first";
        for (int call = 1; !function.empty(); ++call)
        {
            const auto action = trial_.begin();
            const std::map<std::string, std::string> edited = editEach(names, edit);
            std::string outcome;
            {
                const FailingFiles failing(call, EMFILE);
                outcome = outcomeOf(action);
                function = failing.failed();
            }
            SCOPED_TRACE("call " + std::to_string(call) + ", " + function + ": " + outcome);
            for (const auto &[name, content] : edited)
                EXPECT_EQ(trial_.repository().read(name), content) << name;
            EXPECT_THAT(differingFromHead(), testing::IsSupersetOf(names));
        }
    }

  private:
    /// What is not committed.
    std::vector<std::string> differingFromHead() const
    {
        return vclink::test::split(trial_.repository().git({"diff", "--name-only", "HEAD"}));
    }
};

/// libgit2 takes a file whose id it can't compute for an unchanged one.
TEST_P(CheckoutOverFailingCall, KeepsEveryEdit)
{
    trial_.begin();
    failEach(everyFile(), lengthen);
    failEach(everyFile(), keepSize);
}

/// A merge that makes a commit. libgit2 refuses any edit of a file that the merge touches.
using MergeOverFailingCall = CheckoutOverFailingCall;

TEST_P(MergeOverFailingCall, CommitsNoEditOfAFileThatItDoesNotTouch)
{
    failEach({"sub/inside"}, lengthen);
    failEach({"sub/inside"}, keepSize);
}

/// libgit2 takes an index that it can't look at for an empty one.
class FailingLookAtTheIndex : public FailingFileCall
{
  protected:
    /// Lets each look fail, and the one that comes so many looks later.
    void failLooks(int later)
    {
        std::string function = "the first";
        for (int look = 1; !function.empty(); ++look)
        {
            const auto action = trial_.begin();
            std::string outcome;
            {
                const FailingFiles failing(index_, look, look + later, EIO);
                outcome = outcomeOf(action);
                function = failing.failed();
            }
            SCOPED_TRACE("look " + std::to_string(look) + " and " + std::to_string(look + later) +
                         ", " + function + ": " + outcome);
            EXPECT_THAT(indexed(), testing::IsSupersetOf(kept_));
        }
    }
    std::vector<std::string> indexed() const
    {
        return vclink::test::split(trial_.repository().git({"ls-files"}));
    }

    const std::string index_ = trial_.repository().path() / ".git/index";
    /// What the operation finds in the index and leaves there.
    std::vector<std::string> kept_;
};

TEST_P(FailingLookAtTheIndex, LosesNoEntry)
{
    const auto after = indexed();
    trial_.begin();
    const auto before = indexed();
    std::set_intersection(before.begin(), before.end(), after.begin(), after.end(),
                          std::back_inserter(kept_));
    failLooks(0);
    // So that reading the index once more fails as the first time did.
    failLooks(3);
}

INSTANTIATE_TEST_SUITE_P(Of, FailingLookAtTheIndex, testing::ValuesIn(writingOperations()),
                         vclink::test::nameOfTest);

std::vector<Operation> operationsOf(const std::set<std::string> &names)
{
    std::vector<Operation> operations = writingOperations();
    const auto others = std::remove_if(operations.begin(), operations.end(),
                                       [&names](const Operation &operation)
                                       { return names.count(operation.name) == 0; });
    operations.erase(others, operations.end());
    return operations;
}

/// Of changed files, of a working copy in which some are not checked out, and of a merge.
INSTANTIATE_TEST_SUITE_P(Of, CommitOverFailingCall,
                         testing::ValuesIn(operationsOf({"commit", "commitSparse", "commitMerge"})),
                         vclink::test::nameOfTest);

INSTANTIATE_TEST_SUITE_P(Of, CheckoutOverFailingCall,
                         testing::ValuesIn(operationsOf({"switchBranch", "mergeFastForward"})),
                         vclink::test::nameOfTest);

INSTANTIATE_TEST_SUITE_P(Of, MergeOverFailingCall,
                         testing::ValuesIn(operationsOf({"mergeThreeWay"})),
                         vclink::test::nameOfTest);

INSTANTIATE_TEST_SUITE_P(Of, FailingFileCall, testing::ValuesIn(writingOperations()),
                         vclink::test::nameOfTest);

} // namespace

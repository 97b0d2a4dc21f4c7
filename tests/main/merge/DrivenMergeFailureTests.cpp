// SPDX-License-Identifier: MIT
// What a host gets of a merge whose driver's run fails, at each of its steps and in every way.
#include <csignal>
#include <functional>
#include <new>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "DrivenMergeFixture.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"
#include "support/SignalAction.hpp"
#include "support/readFile.hpp"
#include "support/text.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/messageIdentifiers.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace
{

namespace git = vclink::git;
using testing::HasSubstr;
using namespace vclink::test;
using vclink::util::exception::CancelledOperationException;

constexpr unsigned tracedSeverities =
    git::SeverityScopeEntry | git::SeverityParameter | git::SeverityDiagnostic;

/// Tells a driver's run by its records: entry, parameter, configured command, command, output,
/// outcome.
class RunOfTheDriver
{
  public:
    static constexpr int steps = 6;

    /// @return the step that a record is of; -1 outside a run
    int take(const LogRecord &record)
    {
        const std::string beginning = "int {anonymous}::wildcardGitDriverApplyCallback(";
        if (record.message.compare(0, beginning.size(), beginning) == 0)
            next_ = 0;
        return next_ < 0 || next_ >= steps ? -1 : next_++;
    }

  private:
    int next_ = -1;
};

/// Fails the running test at its end when a merge that was given up has left more behind than the
/// note of where HEAD was, which libgit2 makes before it merges.
class NothingMerged
{
  public:
    explicit NothingMerged(GitRepository repository)
        : repository_(std::move(repository)), before_(state())
    {
    }
    NothingMerged(const NothingMerged &) = delete;
    NothingMerged &operator=(const NothingMerged &) = delete;
    ~NothingMerged()
    {
        EXPECT_EQ(state(), before_);
    }

  private:
    RepositoryState state() const
    {
        RepositoryState state = stateOf(repository_);
        state.underWay.erase("ORIG_HEAD");
        return state;
    }

    GitRepository repository_;
    RepositoryState before_;
};

class DrivenMergeFailure : public DrivenMergeFixture
{
  protected:
    /// Merges with `raise` done at one step of the driver's run.
    void mergeRaisingAt(int step, const std::function<void()> &raise) const
    {
        RunOfTheDriver run;
        LogCapture log(tracedSeverities);
        log.onRecord(
            [&](const LogRecord &record)
            {
                if (run.take(record) == step)
                    raise();
            });
        const NothingLeft check(environment().temporary());
        merge("topic");
    }
    /// The added text of a merge's failure, after which everything is as before.
    std::string failure() const
    {
        const NothingMerged nothing(repository_);
        return failureHere();
    }
    /// The same for a process that can't have git tell what has changed.
    std::string failureHere() const
    {
        const NothingLeft check(environment().temporary());
        return failureOfMerge("topic");
    }
    void expectTheNextToSucceed()
    {
        defineJoining();
        merge("topic");
        expectJoined();
    }
};

TEST_F(DrivenMergeFailure, OfEveryStandardKindAtEveryStepTellsItsText)
{
    defineJoining();
    const git::GitException withMessage(shared_vclink::git::NoUserName(), u"more");
    const std::vector<std::pair<std::function<void()>, std::string>> kinds{
        {[] { throw std::runtime_error("sink"); }, "sink"},
        {[] { throw std::logic_error("gr\xC3\xBC\xC3\x9F"); }, "gr\xC3\xBC\xC3\x9F"},
        {[] { throw std::bad_alloc(); }, "std::bad_alloc"},
        {[] { throw CancelledOperationException(); }, CancelledOperationException().what()},
        {[&] { throw withMessage; }, textOf(shared_vclink::git::NoUserName()) + "\nmore"}};
    for (const auto &[raise, text] : kinds)
    {
        for (int step = 0; step < RunOfTheDriver::steps; ++step)
        {
            SCOPED_TRACE(text + " at " + std::to_string(step));
            const NothingMerged nothing(repository_);
            try
            {
                mergeRaisingAt(step, raise);
                ADD_FAILURE() << "no exception";
            }
            catch (const git::GitException &exception)
            {
                EXPECT_EQ(exception.GetID(), "shared_vclink:git:MergeFailed");
                EXPECT_THAT(asUtf8(exception.GetUnicodeMessageTxt()),
                            testing::EndsWith('\n' + text));
            }
        }
    }
    expectTheNextToSucceed();
}

TEST_F(DrivenMergeFailure, OfAnythingElseAtEveryStepComesOutUnchanged)
{
    defineJoining();
    for (int step = 0; step < RunOfTheDriver::steps; ++step)
    {
        SCOPED_TRACE(step);
        const NothingMerged nothing(repository_);
        EXPECT_THAT([&] { mergeRaisingAt(step, [step] { throw step; }); },
                    testing::Throws<int>(step));
    }
    expectTheNextToSucceed();
}

TEST_F(DrivenMergeFailure, OfACommandThatCannotBeStartedTellsWhy)
{
    const std::vector<std::pair<std::string, std::string>> commands{
        {"/nowhere/tool %A", "No such file or directory"},
        {"no-such-tool-anywhere %A", "No such file or directory"},
        {scripts_.file("#!/bin/sh\n", 0644), "Permission denied"},
        {scripts_.file("exit 0\n", 0755), "Exec format error"},
        {"", "the command is empty"},
        {"   ", "the command is empty"},
        {"/bin/true \"", "a double quote of the command is not closed"}};
    for (const auto &[command, text] : commands)
    {
        SCOPED_TRACE(command.substr(0, 40));
        define(command);
        EXPECT_THAT(failure(), HasSubstr(text));
    }
    expectTheNextToSucceed();
}

TEST_F(DrivenMergeFailure, OfAHostThatIgnoresItsChildrenStartsNoCommand)
{
    const std::string mark = folder() / "mark";
    for (const int status : {0, 1})
    {
        defineScript("echo run >" + mark + "; exit " + std::to_string(status));
        const NothingMerged nothing(repository_);
        const SignalAction ignored(SIGCHLD, SIG_IGN);
        EXPECT_THAT(failureHere(), HasSubstr("SIGCHLD"));
    }
    EXPECT_EQ(readFile(mark), "");
    expectTheNextToSucceed();
}

TEST_F(DrivenMergeFailure, OfAKeyWithoutAValueNamesTheKey)
{
    const std::string config = repository_.read(".git/config");
    repository_.write(".git/config", config + "[merge \"tool\"]\n\tdriver\n");
    EXPECT_THAT(failure(), HasSubstr("'merge.tool.driver' has no value"));
    repository_.write(".git/config", config);
    expectTheNextToSucceed();
}

TEST_F(DrivenMergeFailure, OfASideThatCannotBeReadIsLibGit2s)
{
    const std::string mark = folder() / "mark";
    defineScript("echo run >" + mark);
    for (const char *revision : {"main:file", "topic:file", "main~1:file"})
    {
        SCOPED_TRACE(revision);
        const std::string id = idOf(revision);
        const std::string object = ".git/objects/" + id.substr(0, 2) + '/' + id.substr(2);
        const std::string bytes = repository_.read(object);
        repository_.remove(object);
        EXPECT_THAT(failureHere(), HasSubstr("(code -3, "));
        repository_.write(object, bytes);
        EXPECT_EQ(branches().getRepositoryState(), "Normal");
    }
    EXPECT_EQ(readFile(mark), "");
    expectTheNextToSucceed();
}

TEST_F(DrivenMergeFailure, OfAnyKindIsToldBeforeTheNextFileIsAskedFor)
{
    repository_.write(".git/info/attributes", "other merge=second\n");
    repository_.git({"checkout", "--quiet", "topic"});
    repository_.commitAll(writes("other", "theirs\n"), "theirs");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.commitAll(writes("other", "ours\n"), "ours");
    const std::string mark = folder() / "mark";
    repository_.git({"config", "merge.second.driver", scripts_.shell("echo run >" + mark)});
    define("/nowhere/tool");
    EXPECT_THAT(failure(), HasSubstr("No such file or directory"));
    EXPECT_EQ(readFile(mark), "");
}

} // namespace

// SPDX-License-Identifier: MIT
// Exceptions of the driver's run, as they come out of git_merge.
#include <cerrno>
#include <csignal>
#include <filesystem>
#include <ios>
#include <stdexcept>
#include <string>
#include <system_error>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeDriverFixture.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "support/Failure.hpp"
#include "support/SignalAction.hpp"
#include "support/text.hpp"
#include "util/command/processError.hpp"

namespace
{

using boost::process::process_error;
using vclink::test::failureOf;
using vclink::test::LogCapture;
using vclink::test::LogRecord;
using vclink::test::SignalAction;

class MergeDriverFailure : public vclink::test::MergeDriverFixture
{
  protected:
    /// The error with which a merge fails whose command can't be started.
    std::error_code processError() const
    {
        try
        {
            mergeOrThrow();
        }
        catch (const process_error &error)
        {
            return error.code();
        }
        return {};
    }
    /// Makes an object of the repository unreadable for git_merge.
    void removeObject(const std::string &revision) const
    {
        const std::string id = repository_.line({"rev-parse", revision});
        repository_.remove(".git/objects/" + id.substr(0, 2) + '/' + id.substr(2));
    }
};

TEST_F(MergeDriverFailure, IsTheErrorOfACommandThatCannotBeStarted)
{
    makeConflict();
    define("tool", "/nowhere/tool %A");
    EXPECT_EQ(processError().value(), ENOENT);
    define("tool", scripts_.file("#!/bin/sh\n", 0644));
    EXPECT_EQ(processError().value(), EACCES);
    define("tool", scripts_.file("exit 0\n", 0755));
    EXPECT_EQ(processError().value(), ENOEXEC);
    define("tool", folder().path());
    EXPECT_EQ(processError().value(), EACCES);
}

TEST_F(MergeDriverFailure, IsTheErrorOfACommandThatIsNone)
{
    makeConflict();
    for (const char *command : {"", "  ", "\"", "/bin/true \""})
    {
        define("tool", command);
        EXPECT_EQ(processError().value(), EINVAL) << '\'' << command << '\'';
    }
}

TEST_F(MergeDriverFailure, IsTheErrorOfAHostThatIgnoresItsChildren)
{
    makeConflict();
    defineScript("tool", "exit 1");
    const SignalAction ignored(SIGCHLD, SIG_IGN);
    // The fixture's own commands need their children's status.
    EXPECT_EQ(processError().value(), ECHILD);
}

TEST_F(MergeDriverFailure, IsALogicErrorForAKeyWithoutAValue)
{
    makeConflict();
    const std::string config = repository_.read(".git/config");
    repository_.write(".git/config", config + "[merge \"tool\"]\n\tdriver\n");
    EXPECT_THROW(mergeOrThrow(), std::logic_error);
    {
        const LogCapture log;
        EXPECT_THROW(mergeOrThrow(), std::logic_error);
    }
}

/// Whoever may write to the temporary folder could choose a file of the user's, for all to read.
TEST_F(MergeDriverFailure, IsOneWhenALinkIsInThePlaceOfTheMergedFile)
{
    makeConflict();
    const std::string secret = folder() / "secret";
    repository_.write("../secret", "secret\n");
    for (const std::string &target : {secret, secret + "-missing"})
    {
        defineScript("tool", "ln -sf '" + target + "' \"$2\"");
        const auto failure = failureOf([this] { mergeOrThrow(); });
        EXPECT_EQ(failure.code, GIT_ERROR) << target;
        EXPECT_EQ(failure.errorClass, GIT_ERROR_MERGE);
        EXPECT_THAT(failure.text,
                    testing::StartsWith("a symbolic link is in the place of the merged file"));
        EXPECT_EQ(repository_.read("file"), "ours\n");
        EXPECT_EQ(staged("file"), "ours\n");
    }
    EXPECT_FALSE(std::filesystem::exists(secret + "-missing"));
}

TEST_F(MergeDriverFailure, IsLibGit2sWhenASideCannotBeRead)
{
    makeConflict();
    const std::string mark = folder() / "mark";
    defineScript("tool", "echo run >" + mark);
    for (const char *revision : {"main:file", "theirs:file", "main~1:file"})
    {
        const auto copy = folder() / "copy";
        std::filesystem::copy(repository_ / ".git/objects", copy,
                              std::filesystem::copy_options::recursive);
        removeObject(revision);
        EXPECT_EQ(failureOf([this] { mergeOrThrow(); }).code, GIT_ENOTFOUND) << revision;
        repository_.remove(".git/objects");
        std::filesystem::rename(copy, repository_ / ".git/objects");
    }
    EXPECT_EQ(vclink::test::Scripts::read(mark), "");
}

TEST_F(MergeDriverFailure, IsLibGit2sWhenTheConfigurationCannotBeRead)
{
    makeConflicts({"a", "b"}, "* merge=tool\n");
    const std::string config = repository_ / ".git/config";
    defineScript("tool", "test \"$5\" = a && echo '[broken' >>" + config);
    EXPECT_EQ(failureOf([&] { mergeOrThrow(); }).errorClass, GIT_ERROR_CONFIG);
}

TEST_F(MergeDriverFailure, IsTheStreamsWhenTheFileOfOursHasBecomeAFolder)
{
    makeConflict();
    defineScript("tool", "rm \"$2\"; mkdir \"$2\"");
    EXPECT_THROW(mergeOrThrow(), std::ios_base::failure);
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
}

TEST_F(MergeDriverFailure, EndsTheMergeWithTheCodeOfACallback)
{
    makeConflict();
    define("tool", "/nowhere/tool");
    vclink::git::storeCallbackException(nullptr);
    git_repository *repository = nullptr;
    ASSERT_EQ(git_repository_open(&repository, repository_.path().c_str()), 0);
    git_reference *branch = nullptr;
    ASSERT_EQ(git_reference_dwim(&branch, repository, "theirs"), 0);
    git_annotated_commit *theirs = nullptr;
    ASSERT_EQ(git_annotated_commit_from_ref(&theirs, repository, branch), 0);
    const git_annotated_commit *heads[] = {theirs};
    EXPECT_EQ(git_merge(repository, heads, 1, nullptr, nullptr), GIT_EUSER);
    EXPECT_NE(vclink::git::pendingCallbackException(), nullptr);
    EXPECT_THROW(std::rethrow_exception(vclink::git::pendingCallbackException()), process_error);
    vclink::git::storeCallbackException(nullptr);
    git_annotated_commit_free(theirs);
    git_reference_free(branch);
    git_repository_free(repository);
}

TEST_F(MergeDriverFailure, StopsTheMergeAtTheFirstFile)
{
    makeConflicts({"a", "b"}, "a merge=broken\nb merge=tool\n");
    const std::string mark = folder() / "mark";
    define("broken", "/nowhere/tool");
    defineScript("tool", "echo run >" + mark);
    EXPECT_EQ(processError().value(), ENOENT);
    EXPECT_EQ(vclink::test::Scripts::read(mark), "");
    EXPECT_EQ(repository_.read("a"), "ours\n");
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
}

TEST_F(MergeDriverFailure, LeavesTheNextMergeAsItIs)
{
    makeConflict();
    define("tool", "/nowhere/tool");
    EXPECT_EQ(processError().value(), ENOENT);
    defineScript("tool", "echo merged >\"$2\"");
    EXPECT_EQ(merge(), 0);
    EXPECT_EQ(staged("file"), "merged\n");
}

/// What a test raises that is no std::exception.
struct Foreign
{
    int number;
};

/// What the host may raise while the driver writes a record.
template <class Raised> class MergeDriverExceptionKind : public MergeDriverFailure
{
};

template <class Raised> Raised makeRaised()
{
    if constexpr (std::is_constructible_v<Raised, const char *>)
        return Raised("sink");
    else
        return Raised{};
}

using Kinds = testing::Types<std::runtime_error, std::logic_error, std::bad_alloc, Foreign, int>;
TYPED_TEST_SUITE(MergeDriverExceptionKind, Kinds, );

TYPED_TEST(MergeDriverExceptionKind, ComesOutOfEveryStepAsItself)
{
    this->makeConflict();
    this->defineScript("tool", "exit 0");
    std::size_t count = 0;
    {
        const LogCapture log(0x2A);
        EXPECT_EQ(this->merge(), 0);
        count = log.records().size();
        this->repository_.git({"reset", "--quiet", "--hard"});
    }
    // Entry, parameter, configured command, command, output, outcome.
    EXPECT_EQ(count, 6U);
    for (std::size_t step = 0; step < count; ++step)
    {
        SCOPED_TRACE(step);
        LogCapture log(0x2A);
        std::size_t record = 0;
        log.onRecord(
            [&](const LogRecord &)
            {
                if (record++ == step)
                    throw makeRaised<TypeParam>();
            });
        EXPECT_THROW(this->mergeOrThrow(), TypeParam);
    }
}

} // namespace

// SPDX-License-Identifier: MIT
// Exceptions of the driver's run, as they come out of git_merge, as far as DrivenMergeFailure in
// tests/main does not see them in a host.
#include <filesystem>
#include <ios>
#include <stdexcept>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeDriverFixture.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "support/Failure.hpp"
#include "util/command/processError.hpp"

namespace
{

using boost::process::process_error;
using namespace vclink::test;

using MergeDriverFailure = MergeDriverFixture;

TEST_F(MergeDriverFailure, IsALogicErrorForAKeyWithoutAValue)
{
    makeConflict();
    const std::string config = repository_.read(".git/config");
    repository_.write(".git/config", config + "[merge \"tool\"]\n\tdriver\n");
    const auto expectFailure = [this]
    {
        try
        {
            mergeOrThrow();
            FAIL() << "no exception";
        }
        catch (const std::logic_error &error)
        {
            EXPECT_STREQ(error.what(), "'merge.tool.driver' has no value");
        }
    };
    expectFailure();
    const LogCapture log;
    expectFailure();
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

/// A FIFO would be waited for without an end.
TEST_F(MergeDriverFailure, IsOneWhenAFifoOrASocketIsInThePlaceOfTheMergedFile)
{
    makeConflict();
    const std::string bind = "import socket, sys; socket.socket(socket.AF_UNIX).bind(sys.argv[1])";
    for (const std::string &making : {std::string("mkfifo"), "python3 -c '" + bind + "'"})
    {
        defineScript("tool", "rm \"$2\"; " + making + " \"$2\"");
        const auto failure = failureOf([this] { mergeOrThrow(); });
        EXPECT_EQ(failure.errorClass, GIT_ERROR_MERGE) << making;
        EXPECT_THAT(failure.text, testing::StartsWith("a FIFO, socket or device is in the place"));
        EXPECT_EQ(staged("file"), "ours\n");
    }
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
    EXPECT_EQ(OpenedMerge(repository_).run(), GIT_EUSER);
    EXPECT_NE(vclink::git::pendingCallbackException(), nullptr);
    EXPECT_THROW(std::rethrow_exception(vclink::git::pendingCallbackException()), process_error);
    vclink::git::storeCallbackException(nullptr);
}

} // namespace

// SPDX-License-Identifier: MIT
#pragma once

#include <csignal>
#include <cstddef>
#include <filesystem>
#include <string>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include "MergeFixture.hpp"
#include "support/Command.hpp"

namespace vclink::test
{

constexpr const char *mergeMarker = ".git/vclink-merge";
constexpr const char *indexLock = ".git/index.lock";

/// A merge whose process was killed, and the commits that follow.
class InterruptedMerge : public MergeFixture
{
  protected:
    void commit() const
    {
        adapter_->commit(upath(), u"concluded");
    }
    bool exists(const std::string &name) const
    {
        return std::filesystem::exists(repository_ / name);
    }
    std::string markerOf(const std::string &ours, const std::string &theirs) const
    {
        return idOf(ours) + "\n" + idOf(theirs) + "\n";
    }

    /// Merges "topic" in a process that is killed at this call of the progress display, the first
    /// of which comes before the first file is written, and removes the lock that it leaves.
    void killMergeAt(std::size_t call) const
    {
        const pid_t child = ::fork();
        ASSERT_GE(child, 0);
        if (child == 0)
        {
            interactor_->progress.onCall = [call](std::size_t number)
            {
                if (number == call)
                    ::kill(::getpid(), SIGKILL);
            };
            static_cast<void>(failureOf([this] { merge("topic"); }));
            ::_exit(0);
        }
        int status = 0;
        ASSERT_EQ(::waitpid(child, &status, 0), child);
        ASSERT_TRUE(WIFSIGNALED(status)) << "the merge came to its end";
        EXPECT_EQ(repository_.read(mergeMarker), markerOf("main", "topic"));
        ASSERT_TRUE(exists(indexLock));
        EXPECT_EQ(failureOf([this] { commit(); }).code, GIT_ELOCKED);
        repository_.remove(indexLock);
    }
    void expectRefused() const
    {
        const NothingChanges nothing(repository_);
        const Failure failure = failureOf([this] { commit(); });
        EXPECT_EQ(failure.code, GIT_ERROR);
        EXPECT_EQ(failure.errorClass, GIT_ERROR_MERGE);
        EXPECT_THAT(failure.text,
                    testing::HasSubstr("the merge of " + idOf("topic") + " was interrupted"));
    }
    /// What another program leaves that uses libgit2 and was killed before it wrote a file.
    void beginMergeAsLibGit2() const
    {
        repository_.write(".git/MERGE_HEAD", idOf("topic") + "\n");
        repository_.write(".git/MERGE_MODE", "no-ff");
        repository_.write(".git/MERGE_MSG", "Merge branch 'topic'");
    }
    void expectRefusedForItsIndex() const
    {
        const NothingChanges nothing(repository_);
        const Failure failure = failureOf([this] { commit(); });
        EXPECT_EQ(failure.errorClass, GIT_ERROR_MERGE);
        EXPECT_THAT(failure.text,
                    testing::HasSubstr("nothing of what only " + idOf("topic") + " has changed"));
    }
    void expectConcluded() const
    {
        commit();
        EXPECT_EQ(parents().size(), 2U);
        EXPECT_EQ(repository_.read(".git/HEAD"), "ref: refs/heads/main\n");
        EXPECT_FALSE(exists(".git/MERGE_HEAD"));
    }
    /// The commands in the text of a refused commit.
    std::string wayOut() const
    {
        const std::string text = failureOf([this] { commit(); }).text;
        const std::string beginning = "in the root of the working copy: ";
        const auto found = text.find(beginning);
        return found == std::string::npos ? "false" : text.substr(found + beginning.size());
    }
    void run(const std::string &commands) const
    {
        const auto result = Command({"sh", "-ec", commands}).in(repository_.path()).run();
        EXPECT_TRUE(result.succeeded()) << commands;
        EXPECT_EQ(result.errors, "") << commands;
    }
};

} // namespace vclink::test

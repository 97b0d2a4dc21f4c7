// SPDX-License-Identifier: MIT
// Commits whose object does not fit on the disk: libgit2 1.5 counts them as done.
#include <csignal>
#include <random>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>

#include "CommitFixture.hpp"

namespace
{

using testing::ElementsAre;
using namespace vclink::test;

class UnwrittenCommit : public CommitFixture
{
  protected:
    /// Text that compression leaves long.
    static std::string longMessage()
    {
        std::mt19937 generator(1);
        std::string text;
        while (text.size() < 100'000)
            text += std::to_string(generator());
        return text;
    }
    /// What a commit comes to that has room for every file but that of its own object.
    std::string failureWithLittleSpace() const
    {
        return unprivilegedFailureOf(
            [this]
            {
                std::signal(SIGXFSZ, SIG_IGN);
                const rlimit limit{16'384, 16'384};
                ::setrlimit(RLIMIT_FSIZE, &limit);
                commit(longMessage());
            });
    }
    static std::string fileTooLarge()
    {
        return printed({GIT_ERROR, GIT_ERROR_OS, "failed to write out file: File too large"});
    }
};

TEST_F(UnwrittenCommit, IsRaisedAndTheNextOneIsMade)
{
    repository_.write("file", "changed\n");
    giveAway();
    RepositoryState expected = stateOf(repository_);
    expected.index = stateAfterGit({{"add", "--update"}}).index;
    EXPECT_EQ(failureWithLittleSpace(), fileTooLarge());
    EXPECT_EQ(stateOf(repository_), expected);

    const std::string head = idOf("HEAD");
    EXPECT_EQ(commitAsItsOwner(), "committed");
    EXPECT_THAT(parents(), ElementsAre(head));
    EXPECT_EQ(committed("file"), "changed\n");
}

TEST_F(UnwrittenCommit, LeavesTheMergeUnderWay)
{
    beginMerge({"file"});
    giveAway();
    const std::string head = idOf("HEAD");
    const auto underWay = stateOf(repository_).underWay;
    EXPECT_EQ(failureWithLittleSpace(), fileTooLarge());
    EXPECT_EQ(idOf("HEAD"), head);
    EXPECT_EQ(stateOf(repository_).underWay, underWay);

    EXPECT_EQ(commitAsItsOwner(), "committed");
    EXPECT_THAT(parents(), ElementsAre(head, idOf("theirs")));
}

} // namespace

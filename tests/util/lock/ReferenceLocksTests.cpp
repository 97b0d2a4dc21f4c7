// SPDX-License-Identifier: MIT
#include <chrono>
#include <filesystem>
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/text.hpp"
#include "util/lock/PackedReferences.hpp"
#include "util/lock/referenceLocks.hpp"
#include "util/repository/repository.hpp"

namespace
{

namespace git = vclink::git;
using git::makeResult;
using git::ReferenceLockWait;
using std::chrono::milliseconds;
using vclink::test::GitRepository;
using Steady = std::chrono::steady_clock;

class ReferenceLocks : public vclink::test::GitFixture
{
  protected:
    void setTimeout(const std::string &value) const
    {
        repository_.git({"config", "core.filesRefLockTimeout", value});
    }
    milliseconds timeout() const
    {
        return git::readReferenceLockTimeout(open().get());
    }
    git::OwnedHandle<git_repository> open() const
    {
        return git::openRepository(vclink::test::asPath(repository_.path()));
    }
    /// How often a change is tried that always gives this code.
    int triesOf(int code) const
    {
        int tries = 0;
        const auto result = git::retryWhileLocked(open().get(),
                                                  [&]
                                                  {
                                                      ++tries;
                                                      return makeResult(code);
                                                  });
        EXPECT_EQ(result.has_error() ? result.error().getCode() : 0, code);
        return tries;
    }

    vclink::test::LibGit2Session session_{environment()};
    GitRepository repository_ = makeRepository();
};

TEST_F(ReferenceLocks, AreWaitedForAsGitsConfigurationSays)
{
    EXPECT_EQ(timeout(), milliseconds(100));
    setTimeout("250");
    EXPECT_EQ(timeout(), milliseconds(250));
    setTimeout("2k");
    EXPECT_EQ(timeout(), milliseconds(2'048));
    setTimeout("0");
    EXPECT_EQ(timeout(), milliseconds(0));
    setTimeout("2147483647");
    EXPECT_EQ(timeout(), milliseconds(2'147'483'647));
}

TEST_F(ReferenceLocks, AreWaitedForAMinuteWhereGitWouldWaitWithoutEnd)
{
    setTimeout("-1");
    EXPECT_EQ(timeout(), milliseconds(60'000));
}

/// The last one would overflow in a smaller unit.
TEST_F(ReferenceLocks, AreWaitedForAMinuteWhereGitRefusesTheNumberAsTooLarge)
{
    repository_.commit("first");
    for (const auto *number : {"2147483648", "9000000000000", "9223372036854775807"})
    {
        setTimeout(number);
        EXPECT_EQ(timeout(), milliseconds(60'000)) << number;
        EXPECT_FALSE(repository_.tryGit({"branch", "topic"}).succeeded()) << number;
    }
}

TEST_F(ReferenceLocks, AreWaitedForAsByDefaultWhereTheNumberIsNone)
{
    setTimeout("soon");
    EXPECT_EQ(timeout(), milliseconds(100));
}

TEST_F(ReferenceLocks, AreWaitedForAsTheUsersConfigurationSays)
{
    repository_.git({"config", "--global", "core.filesRefLockTimeout", "7"});
    EXPECT_EQ(timeout(), milliseconds(7));
}

TEST_F(ReferenceLocks, LetNoOtherEndBeTriedAgain)
{
    for (const int code : {GIT_OK, GIT_ERROR, GIT_EEXISTS, GIT_EMODIFIED, GIT_EUSER})
        EXPECT_EQ(triesOf(code), 1) << code;
}

TEST_F(ReferenceLocks, AreTriedAgainUntilTheTimeIsOver)
{
    setTimeout("60");
    const auto begin = Steady::now();
    EXPECT_GE(triesOf(GIT_ELOCKED), 4);
    EXPECT_GE(Steady::now() - begin, milliseconds(60));
}

TEST_F(ReferenceLocks, AreTriedOnceWithoutATime)
{
    setTimeout("0");
    EXPECT_EQ(triesOf(GIT_ELOCKED), 1);
}

TEST_F(ReferenceLocks, GiveTheResultOfTheTryThatFoundNone)
{
    int tries = 0;
    const auto result = git::retryWhileLocked(
        open().get(), [&] { return makeResult(++tries < 3 ? GIT_ELOCKED : 0); });
    EXPECT_TRUE(result.has_value());
    EXPECT_EQ(tries, 3);
}

TEST(ReferenceLockWait, EndsWithATryWhenTheTimeIsOver)
{
    const auto begin = Steady::now();
    ReferenceLockWait wait(milliseconds(30));
    int pauses = 0;
    while (wait.pause())
        ++pauses;
    EXPECT_GE(Steady::now() - begin, milliseconds(30));
    EXPECT_GE(pauses, 2);
    EXPECT_LE(pauses, 30);
    EXPECT_FALSE(wait.pause());
}

TEST(ReferenceLockWait, DoesNotPauseWithoutATime)
{
    EXPECT_FALSE(ReferenceLockWait(milliseconds(0)).pause());
}

class PackedReferencesOfARepository : public ReferenceLocks
{
  protected:
    int codeOf(const git::GitResult<void> &result) const
    {
        return result.has_error() ? result.error().getCode() : 0;
    }

    git::OwnedHandle<git_repository> opened_ = open();
    git::PackedReferences packed_{opened_.get()};
    const std::filesystem::path lock_ = repository_ / ".git/packed-refs.lock";
};

TEST_F(PackedReferencesOfARepository, AreLockedAsGitLocksThem)
{
    repository_.commit("first");
    ASSERT_EQ(codeOf(packed_.lock()), 0);
    EXPECT_FALSE(repository_.tryGit({"pack-refs", "--all"}).succeeded());
    packed_.release();
    repository_.git({"pack-refs", "--all"});
}

TEST_F(PackedReferencesOfARepository, AreLockedByOneAtATime)
{
    {
        git::PackedReferences other(opened_.get());
        EXPECT_EQ(codeOf(other.lock()), 0);
        EXPECT_EQ(codeOf(packed_.lock()), GIT_ELOCKED);
    }
    EXPECT_EQ(codeOf(packed_.lock()), 0);
    EXPECT_TRUE(std::filesystem::exists(lock_));
}

TEST_F(PackedReferencesOfARepository, KeepTheLockOfAnother)
{
    repository_.write(".git/packed-refs.lock", "");
    {
        git::PackedReferences other(opened_.get());
        EXPECT_EQ(codeOf(other.lock()), GIT_ELOCKED);
    }
    EXPECT_TRUE(std::filesystem::exists(lock_));
}

TEST_F(PackedReferencesOfARepository, TellWhetherTheyHaveChanged)
{
    repository_.commit("first");
    const auto release = [this]
    {
        ASSERT_EQ(codeOf(packed_.lock()), 0);
        packed_.release();
    };
    release();
    EXPECT_FALSE(packed_.haveChanged());
    repository_.git({"pack-refs", "--all"});
    EXPECT_TRUE(packed_.haveChanged());
    release();
    EXPECT_FALSE(packed_.haveChanged());
    repository_.remove(".git/packed-refs");
    EXPECT_TRUE(packed_.haveChanged());
}

} // namespace

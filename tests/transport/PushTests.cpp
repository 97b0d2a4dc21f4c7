// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <git2/errors.h>

#include "TransportFixture.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"

namespace
{

using testing::ElementsAre;
using testing::HasSubstr;
using testing::UnorderedElementsAre;
using namespace vclink::test;

/// A clone, in which a commit was made.
class Push : public TransportFixture
{
  protected:
    Push()
    {
        first_ = change("file", "first\n");
        publish({"main"});
        clone_ = cloneWithGit("clone");
        clone_.write("file", "second\n");
        second_ = clone_.commitAll("second");
    }

    void writeHook(const std::string &name, const std::string &script) const
    {
        served_.write("hooks/" + name, "#!/bin/sh\n" + script);
        served_.setMode("hooks/" + name, 0755);
    }
    /// Pushes, and gives the records of the references' fates.
    std::vector<std::string> pushAndRead(const std::vector<std::string> &refspecs) const
    {
        const LogCapture log(vclink::git::SeverityParameter);
        push(clone_, refspecs);
        std::vector<std::string> fates;
        for (auto &message : log.messages())
        {
            if (message.find(" refnameStr=") == 0)
                fates.push_back(message);
        }
        return fates;
    }

    std::string first_;
    std::string second_;
    GitRepository clone_{folder().path()};
};

TEST_P(Push, MakesANewBranch)
{
    const auto fates = pushAndRead({"HEAD:refs/heads/new"});
    EXPECT_EQ(servedId("refs/heads/new"), second_);
    EXPECT_EQ(servedId("refs/heads/main"), first_);
    EXPECT_THAT(fates, ElementsAre(" refnameStr=refs/heads/new statusStr="));
    expectSound(clone_);
    EXPECT_TRUE(served_.tryGit({"fsck", "--strict"}).succeeded());
}

TEST_P(Push, MovesABranchForward)
{
    push(clone_, {"refs/heads/main:refs/heads/main"});
    EXPECT_EQ(servedId("refs/heads/main"), second_);
    EXPECT_EQ(clone_.line({"rev-parse", "refs/remotes/origin/main"}), second_);
}

TEST_P(Push, MovesWhatTheRefspecsOfTheConfigurationName)
{
    clone_.git({"config", "remote.origin.push", "refs/heads/main:refs/heads/configured"});
    push(clone_, {});
    EXPECT_EQ(servedId("refs/heads/configured"), second_);
}

TEST_P(Push, TakesAnAnnotatedTagAlong)
{
    clone_.git({"-c", "user.name=a", "-c", "user.email=a@example.com", "tag", "-m", "tag", "v1"});
    push(clone_, {"refs/tags/v1"});
    EXPECT_EQ(servedId("refs/tags/v1"), clone_.line({"rev-parse", "refs/tags/v1"}));
}

TEST_P(Push, ReplacesATagByForceOnly)
{
    clone_.git({"tag", "v1", "main~"});
    push(clone_, {"refs/tags/v1"});
    clone_.git({"tag", "--force", "v1"});
    const auto failure = failureOf(
        [this] {
            push(clone_, {"HEAD:refs/heads/new", "refs/tags/v1"});
        });
    EXPECT_EQ(failure.code, GIT_ENONFASTFORWARD);
    EXPECT_EQ(servedId("refs/tags/v1"), first_);
    EXPECT_EQ(servedId("refs/heads/new"), "");
    push(clone_, {"refs/tags/v1:refs/tags/v2", "+refs/tags/v1"});
    EXPECT_EQ(servedId("refs/tags/v1"), second_);
    EXPECT_EQ(servedId("refs/tags/v2"), second_);
}

TEST_P(Push, DeletesABranch)
{
    publish({"main:refs/heads/old"});
    ASSERT_NE(servedId("refs/heads/old"), "");
    push(clone_, {":refs/heads/old"});
    EXPECT_EQ(servedId("refs/heads/old"), "");
}

TEST_P(Push, RefusesABranchThatIsNotBehind)
{
    clone_.git({"push", "--quiet", "origin", "HEAD:refs/heads/ahead"});
    clone_.git({"reset", "--quiet", "--hard", "HEAD~"});
    clone_.write("file", "another second\n");
    clone_.commitAll("another second");
    const auto failure = failureOf([this] { push(clone_, {"HEAD:refs/heads/ahead"}); });
    EXPECT_EQ(failure.code, GIT_ENONFASTFORWARD);
    EXPECT_EQ(failure.errorClass, GIT_ERROR_REFERENCE);
    EXPECT_EQ(failure.text, "cannot push non-fastforwardable reference");
    EXPECT_EQ(servedId("refs/heads/ahead"), second_);
}

TEST_P(Push, RefusesABranchWhoseCommitsItDoesNotHave)
{
    const std::string ahead = change("file", "ahead\n");
    publish({"main"});
    const auto failure = failureOf([this] { push(clone_, {"refs/heads/main:refs/heads/main"}); });
    EXPECT_EQ(failure.code, GIT_ENONFASTFORWARD);
    EXPECT_EQ(failure.text, "cannot push because a reference that you are trying to update on "
                            "the remote contains commits that are not present locally.");
    EXPECT_EQ(servedId("refs/heads/main"), ahead);
}

TEST_P(Push, ReplacesABranchWhenForced)
{
    clone_.git({"push", "--quiet", "origin", "HEAD:refs/heads/ahead"});
    clone_.git({"reset", "--quiet", "--hard", "HEAD~"});
    push(clone_, {"+HEAD:refs/heads/ahead"});
    EXPECT_EQ(servedId("refs/heads/ahead"), first_);
}

TEST_P(Push, GivesManyObjects)
{
    for (int i = 0; i < 500; ++i)
        clone_.write("many/" + std::to_string(i), std::to_string(i) + "\n");
    const std::string id = clone_.commitAll("many");
    push(clone_, {"refs/heads/main"});
    EXPECT_EQ(servedId("refs/heads/main"), id);
    EXPECT_TRUE(served_.tryGit({"fsck", "--strict"}).succeeded());
}

INSTANTIATE_TEST_SUITE_P(Over, Push, allTransports(), testing::PrintToStringParamName());

/// Where a server receives what is pushed.
class PushToServer : public Push
{
};

TEST_P(PushToServer, RejectedByAHookCountsAsDoneAndIsLogged)
{
    writeHook("update", "echo 'not today' >&2\nexit 1\n");
    const auto fates = pushAndRead({"HEAD:refs/heads/new"});
    EXPECT_THAT(fates, ElementsAre(" refnameStr=refs/heads/new statusStr=hook declined"));
    EXPECT_EQ(servedId("refs/heads/new"), "");
}

TEST_P(PushToServer, RejectedByTheServersSettingsCountsAsDoneAndIsLogged)
{
    served_.git({"config", "receive.denyDeletes", "true"});
    const auto fates = pushAndRead({":refs/heads/main"});
    EXPECT_THAT(fates, ElementsAre(" refnameStr=refs/heads/main statusStr=deletion prohibited"));
    EXPECT_EQ(servedId("refs/heads/main"), first_);
}

TEST_P(PushToServer, OfTwoBranchesOfWhichOneIsRejectedMovesTheOther)
{
    writeHook("update", "test \"$1\" != refs/heads/refused\n");
    const auto fates = pushAndRead({"HEAD:refs/heads/refused", "HEAD:refs/heads/taken"});
    EXPECT_EQ(servedId("refs/heads/taken"), second_);
    EXPECT_EQ(servedId("refs/heads/refused"), "");
    EXPECT_THAT(fates,
                UnorderedElementsAre(" refnameStr=refs/heads/refused statusStr=hook declined",
                                     " refnameStr=refs/heads/taken statusStr="));
}

TEST_P(PushToServer, LogsWhatTheServerSays)
{
    writeHook("post-receive", "echo 'thank you' >&2\n");
    const LogCapture log(vclink::git::SeverityParameter);
    push(clone_, {"HEAD:refs/heads/new"});
    std::string said;
    for (const auto &message : log.messages())
    {
        if (message.find(" msgStr=") == 0)
            said += message.substr(8);
    }
    EXPECT_THAT(said, HasSubstr("thank you\n"));
}

INSTANTIATE_TEST_SUITE_P(Over, PushToServer, transportsWithServer(),
                         testing::PrintToStringParamName());

/// Where there is no server, and libgit2 writes into the other repository itself.
class PushWithoutServer : public Push
{
};

TEST_P(PushWithoutServer, AsksNoHook)
{
    writeHook("update", "exit 1\n");
    writeHook("pre-receive", "exit 1\n");
    const auto fates = pushAndRead({"HEAD:refs/heads/new"});
    EXPECT_THAT(fates, ElementsAre(" refnameStr=refs/heads/new statusStr="));
    EXPECT_EQ(servedId("refs/heads/new"), second_);
}

INSTANTIATE_TEST_SUITE_P(Over, PushWithoutServer, testing::Values(Transport::Path, Transport::File),
                         testing::PrintToStringParamName());

} // namespace

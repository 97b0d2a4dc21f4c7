// SPDX-License-Identifier: MIT
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include <git2.h>
#include <git2/sys/credential.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/HermeticLibGit2.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "error/logging/severity.hpp"
#include "options/gitRecords.hpp"
#include "support/LogCapture.hpp"
#include "support/TestInteractor.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/libgit2Release.hpp"

namespace vclink::git
{
namespace
{

using test::LogCapture;
using testing::ElementsAre;

constexpr unsigned sshKey = GIT_CREDENTIAL_SSH_KEY;

struct FreeCredential
{
    void operator()(git_credential *credential) const
    {
        git_credential_free(credential);
    }
};

/// What a request for credentials comes to.
struct Answer
{
    int code = 0;
    std::unique_ptr<git_credential, FreeCredential> credential;
};

class RemoteCredentials : public testing::Test
{
  protected:
    Answer ask(const char *url, const char *user, unsigned allowedTypes)
    {
        git_credential *credential = nullptr;
        Answer answer;
        answer.code = callbacks_.credentials(&credential, url, user, allowedTypes);
        answer.credential.reset(credential);
        return answer;
    }
    /// Whether it is the keys of the agent, for this user, that are offered.
    static void expectAgent(const Answer &answer, const std::string &user)
    {
        EXPECT_EQ(answer.code, 0);
        ASSERT_NE(answer.credential, nullptr);
        EXPECT_EQ(answer.credential->credtype, GIT_CREDENTIAL_SSH_KEY);
        EXPECT_EQ(git_credential_get_username(answer.credential.get()), user);
        const auto *const key = reinterpret_cast<git_credential_ssh_key *>(answer.credential.get());
        EXPECT_EQ(key->privatekey, nullptr);
        EXPECT_EQ(key->publickey, nullptr);
        EXPECT_EQ(key->passphrase, nullptr);
    }

    test::HermeticLibGit2 libgit2_;
    test::TestInteractor interactor_;
    RemoteCallbacks callbacks_{interactor_};
};

TEST_F(RemoteCredentials, AreTheAgentsWhereAnSshKeyIsTakenAtEachRequestWithoutAskingTheHost)
{
    interactor_.cancel();
    for (const unsigned others : {0u, 1u, 4u, 8u, 16u, 32u, 64u, 0x7Du, 0xFFFFFFFDu})
        expectAgent(ask("ssh://git@host/path", "git", sshKey | others), "git");
    expectAgent(ask("url", "somebody", sshKey), "somebody");
    EXPECT_TRUE(interactor_.progress.calls.empty());
}

TEST_F(RemoteCredentials, AreNoneWhereNoSshKeyIsTaken)
{
    git_error_clear();
    for (const unsigned types : {0u, 1u, 4u, 8u, 16u, 32u, 64u, 0x7Du, 0xFFFFFFFDu})
    {
        const Answer answer = ask("https://host/path", "git", types);
        EXPECT_EQ(answer.code, -1) << types;
        EXPECT_EQ(answer.credential, nullptr) << types;
    }
    EXPECT_EQ(ask("ssh://host/path", nullptr, GIT_CREDENTIAL_USERNAME).code, -1);
    EXPECT_TRUE(test::libgit2_release::isSilent()) << "libgit2 was asked";
}

TEST_F(RemoteCredentials, AreThoseOfLibGit2sAnswerWhereThereIsNoUser)
{
    const Answer answer = ask("ssh://host/path", nullptr, sshKey);
    EXPECT_EQ(answer.code, git_credential_ssh_key_from_agent(nullptr, nullptr));
    EXPECT_LT(answer.code, 0);
    EXPECT_EQ(answer.credential, nullptr);
    ASSERT_FALSE(test::libgit2_release::isSilent());
}

TEST_F(RemoteCredentials, TellTheirRequestInOneRecord)
{
    const LogCapture log;
    ask("ssh://git@host/path", "git", 3);
    ask("https://host/\xC3\xBC", "", 0xFFFFFFFDu);
    EXPECT_EQ(ask(nullptr, nullptr, 0).code, -1);
    EXPECT_EQ(ask("url", nullptr, 32).code, -1);
    expectAgent(ask(nullptr, "user", sshKey), "user");
    EXPECT_THAT(log.messages(),
                ElementsAre(" url=ssh://git@host/path username_from_url=git allowed_types=3",
                            " url=https://host/\xC3\xBC username_from_url= "
                            "allowed_types=4294967293",
                            " url= username_from_url= allowed_types=0",
                            " url=url username_from_url= allowed_types=32",
                            " url= username_from_url=user allowed_types=2"));
    EXPECT_EQ(log.records().front().severity, unsigned{SeverityParameter});
}

TEST_F(RemoteCredentials, TellTheirRequestBeforeTheyAskTheAgent)
{
    const LogCapture log;
    std::vector<std::string> told;
    test::LibGit2Recorder calls;
    calls.on<git_credential_ssh_key_from_agent>([&](git_credential **, const char *)
                                                { told = log.messages(); });
    expectAgent(ask("ssh://git@host/path", "git", sshKey), "git");
    EXPECT_THAT(told, ElementsAre(" url=ssh://git@host/path username_from_url=git "
                                  "allowed_types=2"));
}

/// libgit2 looks for some settings on its way to the credentials, and takes what it has left for
/// the reason of a refusal.
TEST_F(RemoteCredentials, ThatAreRefusedLeaveNoTextOfAnEarlierCall)
{
    for (const unsigned types : {0u, 1u, 32u})
    {
        git_error_set_str(GIT_ERROR_CONFIG, "config value 'http.followRedirects' was not found");
        EXPECT_EQ(ask("https://host/path", "git", types).code, -1);
        EXPECT_TRUE(test::libgit2_release::isSilent()) << types;
    }
    git_error_set_str(GIT_ERROR_CONFIG, "config value 'http.followRedirects' was not found");
    expectAgent(ask("ssh://git@host/path", "git", sshKey), "git");
    EXPECT_TRUE(test::libgit2_release::isSilent());
}

TEST_F(RemoteCredentials, ThatAreRefusedLeaveNoExceptionBehind)
{
    const auto callbacks = makeDefaultGitCallbacks(std::make_shared<test::TestInteractor>());
    git_remote_callbacks record = toGitRemoteCallbacks(callbacks->remoteCallbacks());
    git_credential *credential = nullptr;
    EXPECT_EQ(record.credentials(&credential, nullptr, nullptr, 1, record.payload), -1);
    EXPECT_LT(record.credentials(&credential, nullptr, nullptr, sshKey, record.payload), 0);
    EXPECT_EQ(pendingCallbackException(), nullptr);
    EXPECT_EQ(credential, nullptr);
}

} // namespace
} // namespace vclink::git

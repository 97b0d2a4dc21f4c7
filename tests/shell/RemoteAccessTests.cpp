// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <gmock/gmock.h>

#include "ShellFixture.hpp"
#include "support/libgit2Release.hpp"
#include "transport/ServerOfTheSuite.hpp"
#include "transport/SshAgent.hpp"
#include "transport/SshServer.hpp"
#include "transport/WebServer.hpp"

namespace vclink::test
{
namespace
{

using testing::EndsWith;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

const std::string leakOptions =
    libgit2_release::losesKnownHosts
        ? "print_suppressions=0:suppressions=" VCLINK_KNOWN_HOSTS_LEAK_SUPPRESSIONS
        : "print_suppressions=0:suppressions=" VCLINK_SSH_LEAK_SUPPRESSIONS;

template <class Server> class AccessTest : public ServerOfTheSuite<Server>, public ShellFixture
{
  protected:
    using ServerOfTheSuite<Server>::TearDownTestSuite;

    /// Clones what the server has at an address; nobody is there to be asked.
    CommandResult clone(const std::string &address, const std::string &agent = "") const
    {
        Command command = shell({"clone", address, "clone"});
        command.environment("LSAN_OPTIONS", leakOptions);
        if (!agent.empty())
            command.environment("SSH_AUTH_SOCK", agent);
        return command.run();
    }

    /// Has to be refused, and to leave nothing behind.
    /// @return what is told after libgit2's words
    std::string refuse(const std::string &address, const std::string &agent = "") const
    {
        const CommandResult result = clone(address, agent);
        EXPECT_EQ(result.exitStatus, 1);
        EXPECT_EQ(result.output, "");
        EXPECT_FALSE(std::filesystem::exists(folder() / "clone"));
        const std::vector<std::string> lines = split(result.errors, '\n');
        EXPECT_THAT(lines.at(0), StartsWith("vclink-shell: Git could not complete the operation"));
        return result.errors.substr(lines.at(0).size() + 1);
    }
};

class ShellSshAccess : public AccessTest<SshServer>
{
  protected:
    std::string url_ = server().url(server().makeRepository());
};

TEST_F(ShellSshAccess, IsGivenToTheKeyOfAnAgent)
{
    const SshAgent agent;
    agent.add(server().key());
    const CommandResult result = clone(url_, agent.socket());
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_EQ(result.errors, "");
    EXPECT_TRUE(std::filesystem::exists(folder() / "clone/.git"));
}

TEST_F(ShellSshAccess, SaysHowToStartAnAgentWhereThereIsNone)
{
    EXPECT_EQ(refuse(url_), "vclink-shell: The server asked for a key. Only an ssh agent provides "
                            "keys, and SSH_AUTH_SOCK names none.\nStart one with \"eval "
                            "$(ssh-agent)\", and add the key with \"ssh-add\".\n");
}

TEST_F(ShellSshAccess, SaysThatTheAgentDoesNotAnswer)
{
    const std::string socket = folder() / "socket";
    EXPECT_EQ(refuse(url_, socket),
              "vclink-shell: The server asked for a key. Only an ssh agent provides keys, and the "
              "one that\nSSH_AUTH_SOCK names does not answer: " +
                  socket + "\n");
    EXPECT_THAT(refuse(url_, "/" + std::string(200, 'x')), HasSubstr("does not answer"));
}

TEST_F(ShellSshAccess, SaysThatTheAgentHasNoKeyForIt)
{
    const SshAgent agent;
    const std::string text = "vclink-shell: The server accepts none of the keys that the ssh agent "
                             "holds; \"ssh-add -l\" shows these.\n";
    EXPECT_EQ(refuse(url_, agent.socket()), text);
    makeSshKey(folder() / "wrong");
    agent.add(folder() / "wrong");
    EXPECT_EQ(refuse(url_, agent.socket()), text);
}

TEST_F(ShellSshAccess, SaysThatTheAddressNamesNoUser)
{
    EXPECT_EQ(refuse(server().baseWithoutUser() + "/repository.git"),
              "vclink-shell: The server asked for a user name: put it before the host, as in "
              "ssh://NAME@HOST/PATH.\n");
}

TEST_F(ShellSshAccess, SaysThatNoPasswordIsGiven)
{
    SshServer other(SshServer::Offers::Passwords);
    EXPECT_EQ(refuse(other.url(other.makeRepository())),
              "vclink-shell: The server asked for a password. This program never sends one; it "
              "only uses the keys of an ssh agent.\n");
}

TEST_F(ShellSshAccess, SaysNothingOfKeysWhereOneWasAccepted)
{
    const SshAgent agent;
    agent.add(server().key());
    EXPECT_THAT(refuse(server().base() + "/missing.git", agent.socket()),
                Not(HasSubstr("ssh agent")));
}

TEST_F(ShellSshAccess, IsExplainedForWhatIsConfiguredToo)
{
    const GitRepository repository = makeRepository();
    repository.git({"remote", "add", "origin", url_});
    for (const std::string command : {"fetch", "heads"})
    {
        const CommandResult result = shell({command, "origin"})
                                         .in(repository.path())
                                         .environment("LSAN_OPTIONS", leakOptions)
                                         .run();
        EXPECT_EQ(result.exitStatus, 1);
        EXPECT_THAT(result.errors, EndsWith("and add the key with \"ssh-add\".\n"));
    }
}

struct PasswordServer : WebServer
{
    PasswordServer() : WebServer(Site::HttpWithPassword)
    {
    }
};

using ShellPasswordAccess = AccessTest<PasswordServer>;

TEST_F(ShellPasswordAccess, IsRefusedWithoutAQuestion)
{
    EXPECT_EQ(refuse(server().url(server().makeRepository())),
              "vclink-shell: The server asked for a password. This program never sends one; it "
              "only uses the keys of an ssh agent.\n");
}

TEST_F(ShellPasswordAccess, SaysThatThePasswordInTheAddressIsRejected)
{
    std::string address = server().url(server().makeRepository());
    address.insert(address.find("//") + 2, WebServer::user() + ":wrong@");
    EXPECT_EQ(refuse(address),
              "vclink-shell: The server rejects the user name or the password in the address.\n");
}

TEST_F(ShellPasswordAccess, IsAskedForIfTheAddressHasOnlyAUser)
{
    std::string address = server().url(server().makeRepository());
    address.insert(address.find("//") + 2, WebServer::user() + "@");
    EXPECT_EQ(refuse(address),
              "vclink-shell: The server asked for a password. This program never sends one; it "
              "only uses the keys of an ssh agent.\n");
}

TEST_F(ShellPasswordAccess, IsNoMatterWhereNobodyAsks)
{
    const GitRepository repository = server().makeRepository();
    const std::string open = server().urlAt(WebServer::Site::Http, repository);
    EXPECT_EQ(clone(open).errors, "");
    std::filesystem::remove_all(folder() / "clone");
    EXPECT_THAT(refuse(open + "/missing"), Not(HasSubstr("password")));
}

} // namespace
} // namespace vclink::test

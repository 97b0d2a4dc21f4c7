// SPDX-License-Identifier: MIT
#include "SshServer.hpp"

#include <cerrno>
#include <cstdlib>
#include <fstream>
#include <stdexcept>
#include <system_error>

#include <pwd.h>
#include <sys/stat.h>
#include <unistd.h>

#include "support/UnprivilegedUser.hpp"

namespace vclink::test
{
namespace
{

std::string userName()
{
    const passwd *const user = ::getpwuid(::geteuid());
    if (user == nullptr)
        throw std::runtime_error("the user who runs the tests has no name to log in with");
    return user->pw_name;
}

/// As root the server wants an empty folder for its unprivileged half, which the system's own
/// service makes at each start; nothing in its configuration names another.
void makePrivilegeSeparationFolder()
{
    if (runsAsRoot() && ::mkdir("/run/sshd", 0755) != 0 && errno != EEXIST)
        throw std::system_error(errno, std::generic_category(), "/run/sshd");
}

} // namespace

SshServer::SshServer(Offers offers) : offers_(offers)
{
    makePrivilegeSeparationFolder();
    makeSshKey(folder() / "hostKey");
    makeSshKey(key());
    agent_.add(key());
    server_ = startListening(
        1, folder(),
        [this](const std::vector<std::uint16_t> &ports)
        {
            std::ofstream(folder() / "sshd.conf") << configuration(ports.at(0)) << std::flush;
            return std::vector<std::string>{"sshd", "-D", "-e", "-f", folder() / "sshd.conf"};
        });
}

std::string SshServer::configuration(std::uint16_t port) const
{
    const std::string home = folder();
    const bool keys = offers_ == Offers::Keys;
    // The log-in shell reads nothing of the real home. The folder is below one that everybody may
    // write to, which is what StrictModes would refuse.
    return "ListenAddress 127.0.0.1:" + std::to_string(port) +
           "\n"
           "HostKey " +
           home +
           "/hostKey\n"
           "AuthorizedKeysFile " +
           home +
           "/key.pub\n"
           "PubkeyAuthentication " +
           (keys ? "yes" : "no") +
           "\n"
           "PasswordAuthentication " +
           (keys ? "no" : "yes") +
           "\n"
           "KbdInteractiveAuthentication no\n"
           "PermitRootLogin yes\n"
           "StrictModes no\n"
           "UsePAM no\n"
           "UseDNS no\n"
           "PidFile none\n"
           "PermitUserRC no\n"
           "PrintLastLog no\n"
           "LogLevel VERBOSE\n"
           "SetEnv HOME=" +
           home + " GIT_CONFIG_NOSYSTEM=1 LC_ALL=C.UTF-8\n";
}

std::string SshServer::base() const
{
    return "ssh://" + userName() + "@127.0.0.1:" + std::to_string(server_.ports.at(0)) +
           repositories().string();
}

std::string SshServer::baseWithoutUser() const
{
    return "ssh://127.0.0.1:" + std::to_string(server_.ports.at(0)) + repositories().string();
}

void SshServer::prepareClient() const
{
    ::setenv("SSH_AUTH_SOCK", agent_.socket().c_str(), 1);
    ::setenv("GIT_SSH_COMMAND",
             "ssh -F none -o BatchMode=yes -o StrictHostKeyChecking=no"
             " -o UserKnownHostsFile=/dev/null -o LogLevel=ERROR",
             1);
}

} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include "access.hpp"

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include "texts.hpp"

namespace vclink::shell
{
namespace
{

// libgit2's names: GIT_CREDENTIAL_SSH_KEY, GIT_CREDENTIAL_USERNAME, GIT_EAUTH.
constexpr unsigned sshKey = 2;
constexpr unsigned userName = 32;
constexpr int authenticationFailed = -16;

bool answers(const char *socketPath)
{
    sockaddr_un address = {};
    const std::size_t length = std::strlen(socketPath);
    if (length >= sizeof address.sun_path)
    {
        return false;
    }
    address.sun_family = AF_UNIX;
    std::copy_n(socketPath, length, address.sun_path);
    const int connection = ::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
    if (connection < 0)
    {
        return false;
    }
    const bool connected =
        ::connect(connection, reinterpret_cast<const sockaddr *>(&address), sizeof address) == 0;
    ::close(connection);
    return connected;
}

std::string explainKey(const git::GitError &failure)
{
    const char *const agent = std::getenv("SSH_AUTH_SOCK");
    if (agent == nullptr || *agent == '\0')
    {
        return say(
            "The server asked for a key. Only an ssh agent provides keys, and SSH_AUTH_SOCK names "
            "none.\nStart one with \"eval $(ssh-agent)\", and add the key with \"ssh-add\".");
    }
    if (!answers(agent))
    {
        return say("The server asked for a key. Only an ssh agent provides keys, and the one "
                   "that\nSSH_AUTH_SOCK names does not answer: %1%",
                   agent);
    }
    return failure.getCode() == authenticationFailed
               ? say("The server accepts none of the keys that the ssh agent holds; \"ssh-add -l\" "
                     "shows these.")
               : "";
}

} // namespace

std::string explainRefusedAccess(const git::GitError &failure, const RemoteNotes &notes)
{
    if (!notes.credentials)
    {
        return "";
    }
    const unsigned credentials = *notes.credentials;
    if ((credentials & sshKey) != 0)
    {
        return explainKey(failure);
    }
    if (credentials == userName)
    {
        return say("The server asked for a user name: put it before the host, as in "
                   "ssh://NAME@HOST/PATH.");
    }
    if (notes.hasPassword)
    {
        return say("The server rejects the user name or the password in the address.");
    }
    return say("The server asked for a password. This program never sends one; it only uses the "
               "keys of an ssh agent.");
}

} // namespace vclink::shell

// SPDX-License-Identifier: MIT
#include "SshAgent.hpp"

#include <stdexcept>

#include "support/Command.hpp"

namespace vclink::test
{

void makeSshKey(const std::filesystem::path &file)
{
    Command({"ssh-keygen", "-q", "-t", "ed25519", "-N", "", "-C", "test", "-f", file}).runOrThrow();
}

SshAgent::SshAgent() : process_({"ssh-agent", "-D", "-a", folder_ / "agent"}, folder_.path())
{
    const auto answers = [this]
    {
        // 1: it answers, and has no key.
        const auto list = Command({"ssh-add", "-l"}).environment("SSH_AUTH_SOCK", socket()).run();
        return list.exitStatus == 1;
    };
    if (!process_.waitUntil(answers))
        throw std::runtime_error("ssh-agent does not start:\n" + process_.log());
}

void SshAgent::add(const std::filesystem::path &key) const
{
    Command({"ssh-add", "-q", key}).environment("SSH_AUTH_SOCK", socket()).runOrThrow();
}

} // namespace vclink::test

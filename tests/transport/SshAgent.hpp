// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>

#include "ServerProcess.hpp"
#include "support/TemporaryFolder.hpp"

namespace vclink::test
{

/// Makes a key without a passphrase: the file, and "FILE.pub" beside it.
void makeSshKey(const std::filesystem::path &file);

/// An ssh-agent, empty at first.
class SshAgent
{
  public:
    SshAgent();

    void add(const std::filesystem::path &key) const;
    /// What SSH_AUTH_SOCK is to name.
    std::filesystem::path socket() const
    {
        return folder_ / "agent";
    }

  private:
    TemporaryFolder folder_;
    ServerProcess process_;
};

} // namespace vclink::test

// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>

#include "GitServer.hpp"
#include "ServerProcess.hpp"
#include "SshAgent.hpp"

namespace vclink::test
{

/// OpenSSH's server: ssh://, for the user who runs the tests, with one key that it lets in. The key
/// is in the server's agent.
class SshServer : public GitServer
{
  public:
    enum class Offers
    {
        Keys,
        Passwords
    };

    explicit SshServer(Offers offers = Offers::Keys);

    std::string base() const override;
    /// As base(), without the user's name.
    std::string baseWithoutUser() const;
    /// The key that is let in.
    std::filesystem::path key() const
    {
        return folder() / "key";
    }
    void prepareClient() const override;

  private:
    std::string configuration(std::uint16_t port) const;

    Offers offers_;
    SshAgent agent_;
    ListeningServer server_;
};

} // namespace vclink::test

// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

#include "GitServer.hpp"
#include "ServerProcess.hpp"

namespace vclink::test
{

/// `git daemon`: git://, which takes pushes of everybody.
class GitDaemon : public GitServer
{
  public:
    GitDaemon();

    std::string base() const override;
    std::uint16_t port() const
    {
        return server_.ports.at(0);
    }

  private:
    ListeningServer server_;
};

} // namespace vclink::test

// SPDX-License-Identifier: MIT
#pragma once

#include <ostream>
#include <string>

#include <gtest/gtest.h>

#include "GitServer.hpp"
#include "support/GitFixture.hpp"

namespace vclink::test
{

/// The ways to a repository.
enum class Transport
{
    Path,
    File,
    Git,
    Ssh,
    Http,
    Https
};

std::string nameOf(Transport transport);
void PrintTo(Transport transport, std::ostream *stream);

/// What a suite is run over.
inline auto allTransports()
{
    return testing::Values(Transport::Path, Transport::File, Transport::Git, Transport::Ssh,
                           Transport::Http, Transport::Https);
}
/// Those that have a server at their end.
inline auto transportsWithServer()
{
    return testing::Values(Transport::Git, Transport::Ssh, Transport::Http, Transport::Https);
}

/// Base of what runs once over each transport. The transport's server runs before the test's own
/// environment is made, because it outlives the test; it is started for the first test that wants
/// it, and ends with the suite.
class RunningServer : public testing::WithParamInterface<Transport>
{
  public:
    RunningServer();

    /// Ends all servers that were started. To be called at the end of a suite.
    static void stopServers();

  protected:
    GitServer &server() const noexcept
    {
        return server_;
    }

  private:
    GitServer &server_;
};

} // namespace vclink::test

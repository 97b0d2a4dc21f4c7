// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

namespace vclink::test
{

/// Base of fixtures that need one server, before GitFixture: the server outlives the test, so it is
/// started before the test's environment is made. It ends with the suite; the fixture says
/// `using ServerOfTheSuite<Server>::TearDownTestSuite;`.
template <class Server> class ServerOfTheSuite
{
  protected:
    ServerOfTheSuite()
    {
        if (running() == nullptr)
            running() = std::make_unique<Server>();
    }
    static void TearDownTestSuite()
    {
        running().reset();
    }
    static Server &server()
    {
        return *running();
    }

  private:
    static std::unique_ptr<Server> &running()
    {
        static std::unique_ptr<Server> server;
        return server;
    }
};

} // namespace vclink::test

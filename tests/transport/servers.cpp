// SPDX-License-Identifier: MIT
#include "servers.hpp"

#include <array>
#include <map>
#include <memory>

#include "GitDaemon.hpp"
#include "SshServer.hpp"
#include "WebServer.hpp"

namespace vclink::test
{
namespace
{

std::unique_ptr<GitServer> start(Transport transport)
{
    switch (transport)
    {
    case Transport::Path:
        return std::make_unique<PathServer>();
    case Transport::File:
        return std::make_unique<FileServer>();
    case Transport::Git:
        return std::make_unique<GitDaemon>();
    case Transport::Ssh:
        return std::make_unique<SshServer>();
    case Transport::Http:
        return std::make_unique<WebServer>(WebServer::Site::Http);
    case Transport::Https:
        return std::make_unique<WebServer>(WebServer::Site::Https);
    }
    return nullptr;
}

std::map<Transport, std::unique_ptr<GitServer>> &runningServers()
{
    static std::map<Transport, std::unique_ptr<GitServer>> servers;
    return servers;
}

GitServer &serverOf(Transport transport)
{
    auto &server = runningServers()[transport];
    if (!server)
        server = start(transport);
    return *server;
}

} // namespace

std::string nameOf(Transport transport)
{
    static const std::array<const char *, 6> names{"Path", "File", "Git", "Ssh", "Http", "Https"};
    return names.at(static_cast<std::size_t>(transport));
}

void PrintTo(Transport transport, std::ostream *stream)
{
    *stream << nameOf(transport);
}

RunningServer::RunningServer() : server_(serverOf(GetParam()))
{
}

void RunningServer::stopServers()
{
    runningServers().clear();
}

} // namespace vclink::test

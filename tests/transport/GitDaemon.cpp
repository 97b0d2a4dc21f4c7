// SPDX-License-Identifier: MIT
#include "GitDaemon.hpp"

namespace vclink::test
{
namespace
{

/// The daemon itself: `git daemon` would be its parent, and its end not the daemon's.
std::string daemonProgram(const std::filesystem::path &anywhere)
{
    return GitRepository(anywhere).line({"--exec-path"}) + "/git-daemon";
}

} // namespace

GitDaemon::GitDaemon()
    : server_(startListening(1, folder(),
                             [this](const std::vector<std::uint16_t> &ports)
                             {
                                 return std::vector<std::string>{
                                     daemonProgram(folder()),
                                     "--listen=127.0.0.1",
                                     "--port=" + std::to_string(ports.at(0)),
                                     "--reuseaddr",
                                     "--export-all",
                                     "--enable=receive-pack",
                                     "--informative-errors",
                                     "--base-path=" + repositories().string(),
                                     repositories().string()};
                             }))
{
}

std::string GitDaemon::base() const
{
    return "git://127.0.0.1:" + std::to_string(port());
}

} // namespace vclink::test

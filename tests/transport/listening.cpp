// SPDX-License-Identifier: MIT
#include "listening.hpp"

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <fstream>
#include <set>
#include <sstream>
#include <string>
#include <system_error>

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/socket.h>
#include <unistd.h>

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

/// Holds a port that the system chose.
class PortHolder
{
  public:
    PortHolder() : socket_(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0))
    {
        address_.sin_family = AF_INET;
        address_.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        auto *const address = reinterpret_cast<sockaddr *>(&address_);
        socklen_t size = sizeof address_;
        if (socket_ < 0 || ::bind(socket_, address, size) != 0 ||
            ::getsockname(socket_, address, &size) != 0)
            throw std::system_error(errno, std::generic_category(), "no free port");
    }
    PortHolder(const PortHolder &) = delete;
    PortHolder &operator=(const PortHolder &) = delete;
    ~PortHolder()
    {
        ::close(socket_);
    }
    std::uint16_t port() const noexcept
    {
        return ntohs(address_.sin_port);
    }

  private:
    int socket_;
    sockaddr_in address_{};
};

/// The inode of the socket that listens on the port, empty if none does.
std::string listenerOf(std::uint16_t port)
{
    std::ostringstream sought;
    sought << std::uppercase << std::hex;
    sought.width(8);
    sought.fill('0');
    sought << htonl(INADDR_LOOPBACK) << ':';
    sought.width(4);
    sought << port;

    std::ifstream table("/proc/net/tcp");
    for (std::string line; std::getline(table, line);)
    {
        std::istringstream fields(line);
        std::string number, local, remote, state, queues, timer, retries, user, timeout, inode;
        fields >> number >> local >> remote >> state >> queues >> timer >> retries >> user >>
            timeout >> inode;
        if (local == sought.str() && state == "0A")
            return inode;
    }
    return {};
}

std::set<std::string> socketsOf(pid_t process)
{
    std::set<std::string> sockets;
    std::error_code error;
    const fs::path folder = "/proc/" + std::to_string(process) + "/fd";
    for (fs::directory_iterator entry(folder, error), end; !error && entry != end;
         entry.increment(error))
    {
        std::error_code ignored;
        sockets.insert(fs::read_symlink(entry->path(), ignored).string());
    }
    return sockets;
}

} // namespace

std::vector<std::uint16_t> freePorts(std::size_t count)
{
    // All are held until all are there, so that they differ.
    const std::vector<PortHolder> holders(count);
    std::vector<std::uint16_t> ports;
    for (const auto &holder : holders)
        ports.push_back(holder.port());
    return ports;
}

bool listensOn(pid_t process, const std::vector<std::uint16_t> &ports)
{
    const auto sockets = socketsOf(process);
    return std::all_of(ports.begin(), ports.end(),
                       [&sockets](std::uint16_t port)
                       { return sockets.count("socket:[" + listenerOf(port) + "]") != 0; });
}

} // namespace vclink::test

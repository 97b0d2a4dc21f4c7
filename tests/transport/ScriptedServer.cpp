// SPDX-License-Identifier: MIT
#include "ScriptedServer.hpp"

#include <array>
#include <cerrno>
#include <stdexcept>
#include <system_error>
#include <utility>

#include <arpa/inet.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>
#include <unistd.h>

namespace vclink::test
{
namespace
{

constexpr int limitMilliseconds = 60'000;

[[noreturn]] void raiseSocketError(const char *what)
{
    throw std::system_error(errno, std::generic_category(), what);
}

sockaddr_in loopback(std::uint16_t port)
{
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    address.sin_port = htons(port);
    return address;
}

Descriptor makeSocket()
{
    return Descriptor::checked(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0), "socket");
}

Descriptor listenAnywhere()
{
    Descriptor listener = makeSocket();
    const sockaddr_in address = loopback(0);
    if (::bind(listener.get(), reinterpret_cast<const sockaddr *>(&address), sizeof address) != 0 ||
        ::listen(listener.get(), 8) != 0)
        raiseSocketError("listen");
    return listener;
}

std::uint16_t portOf(int socket)
{
    sockaddr_in address{};
    socklen_t size = sizeof address;
    if (::getsockname(socket, reinterpret_cast<sockaddr *>(&address), &size) != 0)
        raiseSocketError("getsockname");
    return ntohs(address.sin_port);
}

} // namespace

Connection::Connection(Descriptor socket, int stop) noexcept
    : socket_(std::move(socket)), stop_(stop)
{
}

Connection Connection::open(std::uint16_t port, int stop)
{
    Descriptor socket = makeSocket();
    const sockaddr_in address = loopback(port);
    if (::connect(socket.get(), reinterpret_cast<const sockaddr *>(&address), sizeof address) != 0)
        raiseSocketError("connect");
    return Connection(std::move(socket), stop);
}

void Connection::waitFor(short events) const
{
    std::array<pollfd, 2> waited{{{socket_.get(), events, 0}, {stop_, POLLIN, 0}}};
    int ready = 0;
    do
        ready = ::poll(waited.data(), waited.size(), limitMilliseconds);
    while (ready < 0 && errno == EINTR);
    if (ready < 0)
        raiseSocketError("poll");
    if (ready == 0)
        throw std::runtime_error("the other side keeps silent");
    if (waited[1].revents != 0)
        throw std::runtime_error("the server ends");
}

std::string Connection::read(std::size_t limit)
{
    waitFor(POLLIN);
    std::string bytes(limit, '\0');
    const auto count = ::recv(socket_.get(), bytes.data(), bytes.size(), 0);
    if (count < 0)
        raiseSocketError("recv");
    bytes.resize(static_cast<std::size_t>(count));
    return bytes;
}

std::string Connection::readUntil(const std::string &end)
{
    std::string bytes;
    while (bytes.find(end) == std::string::npos)
    {
        const std::string more = read(4096);
        if (more.empty())
            throw std::runtime_error("the other side closed early");
        bytes += more;
    }
    return bytes;
}

void Connection::write(const std::string &bytes)
{
    for (std::size_t done = 0; done < bytes.size();)
    {
        waitFor(POLLOUT);
        const auto count = ::send(socket_.get(), bytes.data() + done, bytes.size() - done,
                                  MSG_NOSIGNAL | MSG_DONTWAIT);
        if (count >= 0)
            done += static_cast<std::size_t>(count);
        else if (errno != EAGAIN)
            raiseSocketError("send");
    }
}

void Connection::waitForClose()
{
    while (!read(65536).empty())
    {
    }
}

void Connection::reset() noexcept
{
    const linger atOnce{1, 0};
    ::setsockopt(socket_.get(), SOL_SOCKET, SO_LINGER, &atOnce, sizeof atOnce);
    socket_.close();
}

ScriptedServer::ScriptedServer(std::function<void(Connection &)> script)
    : script_(std::move(script)), listener_(listenAnywhere()), stop_(::eventfd(0, EFD_CLOEXEC)),
      port_(portOf(listener_.get())), thread_([this] { run(); })
{
}

ScriptedServer::~ScriptedServer()
{
    ::eventfd_write(stop_.get(), 1);
    thread_.join();
}

void ScriptedServer::run() const
{
    for (;;)
    {
        std::array<pollfd, 2> waited{{{listener_.get(), POLLIN, 0}, {stop_.get(), POLLIN, 0}}};
        if (::poll(waited.data(), waited.size(), -1) < 0 && errno != EINTR)
            return;
        if (waited[1].revents != 0)
            return;
        if (waited[0].revents == 0)
            continue;
        Connection connection(
            Descriptor(::accept4(listener_.get(), nullptr, nullptr, SOCK_CLOEXEC)), stop_.get());
        try
        {
            script_(connection);
        }
        catch (const std::exception &)
        {
            // The other side may end as it likes; what it told its caller is what is tested.
        }
    }
}

} // namespace vclink::test

// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <thread>

#include "support/Descriptor.hpp"

namespace vclink::test
{

/// One end of a connection, for a script. Nothing waits for longer than a minute, nor after the
/// server's end has begun; a call that cannot continue throws, which ends the script.
class Connection
{
  public:
    /// @param stop becomes readable when the server is to end
    Connection(Descriptor socket, int stop) noexcept;
    /// Connects to a port of 127.0.0.1.
    static Connection open(std::uint16_t port, int stop);

    /// What has come, at most `limit` bytes; empty when the other side has closed.
    std::string read(std::size_t limit);
    /// Reads until all of `end` has arrived. Throws if the connection is closed before.
    std::string readUntil(const std::string &end);
    void write(const std::string &bytes);
    /// Waits until the other side closes, whatever it says before.
    void waitForClose();
    void close() noexcept
    {
        socket_.close();
    }
    /// Closes so that the other side gets "connection reset", also of what it writes later.
    void reset() noexcept;

    int descriptor() const noexcept
    {
        return socket_.get();
    }
    int stop() const noexcept
    {
        return stop_;
    }

  private:
    void waitFor(short events) const;

    Descriptor socket_;
    int stop_;
};

/// A server in a thread of the test, on a free port of 127.0.0.1, which does with each connection
/// what a script says, one after the other.
class ScriptedServer
{
  public:
    /// @param script can throw, which ends the connection
    explicit ScriptedServer(std::function<void(Connection &connection)> script);
    ScriptedServer(const ScriptedServer &) = delete;
    ScriptedServer &operator=(const ScriptedServer &) = delete;
    /// Interrupts what a script waits for.
    ~ScriptedServer();

    std::uint16_t port() const noexcept
    {
        return port_;
    }

  private:
    void run() const;

    std::function<void(Connection &)> script_;
    Descriptor listener_;
    Descriptor stop_;
    std::uint16_t port_ = 0;
    std::thread thread_;
};

} // namespace vclink::test

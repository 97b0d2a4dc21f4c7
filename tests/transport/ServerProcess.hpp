// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include <sys/types.h>

namespace vclink::test
{

/// A program that runs beside the tests, in a process group of its own, until the object ends. It
/// gets a small environment of its own, so that it neither depends on the test that started it nor
/// finds anything of the person who runs the tests. It ends with this process, however that ends.
class ServerProcess
{
  public:
    /// @param arguments the program, found in PATH or among the system's programs, and its
    /// arguments
    /// @param folder    the program's home and working folder; its output goes to "server.log"
    /// there
    /// @throws std::runtime_error when there is no such program: a missing server is a failure
    ServerProcess(std::vector<std::string> arguments, const std::filesystem::path &folder);
    ServerProcess(const ServerProcess &) = delete;
    ServerProcess &operator=(const ServerProcess &) = delete;
    ~ServerProcess();

    pid_t id() const noexcept
    {
        return process_;
    }
    /// Whether the program ended by itself.
    bool hasEnded() const;
    /// What the program wrote.
    std::string log() const;

    /// Waits until `ready` says so.
    /// @return false when the program ended before
    /// @throws std::runtime_error, with the log, when it takes too long
    bool waitUntil(const std::function<bool()> &ready) const;

  private:
    std::string text_;
    std::filesystem::path log_;
    pid_t process_ = -1;
};

/// Where a program is: below a folder of PATH, or where the system keeps what root runs.
/// @throws std::runtime_error when it is nowhere
std::filesystem::path findProgram(const std::string &name);

/// A program that listens on ports of 127.0.0.1.
struct ListeningServer
{
    std::unique_ptr<ServerProcess> process;
    std::vector<std::uint16_t> ports;
};

/// Gives a program's arguments for the ports that it is to listen on, and writes what it reads.
using PortsToArguments =
    std::function<std::vector<std::string>(const std::vector<std::uint16_t> &ports)>;

/// Starts a program on ports that are free, and waits until it listens on all of them. If another
/// program uses a port first, other ports are tried.
/// @throws std::runtime_error, with the program's log, when it does not come up
ListeningServer startListening(std::size_t portCount, const std::filesystem::path &folder,
                               const PortsToArguments &makeArguments);

} // namespace vclink::test

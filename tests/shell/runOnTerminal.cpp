// SPDX-License-Identifier: MIT
#include "runOnTerminal.hpp"

#include <array>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <stdexcept>
#include <system_error>

#include <poll.h>
#include <pty.h>
#include <sys/wait.h>
#include <termios.h>
#include <unistd.h>

namespace vclink::test
{
namespace
{

constexpr std::chrono::seconds patience{60};

/// A child process on a new terminal; killed at the end if it has not ended.
class TerminalProcess
{
  public:
    explicit TerminalProcess(std::vector<std::string> arguments)
    {
        std::vector<char *> pointers;
        for (std::string &argument : arguments)
            pointers.push_back(argument.data());
        pointers.push_back(nullptr);
        termios settings{};
        ::cfmakeraw(&settings);
        process_ = ::forkpty(&terminal_, nullptr, &settings, nullptr);
        if (process_ < 0)
            throw std::system_error(errno, std::generic_category(), "forkpty");
        if (process_ == 0)
        {
            ::execvp(pointers[0], pointers.data());
            ::_exit(127);
        }
    }
    TerminalProcess(const TerminalProcess &) = delete;
    TerminalProcess &operator=(const TerminalProcess &) = delete;
    ~TerminalProcess()
    {
        ::close(terminal_);
        if (process_ > 0)
        {
            ::kill(process_, SIGKILL);
            ::waitpid(process_, nullptr, 0);
        }
    }

    /// Reads until nobody holds the terminal any more.
    std::string readAll() const
    {
        std::string text;
        std::array<char, 4096> block{};
        const auto end = std::chrono::steady_clock::now() + patience;
        for (;;)
        {
            pollfd event{terminal_, POLLIN, 0};
            if (std::chrono::steady_clock::now() >= end || ::poll(&event, 1, 1000) < 0)
                throw std::runtime_error("The program has not ended. So far: " + text);
            if (event.revents == 0)
                continue;
            const ssize_t count = ::read(terminal_, block.data(), block.size());
            // The far end of a terminal that was closed is an error of input, not an end.
            if (count <= 0)
                return text;
            text.append(block.data(), static_cast<std::size_t>(count));
        }
    }

    int wait()
    {
        int status = 0;
        ::waitpid(process_, &status, 0);
        process_ = 0;
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }

  private:
    int terminal_ = -1;
    pid_t process_ = 0;
};

} // namespace

TerminalResult runOnTerminal(const std::vector<std::string> &arguments)
{
    TerminalProcess process(arguments);
    TerminalResult result;
    result.text = process.readAll();
    result.exitStatus = process.wait();
    return result;
}

} // namespace vclink::test

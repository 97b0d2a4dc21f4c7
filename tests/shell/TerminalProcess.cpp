// SPDX-License-Identifier: MIT
#include "TerminalProcess.hpp"

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

constexpr std::chrono::minutes patience{1};

} // namespace

TerminalProcess::TerminalProcess(std::vector<std::string> arguments,
                                 const std::filesystem::path &folder)
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
        // Whoever runs the tests in the background has these ignored.
        for (const int signal : {SIGINT, SIGQUIT, SIGTERM, SIGHUP})
            ::signal(signal, SIG_DFL);
        if (folder.empty() || ::chdir(folder.c_str()) == 0)
            ::execvp(pointers[0], pointers.data());
        ::_exit(127);
    }
}

TerminalProcess::~TerminalProcess()
{
    ::close(terminal_);
    if (process_ > 0)
    {
        ::kill(process_, SIGKILL);
        ::waitpid(process_, nullptr, 0);
    }
}

void TerminalProcess::readUntil(const std::string &text)
{
    while (text_.find(text) == std::string::npos)
    {
        if (!readMore())
            throw std::runtime_error("The program has ended without it: " + text_);
    }
}

bool TerminalProcess::readMore()
{
    std::array<char, 4096> block{};
    const auto end = std::chrono::steady_clock::now() + patience;
    pollfd event{terminal_, POLLIN, 0};
    while (::poll(&event, 1, 1000) <= 0)
    {
        if (std::chrono::steady_clock::now() >= end)
            throw std::runtime_error("Nothing happens. So far: " + text_);
    }
    const ssize_t count = ::read(terminal_, block.data(), block.size());
    // The far end of a terminal that was closed is an error of input, not an end.
    if (count <= 0)
        return false;
    text_.append(block.data(), static_cast<std::size_t>(count));
    return true;
}

void TerminalProcess::interrupt() const
{
    send(SIGINT);
}

void TerminalProcess::send(int signal) const
{
    if (::kill(process_, signal) != 0)
        throw std::system_error(errno, std::generic_category(), "kill");
}

TerminalResult TerminalProcess::end()
{
    while (readMore())
    {
    }
    int status = 0;
    ::waitpid(process_, &status, 0);
    process_ = 0;
    return {WIFSIGNALED(status) ? -WTERMSIG(status) : WEXITSTATUS(status), text_};
}

} // namespace vclink::test

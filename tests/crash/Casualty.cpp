// SPDX-License-Identifier: MIT
#include "Casualty.hpp"

#include <array>
#include <cerrno>
#include <csignal>
#include <sstream>
#include <system_error>
#include <thread>

#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <unistd.h>

#include "support/processes.hpp"

namespace vclink::test
{
namespace
{

constexpr int silenceLimitMilliseconds = 60'000;

[[noreturn]] void raise(int error, const char *what)
{
    throw std::system_error(error, std::generic_category(), what);
}

} // namespace

Casualty::Casualty(const std::vector<std::string> &command)
{
    std::array<int, 2> ends{};
    if (::pipe2(ends.data(), O_CLOEXEC) != 0)
        raise(errno, "pipe2");
    auto words = command;
    const auto arguments = makePointers(words);
    posix_spawn_file_actions_t actions;
    ::posix_spawn_file_actions_init(&actions);
    ::posix_spawn_file_actions_adddup2(&actions, ends[1], STDOUT_FILENO);
    const int error =
        ::posix_spawn(&process_, arguments[0], &actions, nullptr, arguments.data(), environ);
    ::posix_spawn_file_actions_destroy(&actions);
    ::close(ends[1]);
    output_ = ends[0];
    if (error != 0)
    {
        ::close(output_);
        raise(error, arguments[0]);
    }
}

Casualty::~Casualty()
{
    kill();
    ::close(output_);
}

bool Casualty::awaitReports(std::size_t count)
{
    while (reports_.size() < count)
        if (!read())
            return false;
    return true;
}

void Casualty::killAfter(std::chrono::microseconds time)
{
    std::this_thread::sleep_for(time);
    kill();
    while (read())
    {
    }
}

std::string Casualty::interrupted() const
{
    return reports_.empty() || reports_.back().isEnd ? "" : reports_.back().operation;
}

bool Casualty::read()
{
    pollfd wanted{output_, POLLIN, 0};
    if (::poll(&wanted, 1, silenceLimitMilliseconds) <= 0)
        return false;
    std::array<char, 4096> bytes{};
    const ssize_t count = ::read(output_, bytes.data(), bytes.size());
    if (count <= 0)
        return false;
    unread_.append(bytes.data(), static_cast<std::size_t>(count));
    takeLines();
    return true;
}

void Casualty::takeLines()
{
    for (auto end = unread_.find('\n'); end != std::string::npos; end = unread_.find('\n'))
    {
        std::istringstream line(unread_.substr(0, end));
        unread_.erase(0, end + 1);
        std::string word;
        Report report{false, "", "", std::chrono::steady_clock::now()};
        line >> word >> report.operation >> report.id;
        report.isEnd = word == "end";
        reports_.push_back(report);
    }
}

void Casualty::kill() noexcept
{
    if (process_ < 0)
        return;
    ::kill(process_, SIGKILL);
    collectStatus(process_);
    process_ = -1;
}

} // namespace vclink::test

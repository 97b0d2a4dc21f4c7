// SPDX-License-Identifier: MIT
#include "support/ChildProcess.hpp"

#include <array>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <exception>
#include <system_error>

#include <fcntl.h>
#include <poll.h>
#include <sys/wait.h>
#include <unistd.h>

#include "support/processes.hpp"

namespace vclink::test
{
namespace
{

/// Follows the action's answer, so that a child that ended early differs from one with an empty
/// answer.
constexpr char endOfAnswer = '\0';

[[noreturn]] void failAt(const char *what)
{
    throw std::system_error(errno, std::generic_category(), what);
}

std::string answer(const std::function<std::string()> &action)
{
    try
    {
        return action();
    }
    catch (const std::exception &exception)
    {
        return std::string("exception: ") + exception.what();
    }
    catch (...)
    {
        return "exception of a type that has no text";
    }
}

[[noreturn]] void runChild(const std::function<std::string()> &action, int answerEnd)
{
    const std::string text = answer(action) + endOfAnswer;
    for (std::size_t done = 0; done < text.size();)
    {
        const auto written = ::write(answerEnd, text.data() + done, text.size() - done);
        if (written < 0)
            break;
        done += static_cast<std::size_t>(written);
    }
    // Neither the exit handlers nor the leak check of the parent's memory are the child's affair.
    std::fflush(nullptr);
    ::_exit(0);
}

/// Reads until the child closed its end, or the time is over.
/// @return whether the child closed its end
bool readAnswer(int answerEnd, std::chrono::milliseconds timeout, std::string &text)
{
    const auto end = std::chrono::steady_clock::now() + timeout;
    for (;;)
    {
        const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(
            end - std::chrono::steady_clock::now());
        pollfd event{answerEnd, POLLIN, 0};
        const int ready = ::poll(&event, 1, left.count() > 0 ? static_cast<int>(left.count()) : 0);
        if (ready < 0 && errno == EINTR)
            continue;
        if (ready <= 0)
            return false;
        std::array<char, 4096> block;
        const auto count = ::read(answerEnd, block.data(), block.size());
        if (count <= 0)
            return true;
        text.append(block.data(), static_cast<std::size_t>(count));
    }
}

} // namespace

std::string runInChild(const std::function<std::string()> &action,
                       std::chrono::milliseconds timeout)
{
    // What is still buffered would be written by both processes.
    std::fflush(nullptr);
    std::array<int, 2> ends{};
    if (::pipe2(ends.data(), O_CLOEXEC) != 0)
        failAt("pipe2");
    const pid_t child = ::fork();
    if (child == 0)
    {
        ::close(ends[0]);
        runChild(action, ends[1]);
    }
    const int forkError = errno;
    ::close(ends[1]);
    if (child < 0)
    {
        ::close(ends[0]);
        errno = forkError;
        failAt("fork");
    }

    std::string text;
    const bool inTime = readAnswer(ends[0], timeout, text);
    ::close(ends[0]);
    if (!inTime)
        ::kill(child, SIGKILL);
    const int status = collectStatus(child);
    if (!inTime)
        return "the child process took too long";
    if (WIFSIGNALED(status))
        return "the child process ended by signal " + std::to_string(WTERMSIG(status));
    if (text.empty() || text.back() != endOfAnswer)
        return "the child process ended early, with status " + std::to_string(WEXITSTATUS(status));
    text.pop_back();
    return text;
}

} // namespace vclink::test

// SPDX-License-Identifier: MIT
#include "ServerProcess.hpp"

#include <array>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <sstream>
#include <stdexcept>
#include <system_error>
#include <thread>
#include <utility>

#include <fcntl.h>
#include <poll.h>
#include <sys/prctl.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

#include "listening.hpp"
#include "support/readFile.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;
using namespace std::chrono_literals;

/// Generous: the machine may be busy.
constexpr auto startLimit = 60s;
constexpr int endLimitMilliseconds = 10'000;

[[noreturn]] void raiseProcessError(const std::string &what)
{
    throw std::system_error(errno, std::generic_category(), what);
}

std::string valueOf(const char *variable)
{
    const char *const value = std::getenv(variable);
    return value != nullptr ? value : "";
}

std::vector<std::string> makeEnvironment(const fs::path &folder)
{
    return {"PATH=" + valueOf("PATH"), "HOME=" + folder.string(), "TMPDIR=" + folder.string(),
            "LC_ALL=C.UTF-8", "GIT_CONFIG_NOSYSTEM=1"};
}

std::vector<char *> makePointers(std::vector<std::string> &texts)
{
    std::vector<char *> pointers;
    for (auto &text : texts)
        pointers.push_back(text.data());
    pointers.push_back(nullptr);
    return pointers;
}

/// What the new process needs, made before it is: after the fork only plain system calls are safe.
struct Start
{
    pid_t parent;
    int input;
    int output;
    const char *folder;
    char *const *arguments;
    char *const *environment;
};

[[noreturn]] void become(const Start &start)
{
    sigset_t none;
    ::sigemptyset(&none);
    ::sigprocmask(SIG_SETMASK, &none, nullptr);
    ::signal(SIGPIPE, SIG_DFL);
    ::signal(SIGCHLD, SIG_DFL);
    ::setpgid(0, 0);
    ::prctl(PR_SET_PDEATHSIG, SIGKILL);
    const bool ready = ::getppid() == start.parent && ::dup2(start.input, STDIN_FILENO) >= 0 &&
                       ::dup2(start.output, STDOUT_FILENO) >= 0 &&
                       ::dup2(start.output, STDERR_FILENO) >= 0 && ::chdir(start.folder) == 0;
    if (ready)
        ::execve(start.arguments[0], start.arguments, start.environment);
    ::_exit(127);
}

int openOrRaise(const char *path, int flags)
{
    const int file = ::open(path, flags | O_CLOEXEC, 0644);
    if (file < 0)
        raiseProcessError(path);
    return file;
}

} // namespace

fs::path findProgram(const std::string &name)
{
    if (name.find('/') != std::string::npos)
        return name;
    std::istringstream folders(valueOf("PATH") + ":/usr/sbin:/sbin");
    for (std::string folder; std::getline(folders, folder, ':');)
    {
        const fs::path program = fs::path(folder) / name;
        if (!folder.empty() && ::access(program.c_str(), X_OK) == 0)
            return program;
    }
    throw std::runtime_error(name + " is missing; scripts/setup installs it");
}

ServerProcess::ServerProcess(std::vector<std::string> arguments, const fs::path &folder)
    : text_(arguments.at(0)), log_(folder / "server.log")
{
    // OpenSSH's server starts itself again, by the path that it was started with.
    arguments[0] = findProgram(arguments[0]);
    auto environment = makeEnvironment(folder);
    const auto argumentPointers = makePointers(arguments);
    const auto environmentPointers = makePointers(environment);
    const int input = openOrRaise("/dev/null", O_RDONLY);
    const int output = openOrRaise(log_.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_APPEND);
    const Start start{::getpid(),
                      input,
                      output,
                      folder.c_str(),
                      argumentPointers.data(),
                      environmentPointers.data()};
    process_ = ::fork();
    if (process_ == 0)
        become(start);
    const int error = errno;
    ::close(input);
    ::close(output);
    errno = error;
    if (process_ < 0)
        raiseProcessError("fork");
}

ServerProcess::~ServerProcess()
{
    ::kill(process_, SIGTERM);
    if (!endsWithin(endLimitMilliseconds))
        ::kill(process_, SIGKILL);
    // Those that the program started and left; the group's number is its own until it is collected.
    ::kill(-process_, SIGKILL);
    while (::waitpid(process_, nullptr, 0) < 0 && errno == EINTR)
    {
    }
}

bool ServerProcess::endsWithin(int milliseconds) const
{
    // The C library's own declaration of this call can't be linked from C++ in every release.
    const int watched = static_cast<int>(::syscall(SYS_pidfd_open, process_, 0));
    if (watched < 0)
        return false;
    pollfd event{watched, POLLIN, 0};
    const bool ended = ::poll(&event, 1, milliseconds) > 0;
    ::close(watched);
    return ended;
}

bool ServerProcess::hasEnded() const
{
    return endsWithin(0);
}

std::string ServerProcess::log() const
{
    return readFile(log_);
}

bool ServerProcess::waitUntil(const std::function<bool()> &ready) const
{
    const auto end = std::chrono::steady_clock::now() + startLimit;
    while (!ready())
    {
        if (hasEnded())
            return false;
        if (std::chrono::steady_clock::now() > end)
            throw std::runtime_error(text_ + " does not come up:\n" + log());
        std::this_thread::sleep_for(2ms);
    }
    return true;
}

ListeningServer startListening(std::size_t portCount, const fs::path &folder,
                               const PortsToArguments &makeArguments)
{
    std::string log;
    for (int attempt = 0; attempt < 8; ++attempt)
    {
        ListeningServer server;
        server.ports = freePorts(portCount);
        server.process = std::make_unique<ServerProcess>(makeArguments(server.ports), folder);
        const pid_t id = server.process->id();
        if (server.process->waitUntil([&] { return listensOn(id, server.ports); }))
            return server;
        log = server.process->log();
    }
    throw std::runtime_error("a server does not start:\n" + log);
}

} // namespace vclink::test

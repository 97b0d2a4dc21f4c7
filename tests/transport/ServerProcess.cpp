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
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include "listening.hpp"
#include "support/Descriptor.hpp"
#include "support/processes.hpp"
#include "support/readFile.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;
using namespace std::chrono_literals;

/// Generous: the machine may be busy.
constexpr auto startLimit = 60s;
constexpr auto endLimit = 10s;

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
    const auto input = Descriptor::checked(::open("/dev/null", O_RDONLY | O_CLOEXEC), "/dev/null");
    const auto output = Descriptor::checked(
        ::open(log_.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_APPEND | O_CLOEXEC, 0644),
        log_.c_str());
    const Start start{::getpid(),
                      input.get(),
                      output.get(),
                      folder.c_str(),
                      argumentPointers.data(),
                      environmentPointers.data()};
    process_ = ::fork();
    if (process_ == 0)
        become(start);
    if (process_ < 0)
        throw std::system_error(errno, std::generic_category(), "fork");
}

ServerProcess::~ServerProcess()
{
    ::kill(process_, SIGTERM);
    if (!endsWithin(process_, endLimit))
        ::kill(process_, SIGKILL);
    // Those that the program started and left; the group's number is its own until it is collected.
    ::kill(-process_, SIGKILL);
    collectStatus(process_);
}

bool ServerProcess::hasEnded() const
{
    return endsWithin(process_, 0ms);
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

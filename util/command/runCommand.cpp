// SPDX-License-Identifier: MIT
#include "util/command/runCommand.hpp"

#include <array>
#include <cerrno>
#include <csignal>
#include <sstream>
#include <system_error>

#include <fcntl.h>
#include <unistd.h>

// Since Boost 1.86, version 1 of Boost.Process is in a separate folder, and since 1.88
// boost::process means version 2 by default.
#if __has_include(<boost/process/v1/child.hpp>)
#define BOOST_PROCESS_VERSION 1
#include <boost/process/v1/child.hpp>
#include <boost/process/v1/env.hpp>
#include <boost/process/v1/exception.hpp>
#include <boost/process/v1/extend.hpp>
#include <boost/process/v1/io.hpp>
#include <boost/process/v1/pipe.hpp>
#else
#include <boost/process/child.hpp>
#include <boost/process/env.hpp>
#include <boost/process/exception.hpp>
#include <boost/process/extend.hpp>
#include <boost/process/io.hpp>
#include <boost/process/pipe.hpp>
#endif

#include "error/logging/logger.hpp"
#include "util/command/ChildStatus.hpp"
#include "util/command/FailedStartCleanup.hpp"
#include "util/command/commandLine.hpp"
#include "util/command/programLookup.hpp"

namespace vclink::git
{
namespace
{

namespace process = boost::process;

void raiseIfError(const std::error_code &error, const char *text)
{
    if (error)
    {
        throw process::process_error(error, text);
    }
}

std::error_code lastError()
{
    return std::error_code(errno, std::system_category());
}

/// Gives a descriptor a number above those of the standard streams, which a host may have closed:
/// the child's own streams would replace it there.
int moveOffStandardStreams(int descriptor)
{
    if (descriptor < 0 || descriptor > STDERR_FILENO)
    {
        return descriptor;
    }
    const int moved = ::fcntl(descriptor, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
    const std::error_code error = lastError();
    ::close(descriptor);
    raiseIfError(moved < 0 ? error : std::error_code(), "fcntl(2) failed");
    return moved;
}

/// Lets the command receive all signals. Many hosts block signals on their worker threads. A
/// command that inherits this could not be ended, and a shell that waits for its children never
/// would be.
struct UnblockedSignals : process::extend::handler
{
    /// Runs in the child.
    template <class Executor> void on_exec_setup(Executor & /*executor*/) const noexcept
    {
        sigset_t none;
        ::sigemptyset(&none);
        ::pthread_sigmask(SIG_SETMASK, &none, nullptr);
    }
};

/// Makes a pipe that no other command inherits: a command that another thread starts at the same
/// time would keep this output open.
process::pipe makePipe()
{
    std::array<int, 2> ends{};
    if (::pipe2(ends.data(), O_CLOEXEC) != 0)
    {
        raiseIfError(lastError(), "pipe2(2) failed");
    }
    process::pipe pipe(ends[0], ends[1]);
    pipe.assign_source(-1);
    pipe.assign_source(moveOffStandardStreams(ends[0]));
    pipe.assign_sink(-1);
    pipe.assign_sink(moveOffStandardStreams(ends[1]));
    return pipe;
}

/// Returns what to pass to Boost.Process for a command.
std::string makeUsable(const std::string &command)
{
    const char *const fault = findCommandFault(command);
    if (fault != nullptr)
    {
        raiseIfError(std::make_error_code(std::errc::invalid_argument), fault);
    }
    if (!isChildStatusKept())
    {
        raiseIfError(std::error_code(ECHILD, std::system_category()),
                     "the process ignores SIGCHLD, so that no exit status can be known");
    }
    std::error_code error;
    std::string named = nameProgram(command, error);
    // The text that Boost.Process uses for a program that cannot be executed.
    raiseIfError(error, "execve failed");
    return named;
}

bool isRunning(ChildStatus &status)
{
    std::error_code error;
    const bool running = status.isRunning(error);
    raiseIfError(error, "the command's exit status can't be known");
    return running;
}

int waitFor(ChildStatus &status)
{
    std::error_code error;
    const int result = status.wait(error);
    raiseIfError(error, "the command's exit status can't be known");
    return result;
}

std::string readOutput(process::ipstream &output, ChildStatus &status)
{
    std::ostringstream collected;
    for (std::string line; isRunning(status) && std::getline(output, line) && !line.empty();)
    {
        collected << line;
    }
    return collected.str();
}

} // namespace

int runCommand(const std::string &commandTemplate,
               const std::map<std::string, std::string> &placeholders)
{
    const std::string command = expandPlaceholders(commandTemplate, placeholders);
    process::ipstream output(makePipe());
    writeRecord(SeverityDiagnostic, "Command: ", command);
    const std::string usable = makeUsable(command);
    FailedStartCleanup cleanup(output.pipe().native_source(), output.pipe().native_sink());
    process::child child(usable, process::std_out > output, process::std_err > process::null,
                         boost::this_process::environment(), UnblockedSignals());
    // If the process cannot be forked, Boost.Process throws nothing and returns no child. The
    // number of no child would mean every child of the process.
    raiseIfError(child.valid() ? std::error_code() : lastError(), "fork(2) failed");
    cleanup.hasStarted(child.id());
    ChildStatus status(child.id());
    writeRecord(SeverityDiagnostic, "Output:\n", readOutput(output, status));
    const int result = waitFor(status);
    // Another part of the process may have waited first; the status is known.
    std::error_code ignored;
    child.wait(ignored);
    cleanup.hasEnded();
    return result;
}

} // namespace vclink::git

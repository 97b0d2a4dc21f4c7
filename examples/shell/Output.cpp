// SPDX-License-Identifier: MIT
#include "Output.hpp"

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <iostream>
#include <system_error>
#include <utility>

#include <fcntl.h>
#include <unistd.h>

#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

constexpr std::size_t pieceSize = std::size_t{64} * 1024;

bool terminalHasControls()
{
    const char *terminal = std::getenv("TERM");
    return terminal != nullptr && std::string_view(terminal) != "dumb";
}

bool personWantsColour()
{
    const char *refusal = std::getenv("NO_COLOR");
    const bool refused = refusal != nullptr && *refusal != '\0';
    return !refused && terminalHasControls();
}

/// Does nothing. If the signal were ignored, merge commands would ignore it too; they do not
/// inherit a handler.
extern "C" void goOn(int /*signal*/)
{
}

/// A caller who ignores the signal wants the error.
bool isBrokenPipeAnError()
{
    struct sigaction action = {};
    ::sigaction(SIGPIPE, nullptr, &action);
    return action.sa_handler == SIG_IGN;
}

[[noreturn]] void failToWrite(int error)
{
    if (error == EPIPE && !isBrokenPipeAnError())
    {
        throw OutputClosed();
    }
    throw ShellFailure(
        say("Standard output can't be written: %1%.", std::generic_category().message(error)));
}

} // namespace

Output::Output()
    : isTerminal_(::isatty(STDOUT_FILENO) == 1), hasColour_(isTerminal_ && personWantsColour())
{
}

void Output::write(std::string_view text)
{
    if (isTerminal_)
    {
        writeRaw(escapeDirections(std::string(text)));
    }
    else
    {
        writeRaw(text);
    }
}

void Output::writeRaw(std::string_view text)
{
    text_ += text;
    if (text_.size() >= pieceSize)
    {
        flush();
    }
}

void Output::flush()
{
    const std::string pending = std::exchange(text_, {});
    for (std::string_view rest = pending; !rest.empty();)
    {
        const ssize_t written = ::write(STDOUT_FILENO, rest.data(), rest.size());
        if (written >= 0)
        {
            rest.remove_prefix(static_cast<std::size_t>(written));
        }
        else if (errno != EINTR)
        {
            failToWrite(errno);
        }
    }
}

bool Output::hasColour() const noexcept
{
    return hasColour_;
}

bool errorsAreOnTerminal() noexcept
{
    return ::isatty(STDERR_FILENO) == 1;
}

bool errorsCanBeRedrawn() noexcept
{
    return errorsAreOnTerminal() && terminalHasControls();
}

void remark(const std::string &text)
{
    if (errorsAreOnTerminal())
    {
        std::cerr << escapeDirections(makePrintable(fl::i18n::utf8_to_ustring(text))) + '\n';
    }
}

void surviveClosedPipes()
{
    if (isBrokenPipeAnError())
    {
        return;
    }
    struct sigaction action = {};
    action.sa_handler = goOn;
    action.sa_flags = SA_RESTART;
    ::sigemptyset(&action.sa_mask);
    ::sigaction(SIGPIPE, &action, nullptr);
}

void holdStandardDescriptors()
{
    for (const int standard : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO})
    {
        if (::fcntl(standard, F_GETFD) < 0)
        {
            // open(2) returns the lowest free number, which is this one. Opened for the wrong
            // direction, so that reading or writing still fails.
            const int mode = standard == STDIN_FILENO ? O_WRONLY : O_RDONLY;
            static_cast<void>(::open("/dev/null", mode));
        }
    }
}

} // namespace vclink::shell

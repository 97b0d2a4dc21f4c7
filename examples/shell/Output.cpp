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

/// Does nothing. A signal that is ignored would be ignored by merge commands as well, while a
/// handler is not handed on to them.
extern "C" void goOn(int /*signal*/)
{
}

/// Whoever has the signal ignored wants to be told.
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
            // The lowest free number is the one just found to be free. Opened the wrong way round,
            // so that reading or writing still fails.
            const int mode = standard == STDIN_FILENO ? O_WRONLY : O_RDONLY;
            static_cast<void>(::open("/dev/null", mode));
        }
    }
}

} // namespace vclink::shell

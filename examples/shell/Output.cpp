// SPDX-License-Identifier: MIT
#include "Output.hpp"

#include <cerrno>
#include <cstdlib>
#include <iostream>
#include <system_error>
#include <utility>

#include <fcntl.h>
#include <unistd.h>

#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"

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

} // namespace

Output::Output() : hasColour_(::isatty(STDOUT_FILENO) == 1 && personWantsColour())
{
}

void Output::write(std::string_view text)
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
            throw ShellFailure("Standard output can't be written: " +
                               std::generic_category().message(errno) + ".");
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
        std::cerr << makePrintable(fl::i18n::utf8_to_ustring(text)) + '\n';
    }
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

// SPDX-License-Identifier: MIT
#include "failures.hpp"

#include <algorithm>
#include <csignal>
#include <cstddef>
#include <exception>
#include <iostream>

#include <unistd.h>

#include "fl/i18n/convert.hpp"
#include "foundation/core/except/IUserException.hpp"
#include "names.hpp"
#include "texts.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::shell
{
namespace
{

void writeToPerson(const std::string &text)
{
    const std::string printable = makePrintable(fl::i18n::utf8_to_ustring(text));
    std::cerr << (::isatty(STDERR_FILENO) == 1 ? escapeDirections(printable) : printable) << '\n';
}

/// A line feed in a text that comes from elsewhere begins no line that looks like the program's.
std::string indent(std::string text)
{
    for (std::size_t place = text.find('\n'); place != std::string::npos;
         place = text.find('\n', place + 1))
    {
        text.insert(place + 1, "    ");
    }
    return text;
}

/// A list of files in a text of the back end, as the program lists them: one on each line.
std::string showPaths(const ustring &text)
{
    std::string shown;
    for (std::size_t start = 0; start <= text.size();)
    {
        const std::size_t end = std::min(text.find(u'\n', start), text.size());
        const ustring line = text.substr(start, end - start);
        const bool isPath = start != 0 && !line.empty() && line.front() == u'/';
        shown += start == 0 ? "" : "\n";
        shown += isPath ? "  " + showPath(upath(line)) : fl::i18n::ustring_to_utf8(line);
        start = end + 1;
    }
    return shown;
}

} // namespace

void complain(const std::string &text)
{
    writeToPerson("vclink-shell: " + text);
}

void inform(const std::string &text)
{
    writeToPerson(text);
}

void relay(const std::string &text)
{
    std::string lines = "remote: ";
    for (const char letter : text)
    {
        lines += letter;
        lines += letter == '\n' ? "remote: " : "";
    }
    writeToPerson(lines);
}

ExitStatus reportFailure()
{
    try
    {
        throw;
    }
    catch (const util::exception::CancelledOperationException &)
    {
        complain(say("The operation was cancelled."));
        return Cancelled;
    }
    catch (const OutputClosed &)
    {
        return endedBy(SIGPIPE);
    }
    catch (const git::LibGit2Exception &failure)
    {
        complain(indent(fl::i18n::ustring_to_utf8(failure.GetUnicodeMessageTxt())));
    }
    catch (const foundation::core::except::IUserException &failure)
    {
        complain(showPaths(failure.GetUnicodeMessageTxt()));
    }
    catch (const ShellFailure &failure)
    {
        complain(failure.what());
    }
    catch (const std::exception &failure)
    {
        complain(indent(failure.what()));
    }
    catch (...)
    {
        complain(say("The command ended with an error of an unknown kind."));
    }
    return Failed;
}

} // namespace vclink::shell

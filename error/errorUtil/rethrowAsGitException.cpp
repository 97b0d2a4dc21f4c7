// SPDX-License-Identifier: MIT
#include "error/errorUtil/rethrowAsGitException.hpp"

#include <exception>

#include "error/errorUtil/diagnosticText.hpp"
#include "error/logging/logger.hpp"
#include "fl/i18n/convert.hpp"
#include "foundation/core/except/IUserException.hpp"
#include "vclink/git/GitException.hpp"

namespace vclink::git
{
namespace
{

/// Returns the text of the exception in flight. Throws it again if it has no text.
ustring textOfCurrentException()
{
    try
    {
        throw;
    }
    catch (const foundation::core::except::IUserException &exception)
    {
        return exception.GetUnicodeMessageTxt();
    }
    catch (const std::exception &exception)
    {
        return fl::i18n::to_ustring(exception.what());
    }
}

} // namespace

void rethrowAsGitException(const resource_core::BaseMsgID &id)
{
    writeRecord(SeverityException, "Exception caught: ", currentDiagnosticText);
    throw GitException(id, textOfCurrentException());
}

} // namespace vclink::git

// SPDX-License-Identifier: MIT
#include "error/errorUtil/diagnosticText.hpp"

#include <exception>

#include <boost/exception/diagnostic_information.hpp>
#include <boost/exception/exception.hpp>

namespace vclink::git
{

std::string currentDiagnosticText()
{
    try
    {
        throw;
    }
    catch (const boost::exception &)
    {
        return boost::current_exception_diagnostic_information(true);
    }
    catch (const std::exception &)
    {
        return boost::current_exception_diagnostic_information(true);
    }
    catch (...)
    {
        // Later releases of Boost name the type here. The caller's handler still has the exception.
        return "No diagnostic information available.";
    }
}

} // namespace vclink::git

// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <boost/exception/diagnostic_information.hpp>

namespace vclink::test
{

/// What a record about this exception says of it: Boost's verbose text of a boost::exception or a
/// std::exception.
template <class Exception> std::string diagnosticTextOf(const Exception &exception)
{
    try
    {
        throw exception;
    }
    catch (...)
    {
        return boost::current_exception_diagnostic_information(true);
    }
}

/// Nothing is known about an exception that is neither, here an int.
inline std::string diagnosticTextOf(int /*exception*/)
{
    return "No diagnostic information available.";
}

} // namespace vclink::test

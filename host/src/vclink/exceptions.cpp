// SPDX-License-Identifier: MIT
#include "vclink/exception/SourceControlException.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::exception
{

SourceControlException::~SourceControlException() = default;

} // namespace vclink::exception

namespace vclink::util::exception
{

CancelledOperationException::~CancelledOperationException() = default;

const char *CancelledOperationException::what() const noexcept
{
    return "The operation was cancelled.";
}

} // namespace vclink::util::exception

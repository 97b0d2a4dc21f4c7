// SPDX-License-Identifier: MIT
#include "error/logging/ScopeTrace.hpp"

#include <exception>

namespace vclink::git
{

void ScopeTrace::enter()
{
    entered_ = true;
    detail::writeEnabledRecord(logger_, SeverityScopeEntry, signature_);
    ++logger_.scope_depth();
}

void ScopeTrace::leave()
{
    --logger_.scope_depth();
    if (logger_.is_enabled(SeverityScopeExit))
    {
        const char *const manner = std::uncaught_exceptions() != 0 ? " [throw]" : "";
        detail::writeEnabledRecord(logger_, SeverityScopeExit, signature_, manner);
    }
}

} // namespace vclink::git

// SPDX-License-Identifier: MIT
#include "options/CancellationPoller.hpp"

#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::git
{

CancellationPoller::CancellationPoller(ApplicationInteractor &interactor)
    : interactor_(interactor), terminator_(interactor.getTerminator())
{
}

void CancellationPoller::throwIfCancelled()
{
    if (terminator_.checkAndResetCancelledState())
    {
        throw vclink::util::exception::CancelledOperationException();
    }
}

} // namespace vclink::git

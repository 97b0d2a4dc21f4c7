// SPDX-License-Identifier: MIT
#include "error/errorUtil/callbackException.hpp"

#include <memory>
#include <utility>

#include <boost/thread/tss.hpp>
#include <git2/errors.h>

#include "computils/exception/getStackTraceReport.hpp"
#include "error/errorUtil/diagnosticText.hpp"
#include "error/logging/logger.hpp"
#include "fl/i18n/convert.hpp"

namespace vclink::git
{
namespace
{

std::exception_ptr *findSlot()
{
    static boost::thread_specific_ptr<std::exception_ptr> slots;
    if (slots.get() == nullptr)
    {
        slots.reset(std::make_unique<std::exception_ptr>().release());
    }
    return slots.get();
}

} // namespace

std::exception_ptr &pendingCallbackException()
{
    // The look-up of a thread-specific pointer is slow, so do it once for each thread.
    thread_local bool found = false;
    thread_local std::exception_ptr *slot = nullptr;
    if (!found)
    {
        slot = findSlot();
        found = true;
    }
    return *slot;
}

void storeCallbackException(std::exception_ptr &&exception)
{
    pendingCallbackException() = std::move(exception);
}

int callbackErrorCode() noexcept
{
    return GIT_EUSER;
}

void reportCallbackException()
{
    writeRecord(SeverityException, "Exception caught: ", currentDiagnosticText);
    writeRecord(SeverityStackTrace,
                [] { return fl::i18n::to_string(computils::exception::getStackTraceReport()); });
}

int parkCallbackException()
{
    reportCallbackException();
    storeCallbackException(std::current_exception());
    return callbackErrorCode();
}

} // namespace vclink::git

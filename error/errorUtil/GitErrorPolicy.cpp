// SPDX-License-Identifier: MIT
#include "error/errorUtil/GitErrorPolicy.hpp"

#include <exception>
#include <utility>

#include <boost/throw_exception.hpp>
#include <git2/errors.h>

#include "error/errorUtil/callbackException.hpp"
#include "error/logging/ScopeTrace.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::git
{
namespace
{

void rethrowCallbackException()
{
    const std::exception_ptr pending = std::exchange(pendingCallbackException(), nullptr);
    if (pending != nullptr)
    {
        std::rethrow_exception(pending);
    }
}

} // namespace

void GitErrorPolicy::throwIfError(const GitError &error)
{
    const ScopeTrace trace(
        logger(),
        "static void vclink::git::GitErrorPolicy::throwIfError(const vclink::git::GitError&)",
        "error/errorUtil", 40);
    if (error.getCode() == GIT_EUSER)
    {
        writeRecord(SeverityDiagnostic, "Re-throwing error from callback");
        rethrowCallbackException();
    }
    // Intentionally before the test for success: a listing of remote heads leaves this record.
    writeRecord(
        SeverityDiagnostic, "Throwing error ",
        [&error] { return fl::i18n::to_string(error.getMessage()); }, " (", error.getCode(), ")");
    if (error.getCode() != 0)
    {
        throw LibGit2Exception(error);
    }
}

void GitErrorPolicy::raiseNoValue()
{
    boost::throw_exception(
        boost::outcome_v2::bad_result_access("no value"),
        boost::source_location(
            "error/errorUtil", 52,
            "static constexpr void vclink::git::GitErrorPolicy::wide_value_check(Impl&&)"));
}

void GitErrorPolicy::raiseNoError()
{
    boost::throw_exception(
        boost::outcome_v2::bad_result_access("no error"),
        boost::source_location(
            "error/errorUtil", 60,
            "static constexpr void vclink::git::GitErrorPolicy::wide_error_check(Impl&&)"));
}

} // namespace vclink::git

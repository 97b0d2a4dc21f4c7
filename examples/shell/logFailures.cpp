// SPDX-License-Identifier: MIT
#include "logFailures.hpp"

#include <atomic>
#include <exception>
#include <memory>
#include <string>

#include <boost/log/core.hpp>

#include "failures.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

/// In a handler only.
void reportLostRecord() noexcept
{
    try
    {
        try
        {
            throw;
        }
        catch (const std::exception &failure)
        {
            complain(say("The log is incomplete: %1%.", failure.what()));
        }
        catch (...)
        {
            complain(say("The log is incomplete, for a reason that is not known."));
        }
    }
    catch (const std::exception &)
    {
        // There is no memory for a report either.
    }
}

} // namespace

void surviveLogFailures()
{
    const auto isReported = std::make_shared<std::atomic<bool>>(false);
    boost::log::core::get()->set_exception_handler(
        [isReported]
        {
            if (!isReported->exchange(true))
            {
                reportLostRecord();
            }
        });
}

} // namespace vclink::shell

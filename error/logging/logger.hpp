// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <utility>

#include "error/logging/recordText.hpp"
#include "error/logging/severity.hpp"
#include "foundation/core/log/basic_diagnostic_logger.hpp"

namespace vclink::git
{

using Logger = foundation::core::log::basic_diagnostic_logger<char>;

namespace detail
{

// Out of line, so that the first use takes no room at the sites that ask for the logger.
[[gnu::cold]] Logger makeLogger();

} // namespace detail

/// The one logger of the library, named "vclink::git": made at first use, destroyed at process
/// exit.
inline Logger &logger()
{
    static Logger instance = detail::makeLogger();
    return instance;
}

namespace detail
{

// Out of line, so that a site that writes to a disabled severity stays small.
template <class... Values>
[[gnu::noinline, gnu::cold]] void writeEnabledRecord(Logger &target, Severity severity,
                                                     const Values &...values)
{
    if (!target.is_logging_enabled())
    {
        return;
    }
    auto record = target.open_record(severity);
    if (!record)
    {
        return;
    }
    std::string text;
    (appendToRecord(text, values), ...);
    target.push_record(std::move(record), text);
}

} // namespace detail

/// Writes one record, made of the values with nothing between them. Nothing happens for a disabled
/// severity: one load and one test. A value that is a function is called only when the record is
/// written, and its result stands in the record.
/// @throws what the sinks that the host has set raise, and what a value that is a function raises
template <class... Values> void writeRecord(Severity severity, const Values &...values)
{
    Logger &target = logger();
    if (target.is_enabled(severity))
    {
        detail::writeEnabledRecord(target, severity, values...);
    }
}

} // namespace vclink::git

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

// Not inline, so that the callers have no code for the first use.
[[gnu::cold]] Logger makeLogger();

} // namespace detail

/// Returns the library's only logger, "vclink::git". It is created at first use and destroyed at
/// process exit.
inline Logger &logger()
{
    static Logger instance = detail::makeLogger();
    return instance;
}

namespace detail
{

// Not inline, so that callers with a disabled severity stay small.
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

/// Writes one record of the values, without separators. Does nothing for a disabled severity,
/// except one load and one test. A value that is a function is called only if the record is
/// written, and the record has its result.
/// @throws what the host's sinks throw, and what a value that is a function throws
template <class... Values> void writeRecord(Severity severity, const Values &...values)
{
    Logger &target = logger();
    if (target.is_enabled(severity))
    {
        detail::writeEnabledRecord(target, severity, values...);
    }
}

} // namespace vclink::git

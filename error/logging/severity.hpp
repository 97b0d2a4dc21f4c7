// SPDX-License-Identifier: MIT
#pragma once

namespace vclink::git
{

/// What a record is about. Single bits; the logger holds a mask of those that are enabled.
enum Severity : unsigned
{
    SeverityParameter = 0x02,  ///< arguments of an operation or callback
    SeverityProgress = 0x04,   ///< progress notes of checkout and transfer
    SeverityDiagnostic = 0x08, ///< decisions and failures
    SeverityException = 0x10,  ///< "Exception caught: " records
    SeverityScopeEntry = 0x20, ///< entry of a ScopeTrace
    SeverityScopeExit = 0x40,  ///< exit of a ScopeTrace
    SeverityStackTrace = 0x200 ///< stack reports
};

} // namespace vclink::git

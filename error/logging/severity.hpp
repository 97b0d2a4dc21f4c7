// SPDX-License-Identifier: MIT
#pragma once

namespace vclink::git
{

/// The kind of a record, a single bit. The logger has a mask of the enabled ones.
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
